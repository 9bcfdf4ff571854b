// The texts that the property dialog shows of a device file or folder.
#pragma once

#include <windows.h>

#include <cstdint>
#include <string>

namespace orvane {

// What a file's extension makes of it: "JOB File" for \Jobs\site1.job. Empty for a path without a dot or
// with a dot at its end; the bare " File" when the last dot belongs to a folder.
std::wstring FileTypeText(const std::wstring& path);

// The local date and time in the user's format; "Invalid DateTime" for a time that cannot be converted.
std::wstring DateText(const FILETIME& time);

// "{1} bytes". The low word of the size is taken as a signed number and the high word left out, so that a
// file of 2 GiB shows a negative number: it is meant.
std::wstring SizeText(std::uint32_t size_low);

}  // namespace orvane
