#include "device/clock_check.h"

#include <gtest/gtest.h>

#include "platform/handles.h"
#include "tests/support/folder_device.h"
#include "tests/support/message_boxes.h"
#include "tests/support/temp_folder.h"

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

// The present time, at the beginning of a second and not within half a minute of midnight, so that the
// clocks are read in the same second and on the same date.
FILETIME BeginningOfASecond() {
    for (;;) {
        FILETIME now{};
        GetSystemTimeAsFileTime(&now);
        const int second = ToLocalCalendar(now).SecondOfDay();
        if (testing::TicksOf(now) % 10'000'000 < 1'000'000 && second >= 30 && second < 86400 - 30) {
            return now;
        }
        Sleep(10);
    }
}

class ClockCheckOnDevice : public ::testing::Test {
  protected:
    int Check(bool by_file_view) {
        return by_file_view ? CheckDeviceDateTimeForFileView(nullptr, cancel_.Get())
                            : CheckDeviceDateTime(nullptr, cancel_.Get(), accepted_);
    }

    testing::FolderDevice device_;
    UniqueEvent cancel_ = NewManualResetEvent();
    bool accepted_ = false;
};

TEST_F(ClockCheckOnDevice, AsksWhenTheClocksDiffer) {
    struct Case {
        const wchar_t* offset;
        int answer;  // 0: no question.
        int expected;
    };
    const Case cases[] = {
        {L"", 0, 1},          {L"10", 0, 1},         {L"-9", 0, 1},       {L"11", IDOK, 1},
        {L"11", IDCANCEL, 0}, {L"-12", IDCANCEL, 0}, {L"86400", IDOK, 1}, {L"-86400", IDCANCEL, 0},
    };
    for (const bool by_file_view : {false, true}) {
        for (const Case& c : cases) {
            SCOPED_TRACE(::testing::PrintToString(c.offset) + (by_file_view ? " in the file view" : ""));
            device_.Set(L"CLOCK_OFFSET", c.offset);
            testing::MessageBoxAnswerer answerer({c.answer});
            accepted_ = false;
            const FILETIME now = BeginningOfASecond();
            EXPECT_EQ(Check(by_file_view), c.expected);
            EXPECT_EQ(accepted_, c.expected == 1 && !by_file_view);
            EXPECT_EQ(device_.CloseSessions(), 0);
            EXPECT_FALSE(testing::Exists(device_.PcPath(L"\\CompareDateTime.txt")));

            const auto seen = answerer.Seen();
            ASSERT_EQ(seen.size(), c.answer == 0 ? 0U : 1U);
            if (c.answer != 0) {
                EXPECT_EQ(seen[0].caption, L"Syncronization");
                EXPECT_EQ(seen[0].style, 0x141U);
                const FILETIME device_now = testing::AddSeconds(now, _wtoi(c.offset));
                EXPECT_EQ(seen[0].text,
                          FormatDateDifferenceMessage(ToLocalCalendar(now), ToLocalCalendar(device_now)));
            }
        }
    }
}

TEST_F(ClockCheckOnDevice, PassesWhatCannotBeRead) {
    const testing::MessageBoxAnswerer answerer({IDCANCEL, IDCANCEL, IDCANCEL, IDCANCEL});
    device_.Set(L"CLOCK_OFFSET", L"3600");
    for (const wchar_t* refused : {L"CeCreateFile=5", L"CeGetFileTime=5"}) {
        SCOPED_TRACE(::testing::PrintToString(refused));
        device_.Set(L"REFUSE", refused);
        EXPECT_EQ(Check(false), 1);
        EXPECT_FALSE(accepted_);
        EXPECT_EQ(device_.CloseSessions(), 1);
        EXPECT_EQ(Check(true), 1);
        EXPECT_EQ(device_.CloseSessions(), 0);
        EXPECT_FALSE(testing::Exists(device_.PcPath(L"\\CompareDateTime.txt")));
    }
    EXPECT_TRUE(answerer.Seen().empty());
}

}  // namespace
}  // namespace orvane
