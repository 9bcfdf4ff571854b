// Device paths and the places that they stand for on the PC. A device path begins with "\", has "\" between
// its names and no "\" at its end (but for "\" itself, the root folder), and is shorter than 260 characters.
// Only names are let through that the PC's file system takes as they stand: what Win32 would read as a
// drive, a stream, a device, another folder or a shortened name is refused before it reaches the PC.
#pragma once

#include <windows.h>

#include <string>
#include <string_view>

namespace folder_device {

// Whether a device file can have this name: 1 to 255 characters, none below U+0020 and none of
// / \ : * ? " < > |, no unpaired surrogate, no blank or dot at the end, not a name that the PC reserves for
// its devices (with or without an extension).
bool IsDeviceName(std::wstring_view name);

// A device path's place on the PC and what stands there.
struct Location {
    std::wstring device_path;
    std::wstring pc_path;
    DWORD attributes = INVALID_FILE_ATTRIBUTES;

    bool IsRoot() const { return device_path.size() == 1; }
    bool Exists() const { return attributes != INVALID_FILE_ATTRIBUTES; }
    bool IsFolder() const { return Exists() && (attributes & FILE_ATTRIBUTE_DIRECTORY) != 0; }
    bool IsReadOnly() const { return Exists() && (attributes & FILE_ATTRIBUTE_READONLY) != 0; }
    bool IsPlainFile() const { return Exists() && !IsFolder(); }
};

// Fills `location` for `path` below `root`. The last name need not exist, the folders before it must.
// Returns 0 or the device error: ERROR_INVALID_PARAMETER (null), ERROR_FILENAME_EXCED_RANGE,
// ERROR_INVALID_NAME (also for the shortened name of something else), ERROR_PATH_NOT_FOUND, or
// ERROR_ACCESS_DENIED when a link stands on the way or at the end: links could lead out of the root.
DWORD Locate(const std::wstring& root, const wchar_t* path, Location& location);

}  // namespace folder_device
