// A job folder with all that lies below it, as a table.
#pragma once

#include <cstdint>
#include <string>

#include "device/file_node.h"
#include "selection/file_table.h"

namespace orvane {

struct JobTable {
    JobTable() = default;
    explicit JobTable(const FileNode& root);

    FileTable table;
    std::int32_t rows = 0;
    // False when the listing broke off: the folder then holds files that the table lacks.
    bool complete = true;
};

// Whether the text names a folder of the PC. An empty one, and "\" alone, would come to mean the root of
// whatever drive is the current one; who means the root of a drive names the drive.
bool IsPcFolderNamed(const std::wstring& folder);

// Reads the PC job folder. A folder that is not named or not there gives an empty table. A sub-folder that
// cannot be searched ends the listing there.
JobTable ListPcJobFolder(const std::wstring& folder);

}  // namespace orvane
