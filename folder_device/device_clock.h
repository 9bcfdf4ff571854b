// The device's own clock: the PC's, set wrong by the setting CLOCK_OFFSET. The times that the PC's file
// system gives to new and written files are replaced by this clock's where the two differ.
#pragma once

#include <windows.h>

#include <cstdint>
#include <string>

#include "folder_device/owned_handle.h"

namespace folder_device {

inline FILETIME DeviceNow(std::int64_t offset) {
    FILETIME now;
    GetSystemTimeAsFileTime(&now);
    const auto ticks = (static_cast<std::int64_t>(now.dwHighDateTime) << 32) + now.dwLowDateTime + offset;
    return {static_cast<DWORD>(ticks & 0xFFFFFFFF), static_cast<DWORD>(ticks >> 32)};
}

// Gives what was just made at `pc_path` the device's time: always as creation and last access, as last write
// if `written`. Opens it for its attributes only, which no share mode forbids.
inline void StampNew(const std::wstring& pc_path, std::int64_t offset, bool written) {
    if (offset == 0) {
        return;
    }
    const auto file = Own<OwnedHandle>(CreateFileW(
        pc_path.c_str(), FILE_WRITE_ATTRIBUTES, FILE_SHARE_READ | FILE_SHARE_WRITE | FILE_SHARE_DELETE,
        nullptr, OPEN_EXISTING, FILE_FLAG_BACKUP_SEMANTICS, nullptr));
    if (file) {
        const FILETIME now = DeviceNow(offset);
        SetFileTime(file.get(), &now, &now, written ? &now : nullptr);
    }
}

}  // namespace folder_device
