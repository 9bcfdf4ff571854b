// The listing of a PC folder, the table of it and the search in tables.
#include "selection/job_table.h"

#include <gtest/gtest.h>

#include <algorithm>
#include <atomic>
#include <map>
#include <random>
#include <thread>

#include "tests/support/temp_folder.h"

namespace orvane {
namespace {

using testing::MakeFolder;
using testing::TempFolder;
using testing::TicksOf;
using testing::WriteTextFile;

TEST(JobTable, HoldsTheFolderWithAllThatLiesBelow) {
    const TempFolder folder;
    const FILETIME time = testing::UtcTime(2024, 3, 1, 12, 30, 15);
    WriteTextFile(folder / L"file.qvj", "12345", time);
    WriteTextFile(folder / L"sub\\.hidden", "1", time);
    SetFileAttributesW((folder / L"sub\\.hidden").c_str(), FILE_ATTRIBUTE_HIDDEN | FILE_ATTRIBUTE_SYSTEM);
    MakeFolder(folder / L"sub\\empty.qvj");
    FileNode root;
    ASSERT_EQ(ListPcFolder(folder / L"*.*", true, root), DeviceResult::kDone);
    const JobTable job(root);
    using Row = std::tuple<std::wstring_view, ULONGLONG, std::uint64_t>;  // Kind, time and size.
    std::map<std::wstring_view, Row> rows;
    for (std::size_t row = 0; row < static_cast<std::size_t>(job.rows); ++row) {
        rows[job.table.names[row]] = {job.table.kinds[row], TicksOf(job.table.write_times[row]),
                                      job.table.sizes[row]};
    }
    const Row a_folder = {kKindFolder, 0, 0};  // Folders have times as well; tables leave them out.
    EXPECT_EQ(rows, (std::map<std::wstring_view, Row>{{L"\\file.qvj", {kKindFile, TicksOf(time), 5}},
                                                      {L"\\sub", a_folder},
                                                      {L"\\sub\\.hidden", {kKindFile, TicksOf(time), 1}},
                                                      {L"\\sub\\empty.qvj", a_folder}}));
}

TEST(ListPcFolder, TellsAMissingFolderFromAnEmptyOne) {
    const TempFolder folder;
    FileNode node;
    EXPECT_EQ(ListPcFolder(folder / L"*.*", true, node), DeviceResult::kDone);
    EXPECT_EQ(ListPcFolder(folder / L"missing\\*.*", true, node), DeviceResult::kFailed);
    EXPECT_EQ(node.child_count, 0);
}

// One sub-folder's search pattern is as long as a path may be, the other's one character longer.
TEST(ListPcFolder, DoesNotKnowWhatLiesTooDeep) {
    const TempFolder folder;
    std::wstring parent = folder.Path();
    while (parent.size() < 200) {
        parent += L"\\" + std::wstring(20, L'p');
    }
    MakeFolder(parent);
    const std::wstring fits(255 - parent.size() - 1, L'f');
    const std::wstring deep(fits.size() + 1, L'd');
    for (const std::wstring& name : {fits, deep}) {
        const std::wstring path = L"\\\\?\\" + parent + L"\\" + name;
        ASSERT_TRUE(CreateDirectoryW(path.c_str(), nullptr));
        ASSERT_TRUE(CreateDirectoryW((path + L"\\x").c_str(), nullptr));
    }
    FileNode node;
    EXPECT_EQ(ListPcFolder(parent + L"\\*.*", true, node), DeviceResult::kDone);
    const JobTable job(node);
    EXPECT_EQ(job.rows, 3);
    EXPECT_TRUE(job.IsUnknown(L"\\" + deep + L"\\x"));
    EXPECT_FALSE(job.IsUnknown(L"\\" + fits + L"\\x"));
}

TEST(ListPcFolder, CountsWhatItReadFromAFolderThatChanges) {
    const TempFolder folder;
    std::atomic<bool> stop{false};
    std::thread writer([&] {
        for (int step = 0; !stop; ++step) {
            const std::wstring file = folder / std::to_wstring(step % 40);
            step / 40 % 2 == 0 ? WriteTextFile(file, "") : static_cast<void>(DeleteFileW(file.c_str()));
        }
    });
    for (int round = 0; round < 500; ++round) {
        FileNode node;
        EXPECT_EQ(ListPcFolder(folder / L"*.*", true, node), DeviceResult::kDone);
        for (const FileNode& child : node.Children()) {
            EXPECT_FALSE(child.name.empty());
        }
    }
    stop = true;
    writer.join();
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
    for (const auto& listing : {names, unique}) {
        for (const std::size_t rows : {listing.size(), listing.size() / 4, std::size_t{0}}) {
            ExpectLinearSearch(listing, rows);
        }
    }
}

}  // namespace
}  // namespace orvane
