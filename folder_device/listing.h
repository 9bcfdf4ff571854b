// What a search finds. The pattern is a device path whose last name may hold "*" and "?"; "*.*" means every
// name, as it always did. Names are matched as they stand, never by a short name that the PC's file system
// keeps beside them. Left out are "." and "..", links, names that no device path can hold and whatever
// would lie at a path of 260 characters or more: nothing could be done with them.
#pragma once

#include <windows.h>

#include <string>
#include <string_view>
#include <vector>

#include "folder_device/settings.h"
#include "rapi/remote_api.h"

namespace folder_device {

// Appends every entry that the pattern finds, in the order of the PC's file system, then the made-up
// entries of the settings. Returns 0, also when nothing was found, or the error: that of the folder's
// path (device_path.h), ERROR_INVALID_NAME for a pattern that no name can match, ERROR_FILE_NOT_FOUND for a
// pattern that ends in "\".
DWORD FindEntries(const Settings& settings, const wchar_t* pattern, std::vector<rapi::FindData>& found);

// Whether the name matches the pattern, both in upper case.
bool MatchesPattern(std::wstring_view name, std::wstring_view pattern);

}  // namespace folder_device
