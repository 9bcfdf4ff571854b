// Folders with every missing parent. Failures, such as a folder that is already there, are not looked at:
// what is to be copied into a folder that is not there fails by itself.
#pragma once

#include <windows.h>

#include <string>
#include <string_view>

namespace orvane {

// Creates the device folder level by level in a session of its own, opened with `cancel_event` (the
// caller's); without a connection nothing is done. A path that does not satisfy DevicePathFits ends the
// process.
void EnsureDeviceFolder(std::wstring_view path, HANDLE cancel_event);
// The same in the caller's session; looks each level up first and creates those that are missing.
void EnsureDeviceFolderInSession(std::wstring_view path);

// Creates the PC folder. A path that the PC cannot hold is left alone.
void EnsurePcFolder(const std::wstring& path);

}  // namespace orvane
