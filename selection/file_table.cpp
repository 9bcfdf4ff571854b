#include "selection/file_table.h"

#include <algorithm>
#include <bit>
#include <span>

#include "platform/text_case.h"

namespace orvane {

namespace {

// Room for the names of a table to begin with; it grows by itself.
constexpr std::size_t kUsualNameBytes = 32 * sizeof(wchar_t);

constexpr std::int32_t kNoRow = -1;

// Asks for the text of a name some rows further on. The processor does so by itself, but not beyond a page of
// memory, of which the text of a long table fills many.
void ReadAhead(std::span<const std::wstring_view> names, std::size_t row) {
    constexpr std::size_t kRows = 8;
    if (row + kRows < names.size()) {
        PreFetchCacheLine(PF_TEMPORAL_LEVEL_1, names[row + kRows].data());
    }
}

// prefix + "\" + name, in memory of `text`.
std::wstring_view PathBelow(std::wstring_view prefix, std::wstring_view name,
                            std::pmr::memory_resource& text) {
    const std::size_t size = prefix.size() + 1 + name.size();
    auto* path = static_cast<wchar_t*>(text.allocate(size * sizeof(wchar_t), alignof(wchar_t)));
    wchar_t* end = std::copy(prefix.begin(), prefix.end(), path);
    *end++ = L'\\';
    std::copy(name.begin(), name.end(), end);
    return {path, size};
}

std::uint32_t HashOf(std::wstring_view name) {
    return static_cast<std::uint32_t>(HashIgnoringCase(name));
}

}  // namespace

std::int32_t CountEntries(std::int32_t counter, const FileNode& node) {
    for (const FileNode& child : node.Children()) {
        ++counter;
        if (child.is_folder != 0) {
            counter = CountEntries(counter, child);
        }
    }
    return counter;
}

void FlattenTree(FileTable& table, std::int32_t& row, const FileNode& node, std::wstring_view prefix,
                 std::int32_t capacity) {
    if (row == 0) {
        const auto rows = static_cast<std::size_t>(capacity);
        table = {};
        table.names.reserve(rows);
        table.kinds.reserve(rows);
        table.creation_times.reserve(rows);
        table.write_times.reserve(rows);
        table.sizes.reserve(rows);
        table.text = std::make_unique<std::pmr::monotonic_buffer_resource>((rows + 1) * kUsualNameBytes);
    }
    for (const FileNode& child : node.Children()) {
        if (row >= capacity) {
            return;
        }
        ++row;
        const std::wstring_view name = PathBelow(prefix, child.name, *table.text);
        const bool is_folder = child.is_folder != 0;
        table.names.push_back(name);
        table.kinds.push_back(is_folder ? kKindFolder : kKindFile);
        table.creation_times.push_back(is_folder ? FILETIME{} : child.creation_time);
        table.write_times.push_back(is_folder ? FILETIME{} : child.last_write_time);
        table.sizes.push_back(child.Size());
        if (is_folder) {
            FlattenTree(table, row, child, name, capacity);
        }
    }
}

FileIndex::FileIndex(const FileTable& table, std::int32_t rows)
    : table_(table), rows_(rows), slots_(std::bit_ceil(static_cast<std::size_t>(rows) * 4 / 3 + 1), kNoRow) {
    const std::span names(table.names.data(), static_cast<std::size_t>(rows));
    hashes_.reserve(names.size());
    // Two loops: the leaps of the second one through the slots then overlap.
    for (std::size_t row = 0; row < names.size(); ++row) {
        ReadAhead(names, row);
        hashes_.push_back(HashOf(names[row]));
    }
    for (std::size_t row = 0; row < names.size(); ++row) {
        std::int32_t& slot = slots_[SlotOf(hashes_[row], names[row])];
        if (slot == kNoRow) {
            slot = static_cast<std::int32_t>(row);
        } else {
            names_are_unique_ = false;
        }
    }
}

std::int32_t FileIndex::Find(std::wstring_view name) const {
    const std::int32_t next = next_.load(std::memory_order_relaxed);
    const bool is_next = names_are_unique_ && next < rows_ &&
                         EqualIgnoringCase(table_.names[static_cast<std::size_t>(next)], name);
    const std::int32_t row = is_next ? next : slots_[SlotOf(HashOf(name), name)];
    if (row != kNoRow) {
        next_.store(row + 1, std::memory_order_relaxed);
    }
    return row;
}

std::optional<FILETIME> FileIndex::WriteTimeOf(std::wstring_view name) const {
    const std::int32_t row = Find(name);
    return row == kNoRow ? std::nullopt : std::optional(table_.write_times[static_cast<std::size_t>(row)]);
}

std::size_t FileIndex::SlotOf(std::uint32_t hash, std::wstring_view name) const {
    const std::size_t mask = slots_.size() - 1;
    std::size_t at = hash & mask;
    while (slots_[at] != kNoRow) {
        const auto row = static_cast<std::size_t>(slots_[at]);
        if (hashes_[row] == hash && EqualIgnoringCase(table_.names[row], name)) {
            break;
        }
        at = (at + 1) & mask;
    }
    return at;
}

}  // namespace orvane
