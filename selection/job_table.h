// A job folder with all that lies below it: the listing of the PC's, and both sides' as a table.
#pragma once

#include <cstdint>
#include <optional>
#include <string>
#include <string_view>
#include <vector>

#include "device/file_node.h"
#include "device/result_codes.h"
#include "platform/cancel_event.h"
#include "selection/file_table.h"

namespace orvane {

// Fills `node` with the entries that the search `pattern` (a folder's path and "\*.*") finds, in the order
// of the search, each with name, folder flag, the three times and the low 32 bits of its size; with
// `recurse`, every sub-folder is listed into its own entry.
//
// A sub-folder that cannot be read (no right to, no room for its search in a path, an error half-way) or that
// leads back to a folder which it lies in has no entries and is marked `unread`; the listing goes on.
//
// kDone, also for an empty folder; kFailed, with no entries, if the pattern finds nothing at all (a folder
// always finds "." or "..", so the folder is missing or may not be read) or its search breaks off.
DeviceResult ListPcFolder(const std::wstring& pattern, bool recurse, FileNode& node);

// The PC folder with all that lies below it, as the root of a tree. One that is not there is an empty one;
// one that is there and cannot be read is marked `unread`. Once `stop` is signalled no further sub-folder is
// read.
FileNode ListPcTree(const std::wstring& folder, const CancelEvent& stop);

struct JobTable {
    JobTable() = default;
    explicit JobTable(const FileNode& root);

    // Whether the name lies below a folder of this table that was not read. What is there is not known: such
    // an entry of the other side is neither missing here nor older, and is left alone.
    bool IsUnknown(std::wstring_view name) const;
    // Whether every folder was read.
    bool IsComplete() const { return unread_.empty(); }

    FileTable table;
    std::int32_t rows = 0;

  private:
    std::vector<std::wstring> unread_;  // Each with "\" at both ends.
};

// Reads the PC job folder. A folder that is not named or not there gives an empty table; nothing comes back
// for one that is there and cannot be read.
std::optional<JobTable> ListPcJobFolder(const std::wstring& folder, const CancelEvent& stop = nullptr);

// What the user is told of such a folder, in the user's language.
std::wstring UnreadableFolderText(const std::wstring& folder);

}  // namespace orvane
