// Numbered backups: an old file that is about to be replaced is renamed to name.001, name.002, ...
#pragma once

#include <string>

namespace orvane {

// Renames the file at the path to the path, "." and the first number, from 001 on, that no entry has; gaps
// are filled again. True when nothing stands there or the rename succeeded. False when a folder stands there,
// when there is no free name that fits a path (on the device the numbers end at 999, on the PC they have no
// cap) or when the rename was refused: what stands there is then where it was, and must not be overwritten.
bool KeepOldPcFile(const std::wstring& path);
// The same on the device, in the caller's session.
bool KeepOldDeviceFile(const std::wstring& path);

}  // namespace orvane
