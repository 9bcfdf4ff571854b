#include "folder_device/storage_account.h"

#include <vector>

#include "platform/handles.h"

namespace folder_device {

namespace {

std::uint64_t Join(DWORD high, DWORD low) {
    return (static_cast<std::uint64_t>(high) << 32U) | low;
}

// The bytes of all files below the folder; links are not followed.
std::uint64_t CountBytes(const std::wstring& root) {
    std::uint64_t bytes = 0;
    std::vector<std::wstring> folders{root};
    while (!folders.empty()) {
        const std::wstring folder = std::move(folders.back()) + L"\\";
        folders.pop_back();
        WIN32_FIND_DATAW entry;
        const orvane::UniqueFind search(FindFirstFileExW((folder + L"*").c_str(), FindExInfoBasic, &entry,
                                                         FindExSearchNameMatch, nullptr,
                                                         FIND_FIRST_EX_LARGE_FETCH));
        for (bool more = static_cast<bool>(search); more; more = FindNextFileW(search.Get(), &entry)) {
            const std::wstring_view name = entry.cFileName;
            if ((entry.dwFileAttributes & FILE_ATTRIBUTE_DIRECTORY) == 0) {
                bytes += Join(entry.nFileSizeHigh, entry.nFileSizeLow);
            } else if (name != L"." && name != L".." &&
                       (entry.dwFileAttributes & FILE_ATTRIBUTE_REPARSE_POINT) == 0) {
                folders.push_back(folder + entry.cFileName);
            }
        }
    }
    return bytes;
}

}  // namespace

void StorageAccount::Recount(const std::wstring& root, std::optional<std::uint64_t> capacity) {
    const std::uint64_t used = capacity ? CountBytes(root) : 0;
    const std::scoped_lock lock(mutex_);
    capacity_ = capacity;
    used_ = used;
}

std::uint64_t StorageAccount::Free() {
    const std::scoped_lock lock(mutex_);
    return FreeLocked();
}

std::uint64_t FileSizeAt(const std::wstring& pc_path) {
    WIN32_FILE_ATTRIBUTE_DATA data;
    if (!GetFileAttributesExW(pc_path.c_str(), GetFileExInfoStandard, &data) ||
        (data.dwFileAttributes & FILE_ATTRIBUTE_DIRECTORY) != 0) {
        return 0;
    }
    return Join(data.nFileSizeHigh, data.nFileSizeLow);
}

}  // namespace folder_device
