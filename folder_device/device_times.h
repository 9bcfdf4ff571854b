// The device's own clock: the PC's, set wrong by the setting CLOCK_OFFSET. The times that the PC's file
// system gives to new files are replaced by this clock's; those of written files where the two differ.
#pragma once

#include <windows.h>

#include <cstdint>
#include <string>

#include "platform/handles.h"

namespace folder_device {

inline FILETIME DeviceNow(std::int64_t offset) {
    FILETIME now;
    GetSystemTimeAsFileTime(&now);
    const auto ticks = (static_cast<std::int64_t>(now.dwHighDateTime) << 32) + now.dwLowDateTime + offset;
    return {static_cast<DWORD>(ticks & 0xFFFFFFFF), static_cast<DWORD>(ticks >> 32)};
}

// Gives what was just made or emptied at `pc_path` the device's time as creation and last access: the PC's
// file system lets a file that is made again within seconds, or emptied, keep its old creation time. As last
// write too if the file is `written` and the clock is wrong; with the PC's own time that is right already.
// Opens the file for its attributes only, which no share mode forbids, and by a handle of its own: times set
// through a handle hold against later writes through that handle only.
inline void StampNew(const std::wstring& pc_path, std::int64_t offset, bool written) {
    const orvane::UniqueFile file(CreateFileW(pc_path.c_str(), FILE_WRITE_ATTRIBUTES,
                                              FILE_SHARE_READ | FILE_SHARE_WRITE | FILE_SHARE_DELETE, nullptr,
                                              OPEN_EXISTING, FILE_FLAG_BACKUP_SEMANTICS, nullptr));
    if (file) {
        const FILETIME now = DeviceNow(offset);
        SetFileTime(file.Get(), &now, &now, written && offset != 0 ? &now : nullptr);
    }
}

}  // namespace folder_device
