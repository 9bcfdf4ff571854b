// Listing a PC folder.
#pragma once

#include <string>

#include "device/file_node.h"
#include "device/result_codes.h"

namespace orvane {

// Fills `node` with the entries that the search `pattern` (a folder's path and "\*.*") finds, in the order
// of the search, each with name, folder flag, the three times and the low 32 bits of its size; with
// `recurse`, every sub-folder is listed into its own entry. A sub-folder whose path has no room for a search
// is left empty.
//
// kFailed if the pattern finds nothing at all (a folder always finds "." or "..", so the folder is missing
// or may not be read) or the search breaks off; a sub-folder that fails so ends the listing with the same
// result, and the node then holds the entries read until there (none of a folder that could not be counted
// to its end). kDone otherwise, also for an empty folder.
DeviceResult ListPcFolder(const std::wstring& pattern, bool recurse, FileNode& node);

}  // namespace orvane
