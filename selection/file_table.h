// A listing as a flat table, and the index that finds a name in it.
#pragma once

#include <windows.h>

#include <cstdint>
#include <string>
#include <string_view>
#include <vector>

#include "device/file_node.h"

namespace orvane {

// What a row of a table is.
inline constexpr std::wstring_view kKindFile = L"file";
inline constexpr std::wstring_view kKindFolder = L"dir";

// Four parallel arrays of one capacity. How many rows are in use is kept by whoever fills the table.
struct FileTable {
    std::vector<std::wstring> names;       // Path below the job folder, beginning with "\".
    std::vector<std::wstring_view> kinds;  // kKindFile or kKindFolder.
    std::vector<FILETIME> creation_times;  // Set for files only.
    std::vector<FILETIME> write_times;     // Last write; 0 for a folder.
};

// `counter` plus the number of all entries below the node, files and folders alike.
std::int32_t CountEntries(std::int32_t counter, const FileNode& node);

// Appends the entries below `node`, depth first, every folder before its content, and advances `row`. The
// first call has row 0, an empty prefix, and makes room for `capacity` rows; entries beyond it are dropped.
void FlattenTree(FileTable& table, std::int32_t& row, const FileNode& node, const std::wstring& prefix,
                 std::int32_t capacity);

// Finds a name among the first rows of a table, which must stay unchanged as long as the index lives. Built
// in one pass; a search costs the same however long the table is. Safe to read from any thread.
class FileIndex {
  public:
    FileIndex(const FileTable& table, std::int32_t rows);

    // The first row whose name is equal without regard to case, whatever its kind; -1 if there is none.
    std::int32_t Find(std::wstring_view name) const;

  private:
    struct Slot {
        std::uint32_t hash = 0;
        std::int32_t row = -1;
    };

    // The slot that holds the name or the empty slot where it would go.
    std::size_t SlotOf(std::uint32_t hash, std::wstring_view name) const;

    const FileTable* table_;
    std::vector<Slot> slots_;  // Open addressing; a power of two, at most half full.
};

}  // namespace orvane
