// The listing of a PC folder, the table of it, the search in tables, and which files are copied.
#include <gtest/gtest.h>

#include <algorithm>
#include <map>
#include <random>
#include <thread>

#include "platform/paths.h"
#include "selection/copy_rules.h"
#include "selection/job_table.h"
#include "tests/support/temp_folder.h"

namespace orvane {
namespace {

using testing::AddSeconds;
using testing::FileTimeOf;
using testing::TempFolder;
using testing::TicksOf;
using testing::UtcTime;
using testing::WriteTextFile;

TEST(JobTable, HoldsTheFolderWithAllThatLiesBelow) {
    const TempFolder folder;
    const FILETIME time = UtcTime(2024, 3, 1, 12, 30, 15);
    WriteTextFile(folder / L"file.qvj", "12345", time);
    WriteTextFile(folder / L"sub\\.hidden", "1", time);
    SetFileAttributesW((folder / L"sub\\.hidden").c_str(), FILE_ATTRIBUTE_HIDDEN | FILE_ATTRIBUTE_SYSTEM);
    testing::MakeFolder(folder / L"sub\\empty.qvj");
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
    FileNode none;
    EXPECT_EQ(ListPcFolder(folder / L"sub\\empty.qvj\\*.*", true, none), DeviceResult::kDone);
    EXPECT_EQ(ListPcFolder(folder / L"missing\\*.*", true, none), DeviceResult::kFailed);
    EXPECT_EQ(none.child_count, 0);
}

// One sub-folder's search pattern is as long as a path may be, the other's one character longer.
TEST(ListPcFolder, DoesNotKnowWhatLiesTooDeep) {
    const TempFolder folder;
    std::wstring parent = folder.Path();
    while (parent.size() < 200) {
        parent += L"\\" + std::wstring(20, L'p');
    }
    testing::MakeFolder(parent);
    const std::wstring fits(255 - parent.size() - 1, L'f');
    const std::wstring deep(fits.size() + 1, L'd');
    for (const std::wstring& name : {fits, deep}) {
        const std::wstring path = L"\\\\?\\" + JoinPath(parent, name);
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
    const std::jthread writer([&](const std::stop_token& stop) {
        for (int step = 0; !stop.stop_requested(); ++step) {
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
}

bool SystemFindsEqual(std::wstring_view a, std::wstring_view b) {
    return CompareStringOrdinal(a.data(), static_cast<int>(a.size()), b.data(), static_cast<int>(b.size()),
                                TRUE) == CSTR_EQUAL;
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
            FileTable table;
            table.names.assign(listing.begin(), listing.end());
            const FileIndex index(table, static_cast<std::int32_t>(rows));
            const auto end = listing.begin() + static_cast<std::ptrdiff_t>(rows);
            // Searches for every name, in order and backwards, some of them beyond the rows that take part.
            const auto expect = [&](const std::wstring& name) {
                const auto found = std::find_if(listing.begin(), end,
                                                [&](const auto& row) { return SystemFindsEqual(row, name); });
                EXPECT_EQ(index.Find(name), found == end ? -1 : found - listing.begin()) << name;
            };
            std::for_each(listing.begin(), listing.end(), expect);
            std::for_each(listing.rbegin(), listing.rend(), expect);
        }
    }
}

// The file time that the system shows as these local calendar fields, whatever the zone of the machine.
FILETIME LocalTime(int year, int month, int day, int hour, int minute, int second) {
    const FILETIME local = UtcTime(year, month, day, hour, minute, second);
    FILETIME time{};
    EXPECT_TRUE(LocalFileTimeToFileTime(&local, &time));
    return time;
}

TEST(IsSameVersion, TakesTheLocalDateAndTheWholeSecondsOfTheDay) {
    const FILETIME noon = LocalTime(2024, 3, 1, 12, 0, 0);
    const FILETIME before_1980 = LocalTime(1979, 12, 31, 12, 0, 0);
    const FILETIME before_1900 = LocalTime(1899, 12, 31, 23, 59, 59);
    const FILETIME unix_epoch = UtcTime(1970, 1, 1);
    const FILETIME beyond_the_calendar = FileTimeOf(0xFFFF'FFFF'FFFF'FFFFU);
    const std::tuple<FILETIME, FILETIME, bool> cases[] = {
        {noon, AddSeconds(noon, 9), true},
        {noon, AddSeconds(noon, 10), false},
        {noon, FileTimeOf(TicksOf(noon) + 99'999'999), true},
        {FileTimeOf(TicksOf(noon) + 9'999'999), AddSeconds(noon, 10), false},
        {LocalTime(2024, 3, 1, 23, 59, 59), LocalTime(2024, 3, 2, 0, 0, 1), false},
        {before_1980, AddSeconds(before_1980, 9), true},
        {before_1980, AddSeconds(before_1980, 10), false},
        {before_1900, FILETIME{}, true},
        {beyond_the_calendar, unix_epoch, true},
    };
    for (const auto& [a, b, same] : cases) {
        EXPECT_EQ(IsSameVersion(a, b, kSameVersionSeconds), same) << TicksOf(a) << " " << TicksOf(b);
        EXPECT_EQ(IsSameVersion(b, a, kSameVersionSeconds), same) << TicksOf(a) << " " << TicksOf(b);
    }
}

// On days on which the clocks change, seconds between two times stay what they are.
TEST(IsSameVersion, DoesNotJumpWhereTheClocksChange) {
    for (const FILETIME& day : {UtcTime(2024, 3, 10), UtcTime(2024, 11, 3)}) {
        for (int half_hour = 0; half_hour < 48; ++half_hour) {
            const FILETIME time = AddSeconds(day, half_hour * 1800);
            EXPECT_TRUE(IsSameVersion(time, AddSeconds(time, 9), kSameVersionSeconds)) << half_hour;
            EXPECT_FALSE(IsSameVersion(time, AddSeconds(time, 3600), kSameVersionSeconds)) << half_hour;
        }
    }
}

TEST(ShouldSkipCopy, LeavesAloneWhatIsNotOlderOrNotToBeReplaced) {
    const FILETIME old = LocalTime(2024, 3, 1, 12, 0, 0);
    const FILETIME newer = AddSeconds(old, 10);
    const FileTable table{{L"\\other.qvj", L"\\Job\\Site.QVJ"}, {kKindFile, kKindFile}, {}, {newer, old}};
    const FileIndex index(table, 2);
    // Whether older files are replaced, the source's time, the user's answer and whether the file stays.
    const std::tuple<bool, FILETIME, bool, bool> cases[] = {
        {true, newer, true, false},
        {true, newer, false, true},
        {false, newer, true, true},
        {true, AddSeconds(old, 9), true, true},
        {true, AddSeconds(old, -10), true, true},
    };
    for (const auto& each : cases) {
        const auto& [overwrite, time, answer, skip] = each;
        const auto ask = [yes = answer](std::wstring_view) { return yes; };
        EXPECT_EQ(ShouldSkipCopy(overwrite, time, L"\\job\\SITE.qvj", index, ask), skip) << (&each - cases);
    }
    EXPECT_FALSE(ShouldSkipCopy(false, newer, L"\\new.qvj", index, {}));
}

}  // namespace
}  // namespace orvane
