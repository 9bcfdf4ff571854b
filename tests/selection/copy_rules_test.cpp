#include "selection/copy_rules.h"

#include <gtest/gtest.h>

#include "tests/support/temp_folder.h"

namespace orvane {
namespace {

using testing::AddSeconds;
using testing::FileTimeOf;
using testing::TicksOf;
using testing::UtcTime;

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
