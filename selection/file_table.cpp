#include "selection/file_table.h"

#include <bit>
#include <cwchar>

#include "platform/text_case.h"

namespace orvane {

std::int32_t CountEntries(std::int32_t counter, const FileNode& node) {
    for (const FileNode& child : node.Children()) {
        ++counter;
        if (child.is_folder != 0) {
            counter = CountEntries(counter, child);
        }
    }
    return counter;
}

void FlattenTree(FileTable& table, std::int32_t& row, const FileNode& node, const std::wstring& prefix,
                 std::int32_t capacity) {
    if (row == 0) {
        const auto rows = static_cast<std::size_t>(capacity);
        table = {};  // A folder's times are the zeros that the arrays are made with.
        table.names.resize(rows);
        table.kinds.resize(rows);
        table.creation_times.resize(rows);
        table.write_times.resize(rows);
    }
    for (const FileNode& child : node.Children()) {
        if (row >= capacity) {
            return;
        }
        const auto index = static_cast<std::size_t>(row++);
        std::wstring& name = table.names[index];
        name.reserve(prefix.size() + 1 + std::wcslen(child.name));
        name.append(prefix).append(1, L'\\').append(child.name);
        const bool is_folder = child.is_folder != 0;
        table.kinds[index] = is_folder ? kKindFolder : kKindFile;
        if (is_folder) {
            FlattenTree(table, row, child, name, capacity);
        } else {
            table.creation_times[index] = child.creation_time;
            table.write_times[index] = child.last_write_time;
        }
    }
}

FileIndex::FileIndex(const FileTable& table, std::int32_t rows)
    : table_(&table), slots_(std::bit_ceil(static_cast<std::size_t>(rows) * 2 + 1)) {
    for (std::int32_t row = 0; row < rows; ++row) {
        const std::wstring& name = table.names[static_cast<std::size_t>(row)];
        const auto hash = static_cast<std::uint32_t>(HashIgnoringCase(name));
        Slot& slot = slots_[SlotOf(hash, name)];
        if (slot.row < 0) {
            slot = {hash, row};
        }
    }
}

std::int32_t FileIndex::Find(std::wstring_view name) const {
    return slots_[SlotOf(static_cast<std::uint32_t>(HashIgnoringCase(name)), name)].row;
}

std::size_t FileIndex::SlotOf(std::uint32_t hash, std::wstring_view name) const {
    const std::size_t mask = slots_.size() - 1;
    std::size_t at = hash & mask;
    while (slots_[at].row >= 0 &&
           (slots_[at].hash != hash ||
            !EqualIgnoringCase(table_->names[static_cast<std::size_t>(slots_[at].row)], name))) {
        at = (at + 1) & mask;
    }
    return at;
}

}  // namespace orvane
