#include "selection/file_table.h"

#include <gtest/gtest.h>

#include <algorithm>
#include <random>
#include <string>
#include <utility>
#include <vector>

#include "tests/support/temp_folder.h"

namespace orvane {
namespace {

using testing::FileTimeOf;
using testing::TicksOf;

FileNode File(std::wstring_view name, ULONGLONG creation, ULONGLONG write) {
    FileNode node;
    node.name = name;
    node.creation_time = FileTimeOf(creation);
    node.last_write_time = FileTimeOf(write);
    return node;
}

template <class... Nodes>
FileNode Folder(std::wstring_view name, Nodes... nodes) {
    FileNode node = File(name, 7, 8);  // Folders have times as well; tables leave them out.
    node.is_folder = 1;
    node.child_count = static_cast<std::int32_t>(sizeof...(nodes));
    node.children = std::make_unique<FileNode[]>(sizeof...(nodes));
    std::size_t at = 0;
    ((node.children[at++] = std::move(nodes)), ...);
    return node;
}

FileNode SampleTree() {
    return Folder(L"", File(L"b.qvj", 1, 2),
                  Folder(L"sub", Folder(L"empty"), Folder(L"deep", File(L"c", 3, 4))), File(L"a.qvj", 5, 6));
}

TEST(FlattenTree, PutsEveryFolderBeforeItsContent) {
    const struct {
        const wchar_t* name;
        std::wstring_view kind;
        ULONGLONG creation;
        ULONGLONG write;
    } rows[] = {{L"\\b.qvj", kKindFile, 1, 2},        {L"\\sub", kKindFolder, 0, 0},
                {L"\\sub\\empty", kKindFolder, 0, 0}, {L"\\sub\\deep", kKindFolder, 0, 0},
                {L"\\sub\\deep\\c", kKindFile, 3, 4}, {L"\\a.qvj", kKindFile, 5, 6}};
    const FileNode root = SampleTree();
    ASSERT_EQ(CountEntries(0, root), 6);
    EXPECT_EQ(CountEntries(10, root), 16);
    // Rows beyond the capacity are dropped. What an earlier use left in the table is gone.
    for (const std::int32_t capacity : {6, 5, 4, 1, 0}) {
        FileTable table;
        table.creation_times.assign(6, FileTimeOf(9));
        table.write_times.assign(6, FileTimeOf(9));
        std::int32_t count = 0;
        FlattenTree(table, count, root, L"", capacity);
        ASSERT_EQ(count, capacity);
        ASSERT_EQ(table.names.size(), static_cast<std::size_t>(capacity));
        for (std::size_t row = 0; row < static_cast<std::size_t>(count); ++row) {
            EXPECT_EQ(table.names[row], rows[row].name);
            EXPECT_EQ(table.kinds[row], rows[row].kind);
            EXPECT_EQ(TicksOf(table.creation_times[row]), rows[row].creation) << row;
            EXPECT_EQ(TicksOf(table.write_times[row]), rows[row].write) << row;
        }
    }
}

bool SystemFindsEqual(std::wstring_view a, std::wstring_view b) {
    return CompareStringOrdinal(a.data(), static_cast<int>(a.size()), b.data(), static_cast<int>(b.size()),
                                TRUE) == CSTR_EQUAL;
}

// Searches for every name, in order and backwards, some of them beyond the rows that take part.
void ExpectLinearSearch(const std::vector<std::wstring>& names, std::size_t rows) {
    FileTable table;
    table.names.assign(names.begin(), names.end());
    const FileIndex index(table, static_cast<std::int32_t>(rows));
    const auto expect = [&](const std::wstring& name) {
        const auto end = names.begin() + static_cast<std::ptrdiff_t>(rows);
        const auto found =
            std::find_if(names.begin(), end, [&](const auto& row) { return SystemFindsEqual(row, name); });
        EXPECT_EQ(index.Find(name), found == end ? -1 : found - names.begin()) << name;
    };
    std::for_each(names.begin(), names.end(), expect);
    std::for_each(names.rbegin(), names.rend(), expect);
}

TEST(FileIndex, FindsTheRowThatALinearSearchFinds) {
    const std::wstring units = L"aAkKsSiI\u212A\u00DF\u1E9E\u017F\u0130\u0131\u00E4\u00C4\u03C3\u03C2\u03A3";
    std::vector<std::wstring> names;
    for (const wchar_t first : units) {
        for (const wchar_t second : units) {
            names.push_back({L'\\', first, second});
        }
    }
    std::shuffle(names.begin(), names.end(), std::mt19937(1));
    std::vector<std::wstring> unique;
    for (const std::wstring& name : names) {
        if (std::none_of(unique.begin(), unique.end(),
                         [&](const auto& other) { return SystemFindsEqual(other, name); })) {
            unique.push_back(name);
        }
    }
    ASSERT_LT(unique.size(), names.size());
    for (const auto& listing : {names, unique}) {
        ExpectLinearSearch(listing, listing.size());
        ExpectLinearSearch(listing, listing.size() / 4);
        ExpectLinearSearch(listing, 0);
    }
}

}  // namespace
}  // namespace orvane
