// A listing as a flat table, and the index that finds a name in it.
#pragma once

#include <windows.h>

#include <atomic>
#include <cstdint>
#include <memory>
#include <memory_resource>
#include <optional>
#include <string_view>
#include <vector>

#include "device/file_node.h"

namespace orvane {

// What a row of a table is.
inline constexpr std::wstring_view kKindFile = L"file";
inline constexpr std::wstring_view kKindFolder = L"dir";

// Parallel arrays of one capacity. How many rows are in use is kept by whoever fills the table.
struct FileTable {
    std::vector<std::wstring_view> names;  // Path below the job folder, beginning with "\".
    std::vector<std::wstring_view> kinds;  // kKindFile or kKindFolder.
    std::vector<FILETIME> creation_times;  // Set for files only.
    std::vector<FILETIME> write_times;     // Last write; 0 for a folder.
    std::vector<std::uint64_t> sizes{};    // Bytes; of the PC's files the low 32 bits of that number.

    // Where FlattenTree puts the text of the names, one behind the other. Names of another origin belong to
    // whoever fills them in.
    std::unique_ptr<std::pmr::monotonic_buffer_resource> text = nullptr;
};

// `counter` plus the number of all entries below the node, files and folders alike.
std::int32_t CountEntries(std::int32_t counter, const FileNode& node);

// Appends the entries below `node`, depth first, every folder before its content, and advances `row`. The
// first call has row 0, an empty prefix, and makes room for `capacity` rows; entries beyond it are dropped.
void FlattenTree(FileTable& table, std::int32_t& row, const FileNode& node, std::wstring_view prefix,
                 std::int32_t capacity);

// Finds a name among the first rows of a table, which must stay unchanged as long as the index lives. Built
// in one pass; a search costs the same however long the table is. Any thread may search.
//
// Both sides mostly list their files in the same order. A search looks first at the row behind the last one
// found: it then walks through memory in order, which a long table needs more than anything else.
class FileIndex {
  public:
    FileIndex(const FileTable& table, std::int32_t rows);

    const FileTable& Table() const { return table_; }

    // The first row whose name is equal without regard to case, whatever its kind; -1 if there is none.
    std::int32_t Find(std::wstring_view name) const;
    // The write time of that row; nothing if there is none.
    std::optional<FILETIME> WriteTimeOf(std::wstring_view name) const;

  private:
    // The slot that holds the row of the name or the empty slot where it would go.
    std::size_t SlotOf(std::uint32_t hash, std::wstring_view name) const;

    const FileTable& table_;
    const std::int32_t rows_;
    std::vector<std::uint32_t> hashes_;  // Of the rows' names.
    std::vector<std::int32_t> slots_;    // Open addressing; a power of two, at most three quarters full.
    bool names_are_unique_ = true;
    mutable std::atomic<std::int32_t> next_{0};  // The row behind the last one found.
};

}  // namespace orvane
