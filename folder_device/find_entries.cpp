// Searches and whole listings. A pattern is a device path whose last name may hold "*" and "?"; "*.*" means
// every name, as it always did. Names are matched as they stand, never by a short name that the PC's file
// system keeps beside them. Left out are "." and "..", links, names that no device path can hold and whatever
// would lie at a path of 260 characters or more: nothing could be done with them.
#include <algorithm>
#include <cstring>
#include <cwchar>

#include "folder_device/call.h"
#include "folder_device/device_path.h"
#include "platform/text_case.h"

using namespace folder_device;

namespace {

struct SearchObject : Object {
    SearchObject(std::wstring pattern, std::vector<rapi::FindData> entries)
        : Object(std::move(pattern)), found(std::move(entries)) {}

    const std::vector<rapi::FindData> found;
    std::size_t next = 1;  // CeFindFirstFile gave out the first.
};

// The PC's other attributes (links, offline files, indexing) mean something else on a device, or nothing.
constexpr DWORD kDeviceAttributes = FILE_ATTRIBUTE_READONLY | FILE_ATTRIBUTE_HIDDEN | FILE_ATTRIBUTE_SYSTEM |
                                    FILE_ATTRIBUTE_DIRECTORY | FILE_ATTRIBUTE_ARCHIVE |
                                    FILE_ATTRIBUTE_TEMPORARY | FILE_ATTRIBUTE_COMPRESSED;

// Whether the name matches a pattern with "*" and "?".
bool MatchesPattern(std::wstring_view name, std::wstring_view pattern) {
    std::size_t n = 0;
    std::size_t p = 0;
    std::size_t star = std::wstring_view::npos;  // The last "*" and where its match ends so far.
    std::size_t star_end = 0;
    while (n < name.size()) {
        if (p < pattern.size() && pattern[p] == L'*') {
            star = p++;
            star_end = n;
        } else if (p < pattern.size() &&
                   (pattern[p] == L'?' || orvane::SameIgnoringCase(pattern[p], name[n]))) {
            ++p;
            ++n;
        } else if (star != std::wstring_view::npos) {
            p = star + 1;
            n = ++star_end;
        } else {
            return false;
        }
    }
    return pattern.find_first_not_of(L'*', p) == std::wstring_view::npos;
}

struct Pattern {
    std::wstring folder;  // Without a trailing "\": empty for the root.
    std::wstring name;
    bool wild = false;

    bool Matches(std::wstring_view entry) const {
        return wild ? name == L"*.*" || MatchesPattern(entry, name) : orvane::EqualIgnoringCase(entry, name);
    }
};

DWORD ParsePattern(const wchar_t* text, Pattern& pattern) {
    if (text == nullptr) {
        return ERROR_INVALID_PARAMETER;
    }
    const std::wstring_view path(text, wcsnlen(text, MAX_PATH));
    if (path.size() >= MAX_PATH) {
        return ERROR_FILENAME_EXCED_RANGE;
    }
    if (!path.starts_with(L'\\')) {
        return ERROR_INVALID_NAME;
    }
    const std::size_t last = path.find_last_of(L'\\');
    pattern.folder = path.substr(0, last);
    pattern.name = path.substr(last + 1);
    if (pattern.name.empty()) {
        return ERROR_FILE_NOT_FOUND;
    }
    pattern.wild = pattern.name.find_first_of(L"*?") != std::wstring::npos;
    if (pattern.wild) {
        // With its wildcards read as letters the pattern must be a name; a dot may end it.
        std::wstring letters = pattern.name + L"x";
        std::replace(letters.begin(), letters.end(), L'*', L'x');
        std::replace(letters.begin(), letters.end(), L'?', L'x');
        if (!IsDeviceName(letters)) {
            return ERROR_INVALID_NAME;
        }
    }
    return ERROR_SUCCESS;
}

void Append(const std::wstring& folder, const WIN32_FIND_DATAW& entry, std::vector<rapi::FindData>& found) {
    rapi::FindData& record = found.emplace_back();
    const DWORD attributes = entry.dwFileAttributes & kDeviceAttributes;
    record.attributes = attributes != 0 ? attributes : FILE_ATTRIBUTE_NORMAL;
    record.creation_time = entry.ftCreationTime;
    record.last_access_time = entry.ftLastAccessTime;
    record.last_write_time = entry.ftLastWriteTime;
    record.size_high = entry.nFileSizeHigh;
    record.size_low = entry.nFileSizeLow;
    // A number that stays with the path.
    record.object_id = static_cast<DWORD>(orvane::HashIgnoringCase(folder + L"\\" + entry.cFileName));
    std::wcscpy(record.name, entry.cFileName);
}

// The entry as the search tells of it, if it is one for a device and the pattern wants it.
void AppendIfWanted(const Call& call, const Pattern& pattern, const WIN32_FIND_DATAW& entry,
                    std::vector<rapi::FindData>& found) {
    const std::wstring_view name = entry.cFileName;
    if ((entry.dwFileAttributes & FILE_ATTRIBUTE_REPARSE_POINT) == 0 && IsDeviceName(name) &&
        pattern.folder.size() + 1 + name.size() < MAX_PATH && pattern.Matches(name)) {
        Append(pattern.folder, entry, found);
        rapi::FindData& record = found.back();
        for (FILETIME* time : {&record.creation_time, &record.last_access_time, &record.last_write_time}) {
            *time = call.Times().FromPc(*time);
        }
    }
}

DWORD SearchPc(Call& call, const Pattern& pattern, const std::wstring& path,
               std::vector<rapi::FindData>& found) {
    WIN32_FIND_DATAW entry;
    const orvane::UniqueFind search(FindFirstFileExW(
        path.c_str(), FindExInfoBasic, &entry, FindExSearchNameMatch, nullptr, FIND_FIRST_EX_LARGE_FETCH));
    for (bool more = static_cast<bool>(search); more; more = FindNextFileW(search.Get(), &entry)) {
        AppendIfWanted(call, pattern, entry, found);
    }
    const DWORD error = GetLastError();
    // A drive's root may be quite empty.
    return error == ERROR_NO_MORE_FILES || error == ERROR_FILE_NOT_FOUND ? ERROR_SUCCESS : error;
}

void AppendMadeUp(const Settings& settings, const Pattern& pattern, std::vector<rapi::FindData>& found) {
    for (const ExtraEntry& extra : settings.extra_entries) {
        const std::wstring folder = extra.folder.size() == 1 ? L"" : extra.folder;
        if (!orvane::EqualIgnoringCase(folder, pattern.folder) || !pattern.Matches(extra.name)) {
            continue;
        }
        WIN32_FIND_DATAW entry{};
        entry.dwFileAttributes = extra.is_folder ? FILE_ATTRIBUTE_DIRECTORY : FILE_ATTRIBUTE_ARCHIVE;
        GetSystemTimeAsFileTime(&entry.ftLastWriteTime);
        entry.ftCreationTime = entry.ftLastAccessTime = entry.ftLastWriteTime;
        entry.nFileSizeHigh = static_cast<DWORD>(extra.size >> 32U);
        entry.nFileSizeLow = static_cast<DWORD>(extra.size & MAXDWORD);
        extra.name.copy(entry.cFileName, MAX_PATH - 1);
        Append(pattern.folder, entry, found);
        if (extra.unterminated) {
            const std::wstring unit = extra.name.empty() ? L"x" : extra.name;
            for (std::size_t i = 0; i < MAX_PATH; ++i) {
                found.back().name[i] = unit[i % unit.size()];
            }
        }
    }
}

// Appends every entry that the pattern finds, in the order of the PC's file system, then the made-up
// entries of the settings. Returns 0, also when nothing was found, or the error: that of the folder's
// path (device_path.h), ERROR_INVALID_NAME for a pattern that no name can match, ERROR_FILE_NOT_FOUND for a
// pattern that ends in "\".
DWORD FindEntries(Call& call, const wchar_t* pattern_text, std::vector<rapi::FindData>& found) {
    Pattern pattern;
    if (const DWORD error = ParsePattern(pattern_text, pattern); error != ERROR_SUCCESS) {
        return error;
    }
    Location place;
    const wchar_t* const folder = pattern.folder.empty() ? L"\\" : pattern.folder.c_str();
    DWORD error = Locate(call.TheSettings().root, pattern.wild ? folder : pattern_text, place);
    if (error == ERROR_SUCCESS && pattern.wild) {
        error = place.IsFolder()
                    ? SearchPc(call, pattern, place.pc_path + (place.IsRoot() ? L"*" : L"\\*"), found)
                    : DWORD{ERROR_PATH_NOT_FOUND};
    } else if (error == ERROR_SUCCESS && place.Exists()) {
        error = SearchPc(call, pattern, place.pc_path, found);
    }
    if (error == ERROR_SUCCESS) {
        AppendMadeUp(call.TheSettings(), pattern, found);
    }
    return error;
}

// Leaves only the fields that were asked for; the others are zero.
void KeepFields(DWORD flags, rapi::FindData& record) {
    const auto clear = [&](DWORD flag, auto& field) {
        if ((flags & flag) == 0) {
            std::memset(&field, 0, sizeof(field));
        }
    };
    clear(rapi::kFindAttributes, record.attributes);
    clear(rapi::kFindCreationTime, record.creation_time);
    clear(rapi::kFindLastAccessTime, record.last_access_time);
    clear(rapi::kFindLastWriteTime, record.last_write_time);
    clear(rapi::kFindSizeHigh, record.size_high);
    clear(rapi::kFindSizeLow, record.size_low);
    clear(rapi::kFindObjectId, record.object_id);
    clear(rapi::kFindName, record.name);
}

DWORD FindAll(Call& call, LPCWSTR pattern, DWORD flags, DWORD& count, rapi::FindData*& buffer) {
    const Settings& settings = call.TheSettings();
    std::vector<rapi::FindData> found;
    if (const DWORD error = FindEntries(call, pattern, found); error != ERROR_SUCCESS) {
        return error;
    }
    for (rapi::FindData& record : found) {
        KeepFields(flags, record);
    }
    count = static_cast<DWORD>(settings.found_count.value_or(found.size()));
    if (!found.empty() && !settings.found_null) {
        buffer = call.TheDevice().buffers.Add(std::move(found));
    }
    return ERROR_SUCCESS;
}

}  // namespace

// Finds nothing: INVALID_HANDLE_VALUE with ERROR_FILE_NOT_FOUND.
HANDLE WINAPI CeFindFirstFile(LPCWSTR pattern, rapi::FindData* found) {
    Call call(__func__, pattern);
    return call.RunFor(INVALID_HANDLE_VALUE, [&](HANDLE& result) -> DWORD {
        if (found == nullptr) {
            return ERROR_INVALID_PARAMETER;
        }
        std::vector<rapi::FindData> entries;
        if (const DWORD error = FindEntries(call, pattern, entries); error != ERROR_SUCCESS) {
            return error;
        }
        if (entries.empty()) {
            return ERROR_FILE_NOT_FOUND;
        }
        *found = entries.front();
        result = call.TheDevice().handles.Add(std::make_shared<SearchObject>(pattern, std::move(entries)));
        return ERROR_SUCCESS;
    });
}

// After the last entry: FALSE with ERROR_NO_MORE_FILES.
BOOL WINAPI CeFindNextFile(HANDLE search, rapi::FindData* found) {
    Call call(__func__, search);
    return call.RunBool([&]() -> DWORD {
        const auto open = call.TheDevice().handles.Find<SearchObject>(search);
        if (open == nullptr) {
            return ERROR_INVALID_HANDLE;
        }
        if (found == nullptr) {
            return ERROR_INVALID_PARAMETER;
        }
        const std::scoped_lock one_step(open->mutex);
        if (open->next >= open->found.size()) {
            return ERROR_NO_MORE_FILES;
        }
        *found = open->found[open->next++];
        return ERROR_SUCCESS;
    });
}

BOOL WINAPI CeFindClose(HANDLE search) {
    Call call(__func__, search);
    return call.RunBool([&] { return call.TheDevice().handles.Close<SearchObject>(search); });
}

// Nothing found in a folder that is there is TRUE with a count of 0 and a null buffer.
BOOL WINAPI CeFindAllFiles(LPCWSTR pattern, DWORD flags, LPDWORD found_count, rapi::FindData** found) {
    Call call(__func__, pattern, flags);
    DWORD count = 0;
    rapi::FindData* buffer = nullptr;
    const BOOL done = call.RunBool([&]() -> DWORD {
        if (found_count == nullptr || found == nullptr) {
            return ERROR_INVALID_PARAMETER;
        }
        return FindAll(call, pattern, flags, count, buffer);
    });
    if (found_count != nullptr && found != nullptr) {
        *found_count = done ? count : 0;
        *found = done ? buffer : nullptr;
    }
    if (!done) {
        call.TheDevice().buffers.Free(buffer);  // The reply is lost, and with it the listing.
    }
    return done;
}
