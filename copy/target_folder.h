// The folders that targets lie in, with every missing parent. Failures, such as a folder that is already
// there, are not looked at: what is to be copied into a folder that is not there fails by itself.
#pragma once

#include <string>
#include <string_view>

#include "copy/copy_context.h"

namespace orvane {

// Creates the device folder level by level in a session of its own. False, and nothing done, without a
// connection. A path that does not satisfy PathFits ends the process.
bool EnsureDeviceFolder(std::wstring_view path, const CancelEvent& cancel);

// Creates the PC folder. A path that the PC cannot hold is left alone, and so is a network's root.
void EnsurePcFolder(const std::wstring& path);

// Creates the folder on the target's side that is to hold the entry. In the caller's session each level of a
// device folder is looked up first and made if it is missing. False when there is no connection.
bool EnsureTargetFolder(const EntryPaths& paths, const CopyContext& context);

}  // namespace orvane
