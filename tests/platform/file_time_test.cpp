#include "platform/file_time.h"

#include <gtest/gtest.h>

#include "tests/support/temp_folder.h"

namespace orvane {
namespace {

using testing::TicksOf;
using testing::UtcTime;

// Standard and summer time of a zone, each from a Sunday (5: the last) of a month on.
TIME_ZONE_INFORMATION Rules(LONG bias, SYSTEMTIME standard, SYSTEMTIME summer) {
    TIME_ZONE_INFORMATION rules{};
    rules.Bias = bias;
    rules.StandardDate = standard;
    rules.DaylightDate = summer;
    rules.DaylightBias = -60;
    return rules;
}

TEST(LocalTime, HasTheOffsetOfItsOwnDate) {
    const TIME_ZONE_INFORMATION berlin = Rules(-60, {0, 10, 0, 5, 3, 0, 0, 0}, {0, 3, 0, 5, 2, 0, 0, 0});
    const TIME_ZONE_INFORMATION sydney = Rules(-600, {0, 4, 0, 1, 3, 0, 0, 0}, {0, 10, 0, 1, 2, 0, 0, 0});
    const TIME_ZONE_INFORMATION newfoundland =
        Rules(210, {0, 11, 0, 1, 2, 0, 0, 0}, {0, 3, 0, 2, 2, 0, 0, 0});
    const TIME_ZONE_INFORMATION utc{};
    const struct {
        const TIME_ZONE_INFORMATION& rules;
        FILETIME utc;
        FILETIME local;
    } cases[] = {
        {berlin, UtcTime(2024, 1, 15, 11, 0, 0), UtcTime(2024, 1, 15, 12, 0, 0)},
        {berlin, UtcTime(2024, 7, 15, 10, 0, 0), UtcTime(2024, 7, 15, 12, 0, 0)},
        {berlin, UtcTime(2024, 3, 31, 0, 59, 58), UtcTime(2024, 3, 31, 1, 59, 58)},
        {berlin, UtcTime(2024, 3, 31, 1, 0, 0), UtcTime(2024, 3, 31, 3, 0, 0)},
        {berlin, UtcTime(2023, 12, 31, 23, 30, 0), UtcTime(2024, 1, 1, 0, 30, 0)},
        {sydney, UtcTime(2024, 1, 15, 1, 0, 0), UtcTime(2024, 1, 15, 12, 0, 0)},
        {sydney, UtcTime(2024, 7, 15, 2, 0, 0), UtcTime(2024, 7, 15, 12, 0, 0)},
        {newfoundland, UtcTime(2024, 7, 15, 14, 30, 0), UtcTime(2024, 7, 15, 12, 0, 0)},
        {utc, UtcTime(2024, 7, 15, 12, 0, 0), UtcTime(2024, 7, 15, 12, 0, 0)},
    };
    for (const auto& c : cases) {
        SCOPED_TRACE(TicksOf(c.utc));
        // Less than a millisecond is carried along.
        EXPECT_EQ(FileTimeTicks(ToLocalTime(LaterBy(c.utc, 9), c.rules)), FileTimeTicks(c.local) + 9);
        EXPECT_EQ(FileTimeTicks(FromLocalTime(LaterBy(c.local, 9), c.rules)), FileTimeTicks(c.utc) + 9);
    }
}

}  // namespace
}  // namespace orvane
