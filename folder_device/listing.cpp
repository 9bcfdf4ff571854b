#include "folder_device/listing.h"

#include <algorithm>
#include <cwchar>

#include "folder_device/device_path.h"
#include "folder_device/owned_handle.h"
#include "folder_device/text.h"

namespace folder_device {

namespace {

// The PC's other attributes (links, offline files, indexing) mean something else on a device, or nothing.
constexpr DWORD kDeviceAttributes = FILE_ATTRIBUTE_READONLY | FILE_ATTRIBUTE_HIDDEN | FILE_ATTRIBUTE_SYSTEM |
                                    FILE_ATTRIBUTE_DIRECTORY | FILE_ATTRIBUTE_ARCHIVE |
                                    FILE_ATTRIBUTE_TEMPORARY | FILE_ATTRIBUTE_COMPRESSED;

struct Pattern {
    std::wstring folder;  // Without a trailing "\": empty for the root.
    std::wstring name;
    bool wild = false;
    bool everything = false;
    std::wstring upper_name;

    bool Matches(std::wstring_view entry) const {
        if (!wild) {
            return EqualNoCase(entry, name);
        }
        return everything || MatchesPattern(UpperCase(entry), upper_name);
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
    pattern.everything = pattern.name == L"*" || pattern.name == L"*.*";
    pattern.upper_name = UpperCase(pattern.name);
    return ERROR_SUCCESS;
}

// A number that stays with the path: 32 bits of the FNV-1a hash.
DWORD ObjectId(const std::wstring& folder, const wchar_t* name) {
    std::uint32_t hash = 2166136261U;
    for (const wchar_t c : UpperCase(folder + L"\\" + name)) {
        hash = static_cast<std::uint32_t>((hash ^ static_cast<std::uint32_t>(c)) * 16777619ULL);
    }
    return hash;
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
    record.object_id = ObjectId(folder, entry.cFileName);
    std::wcscpy(record.name, entry.cFileName);
}

// The entry as the search tells of it, if it is one for a device and the pattern wants it.
void AppendIfWanted(const Pattern& pattern, const WIN32_FIND_DATAW& entry,
                    std::vector<rapi::FindData>& found) {
    const std::wstring_view name = entry.cFileName;
    if ((entry.dwFileAttributes & FILE_ATTRIBUTE_REPARSE_POINT) == 0 && IsDeviceName(name) &&
        pattern.folder.size() + 1 + name.size() < MAX_PATH && pattern.Matches(name)) {
        Append(pattern.folder, entry, found);
    }
}

DWORD SearchFolder(const Pattern& pattern, const Location& folder, std::vector<rapi::FindData>& found) {
    if (!folder.IsFolder()) {
        return ERROR_PATH_NOT_FOUND;
    }
    WIN32_FIND_DATAW entry;
    const std::wstring all = folder.pc_path + (folder.IsRoot() ? L"*" : L"\\*");
    const auto search = Own<OwnedFind>(FindFirstFileExW(
        all.c_str(), FindExInfoBasic, &entry, FindExSearchNameMatch, nullptr, FIND_FIRST_EX_LARGE_FETCH));
    if (!search) {
        const DWORD error = GetLastError();
        return error == ERROR_FILE_NOT_FOUND ? ERROR_SUCCESS : error;  // A drive's root may be quite empty.
    }
    do {
        AppendIfWanted(pattern, entry, found);
    } while (FindNextFileW(search.get(), &entry));
    const DWORD error = GetLastError();
    return error == ERROR_NO_MORE_FILES ? ERROR_SUCCESS : error;
}

DWORD SearchName(const Pattern& pattern, const Location& file, std::vector<rapi::FindData>& found) {
    if (!file.Exists()) {
        return ERROR_SUCCESS;
    }
    WIN32_FIND_DATAW entry;
    const auto search = Own<OwnedFind>(FindFirstFileW(file.pc_path.c_str(), &entry));
    if (!search) {
        return GetLastError();
    }
    AppendIfWanted(pattern, entry, found);
    return ERROR_SUCCESS;
}

void AppendMadeUp(const Settings& settings, const Pattern& pattern, std::vector<rapi::FindData>& found) {
    for (const ExtraEntry& extra : settings.extra_entries) {
        const std::wstring folder = extra.folder.size() == 1 ? L"" : extra.folder;
        if (!EqualNoCase(folder, pattern.folder) || !pattern.Matches(extra.name)) {
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

}  // namespace

bool MatchesPattern(std::wstring_view name, std::wstring_view pattern) {
    std::size_t n = 0;
    std::size_t p = 0;
    std::size_t star = std::wstring_view::npos;  // The last "*" and where its match ends so far.
    std::size_t star_end = 0;
    while (n < name.size()) {
        if (p < pattern.size() && pattern[p] == L'*') {
            star = p++;
            star_end = n;
        } else if (p < pattern.size() && (pattern[p] == L'?' || pattern[p] == name[n])) {
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

DWORD FindEntries(const Settings& settings, const wchar_t* pattern_text, std::vector<rapi::FindData>& found) {
    Pattern pattern;
    DWORD error = ParsePattern(pattern_text, pattern);
    if (error != ERROR_SUCCESS) {
        return error;
    }
    Location location;
    if (pattern.wild) {
        error = Locate(settings.root, pattern.folder.empty() ? L"\\" : pattern.folder.c_str(), location);
        if (error == ERROR_SUCCESS) {
            error = SearchFolder(pattern, location, found);
        }
    } else {
        error = Locate(settings.root, pattern_text, location);
        if (error == ERROR_SUCCESS) {
            error = SearchName(pattern, location, found);
        }
    }
    if (error == ERROR_SUCCESS) {
        AppendMadeUp(settings, pattern, found);
    }
    return error;
}

}  // namespace folder_device
