#include "selection/copy_rules.h"

#include <gtest/gtest.h>

#include <functional>
#include <string>

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

FILETIME AddTicks(const FILETIME& time, ULONGLONG ticks) {
    return FileTimeOf(TicksOf(time) + ticks);
}

TEST(IsSameVersion, TakesTheLocalDateAndTheWholeSecondsOfTheDay) {
    const FILETIME noon = LocalTime(2024, 3, 1, 12, 0, 0);
    const FILETIME before_1980 = LocalTime(1979, 12, 31, 12, 0, 0);
    const FILETIME before_1900 = LocalTime(1899, 12, 31, 23, 59, 59);
    const FILETIME unix_epoch = UtcTime(1970, 1, 1);
    const FILETIME beyond_the_calendar = FileTimeOf(0xFFFF'FFFF'FFFF'FFFFU);
    const struct {
        FILETIME a;
        FILETIME b;
        bool same;
    } cases[] = {
        {noon, AddSeconds(noon, 9), true},
        {noon, AddSeconds(noon, 10), false},
        {noon, AddTicks(noon, 99'999'999), true},
        {AddTicks(noon, 9'999'999), AddSeconds(noon, 10), false},
        {LocalTime(2024, 3, 1, 23, 59, 59), LocalTime(2024, 3, 2, 0, 0, 1), false},
        {before_1980, AddSeconds(before_1980, 9), true},
        {before_1980, AddSeconds(before_1980, 10), false},
        {before_1900, FILETIME{}, true},
        {beyond_the_calendar, unix_epoch, true},
    };
    for (const auto& c : cases) {
        EXPECT_EQ(IsSameVersion(c.a, c.b, kSameVersionSeconds), c.same) << (&c - cases);
        EXPECT_EQ(IsSameVersion(c.b, c.a, kSameVersionSeconds), c.same) << (&c - cases);
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

TEST(ShouldSkipCopy, AsksOnlyForWhatWouldBeReplaced) {
    const FILETIME target_time = LocalTime(2024, 3, 1, 12, 0, 0);
    const FILETIME newer = AddSeconds(target_time, 10);
    const FileTable table{{L"\\other.qvj", L"\\Job\\Site.QVJ", L"\\job\\site.qvj", L"\\folder.qvj"},
                          {kKindFile, kKindFile, kKindFile, kKindFolder},
                          {},
                          {newer, target_time, newer, FILETIME{}}};
    enum class Answer { kNotToBeAsked, kKeep, kReplace };
    const struct {
        const wchar_t* name;
        std::int32_t rows;
        bool overwrite;
        FILETIME source_time;
        Answer answer;
        bool skip;
        int questions;
    } cases[] = {
        {L"\\job\\SITE.qvj", 4, true, newer, Answer::kNotToBeAsked, false, 0},
        {L"\\job\\SITE.qvj", 4, true, newer, Answer::kReplace, false, 1},
        {L"\\job\\SITE.qvj", 4, true, newer, Answer::kKeep, true, 1},
        {L"\\job\\SITE.qvj", 4, false, newer, Answer::kReplace, true, 0},
        {L"\\job\\SITE.qvj", 4, true, AddSeconds(target_time, 9), Answer::kReplace, true, 0},
        {L"\\job\\SITE.qvj", 4, true, AddSeconds(target_time, -10), Answer::kReplace, true, 0},
        {L"\\new.qvj", 4, false, newer, Answer::kKeep, false, 0},
        {L"\\folder.qvj", 4, true, FILETIME{}, Answer::kReplace, true, 0},
        {L"\\job\\site.qvj", 1, false, newer, Answer::kKeep, false, 0},
    };
    for (const auto& c : cases) {
        const FileIndex index(table, c.rows);
        int questions = 0;
        std::function<bool(std::wstring_view)> ask;
        if (c.answer != Answer::kNotToBeAsked) {
            ask = [&](std::wstring_view name) {
                EXPECT_EQ(name, c.name);
                ++questions;
                return c.answer == Answer::kReplace;
            };
        }
        EXPECT_EQ(ShouldSkipCopy(c.overwrite, c.source_time, c.name, index, ask), c.skip) << (&c - cases);
        EXPECT_EQ(questions, c.questions) << (&c - cases);
    }
}

}  // namespace
}  // namespace orvane
