// Listing a device folder, with or without what lies below it, in one Remote API call per folder.
#pragma once

#include <windows.h>

#include <span>
#include <string>
#include <string_view>

#include "device/file_node.h"
#include "device/result_codes.h"
#include "platform/cancel_event.h"

namespace orvane {

// Lists `folder` (an absolute device path, with or without "\" at its end) into `root`, whose old children
// are dropped: every sub-folder, and every file that MatchesExtension keeps, in the device's order; with
// `recursive` every sub-folder's own entries likewise. The caller holds a session on this thread.
//
// Answers kDone, kFailed when the device refused the folder or answered nonsense or the connection was lost,
// kListingCancelled when the event was found signalled before a folder was listed. On the last two the tree
// stays as far as it was read. A sub-folder that the device refuses is an empty one, marked `unread`. May
// throw std::bad_alloc.
//
// Nothing that a device reports is trusted: an entry whose name cannot be one component of a path is left
// out, and a folder whose path leaves no room for a search pattern shows no entries, which ends the
// descent. Needs less than 64 KiB of stack at the greatest depth that a path can have (some 130 levels).
DeviceResult ListDeviceFolder(const std::wstring& folder, std::span<const std::wstring> extensions,
                              bool recursive, FileNode& root, const CancelEvent& cancel);

// Lists all entries of one folder, without what lies below, not to be cancelled. Of no use to the program
// now, which lists companion folders as whole trees.
DeviceResult ListDeviceFolderFlat(const std::wstring& folder, FileNode& root);

// Whether a filter keeps a file of that name. `extensions` are extensions without the dot, compared without
// regard to case; "*" keeps every file, and so does an empty filter. A name's extension is what follows its
// last dot, also where that is the first character; a name without a dot has an empty extension.
bool MatchesExtension(std::wstring_view file_name, std::span<const std::wstring> extensions);

}  // namespace orvane
