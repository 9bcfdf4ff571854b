// Searches and whole listings.
#include "folder_device/call.h"
#include "folder_device/entry_points.h"
#include "folder_device/listing.h"

using namespace folder_device;

namespace {

// Leaves only the fields that were asked for; the others are zero.
void KeepFields(DWORD flags, rapi::FindData& record) {
    rapi::FindData kept{};
    const auto take = [&](DWORD flag, auto member) {
        if ((flags & flag) != 0) {
            kept.*member = record.*member;
        }
    };
    take(rapi::kFindAttributes, &rapi::FindData::attributes);
    take(rapi::kFindCreationTime, &rapi::FindData::creation_time);
    take(rapi::kFindLastAccessTime, &rapi::FindData::last_access_time);
    take(rapi::kFindLastWriteTime, &rapi::FindData::last_write_time);
    take(rapi::kFindSizeHigh, &rapi::FindData::size_high);
    take(rapi::kFindSizeLow, &rapi::FindData::size_low);
    take(rapi::kFindObjectId, &rapi::FindData::object_id);
    if ((flags & rapi::kFindName) != 0) {
        std::copy(std::begin(record.name), std::end(record.name), std::begin(kept.name));
    }
    record = kept;
}

constexpr DWORD kAllFields = rapi::kFindAttributes | rapi::kFindCreationTime | rapi::kFindLastAccessTime |
                             rapi::kFindLastWriteTime | rapi::kFindSizeHigh | rapi::kFindSizeLow |
                             rapi::kFindObjectId | rapi::kFindName;

DWORD FindAll(Call& call, LPCWSTR pattern, DWORD flags, DWORD& count, rapi::FindData*& buffer) {
    const Settings& settings = call.TheSettings();
    std::vector<rapi::FindData> found;
    if (const DWORD error = FindEntries(settings, pattern, found); error != ERROR_SUCCESS) {
        return error;
    }
    if ((flags & kAllFields) != kAllFields) {
        for (rapi::FindData& record : found) {
            KeepFields(flags, record);
        }
    }
    count = settings.found_count.value_or(static_cast<DWORD>(found.size()));
    if (!found.empty() && !settings.found_null) {
        buffer = call.TheDevice().buffers.Add(std::move(found));
    }
    return ERROR_SUCCESS;
}

}  // namespace

// Finds nothing: INVALID_HANDLE_VALUE with ERROR_FILE_NOT_FOUND.
HANDLE WINAPI CeFindFirstFile(LPCWSTR pattern, rapi::FindData* found) {
    Call call(Function::kFindFirstFile, pattern);
    HANDLE result = INVALID_HANDLE_VALUE;
    call.Run([&]() -> DWORD {
        if (found == nullptr) {
            return ERROR_INVALID_PARAMETER;
        }
        std::vector<rapi::FindData> entries;
        if (const DWORD error = FindEntries(call.TheSettings(), pattern, entries); error != ERROR_SUCCESS) {
            return error;
        }
        if (entries.empty()) {
            return ERROR_FILE_NOT_FOUND;
        }
        *found = entries.front();
        result = call.TheDevice().handles.Add(std::make_shared<SearchObject>(pattern, std::move(entries)));
        return ERROR_SUCCESS;
    });
    return call.Return(result);
}

// After the last entry: FALSE with ERROR_NO_MORE_FILES.
BOOL WINAPI CeFindNextFile(HANDLE search, rapi::FindData* found) {
    Call call(Function::kFindNextFile, search);
    return call.RunBool([&]() -> DWORD {
        const auto open = call.TheDevice().handles.FindKind<SearchObject>(search);
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
    Call call(Function::kFindClose, search);
    return call.RunBool([&] { return call.TheDevice().handles.Close<SearchObject>(search); });
}

// Nothing found in a folder that is there is TRUE with a count of 0 and a null buffer.
BOOL WINAPI CeFindAllFiles(LPCWSTR pattern, DWORD flags, LPDWORD found_count, rapi::FindData** found) {
    Call call(Function::kFindAllFiles, pattern, flags);
    return call.RunBool([&]() -> DWORD {
        if (found_count == nullptr || found == nullptr) {
            return ERROR_INVALID_PARAMETER;
        }
        *found_count = 0;
        *found = nullptr;
        return FindAll(call, pattern, flags, *found_count, *found);
    });
}
