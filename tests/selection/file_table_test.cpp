#include "selection/file_table.h"

#include <gtest/gtest.h>

#include <algorithm>
#include <random>
#include <utility>

#include "platform/text_case.h"
#include "tests/support/temp_folder.h"

namespace orvane {
namespace {

using testing::FileTimeOf;
using testing::TicksOf;

FileNode File(std::wstring_view name, ULONGLONG creation, ULONGLONG write) {
    FileNode node;
    std::copy(name.begin(), name.end(), node.name);
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

TEST(TextCase, ComparesEveryUnitAsTheSystemDoes) {
    for (unsigned unit = 1; unit <= 0xFFFF; ++unit) {
        const auto self = static_cast<wchar_t>(unit);
        const wchar_t upper = FoldCase(self);
        for (const wchar_t other :
             {upper, static_cast<wchar_t>(unit ^ 0x20U), static_cast<wchar_t>(unit ^ 1U)}) {
            const std::wstring_view a(&self, 1);
            const std::wstring_view b(&other, 1);
            ASSERT_EQ(EqualIgnoringCase(a, b), SystemFindsEqual(a, b)) << std::hex << unit;
        }
    }
}

TEST(FileIndex, FindsTheRowThatALinearSearchFinds) {
    std::mt19937 random(1);
    const std::wstring units =
        L"aAkKsSiI\u212A\u00DF\u1E9E\u017F\u0130\u0131\u00E4\u00C4\u03C3\u03C2\u03A3\\";
    const auto random_name = [&] {
        std::wstring name = L"\\";
        for (auto length = random() % 4; length > 0; --length) {
            name += units[random() % units.size()];
        }
        return name;
    };
    int found = 0;
    for (int round = 0; round < 300; ++round) {
        FileTable table;
        const auto rows = static_cast<std::int32_t>(random() % 200);
        std::generate_n(std::back_inserter(table.names), rows + 5, random_name);
        const FileIndex index(table, rows);
        for (int search = 0; search < 100; ++search) {
            const std::wstring name = random_name();
            std::int32_t expected = -1;
            for (std::int32_t row = rows; row-- > 0;) {
                if (SystemFindsEqual(table.names[static_cast<std::size_t>(row)], name)) {
                    expected = row;
                }
            }
            found += expected >= 0 ? 1 : 0;
            ASSERT_EQ(index.Find(name), expected) << round << " " << search;
        }
    }
    EXPECT_GT(found, 1000);
}

TEST(FileIndex, HoldsAHundredThousandNames) {
    constexpr std::int32_t kRows = 100'000;
    FileTable table;
    for (std::int32_t row = 0; row < kRows; ++row) {
        table.names.push_back(L"\\Job\\Picture " + std::to_wstring(row) + L".jpg");
    }
    const FileIndex index(table, kRows);
    for (std::int32_t row = 0; row < kRows; ++row) {
        ASSERT_EQ(index.Find(L"\\JOB\\pICTURE " + std::to_wstring(row) + L".JPG"), row);
        ASSERT_EQ(index.Find(L"\\Job\\Picture " + std::to_wstring(row) + L".jpe"), -1);
    }
}

}  // namespace
}  // namespace orvane
