#include "device/clock_check.h"

#include <gtest/gtest.h>

namespace orvane {
namespace {

TEST(ClockCheck, WordsTheDifference) {
    EXPECT_EQ(FormatDateDifferenceMessage({5, 3, 2024, 9, 7, 2}, {5, 3, 2024, 9, 10, 2}),
              L"PC Date is different from DEVICE!\n\n"
              L"PC       :05/03/2024  09:07:02\n"
              L"Device :05/03/2024  09:10:02");
    // A reading that could not be broken down.
    EXPECT_EQ(FormatClockReading({0, 0, 0, -1, -1, -1}), L"00/00/00  -1:-1:-1");
}

}  // namespace
}  // namespace orvane
