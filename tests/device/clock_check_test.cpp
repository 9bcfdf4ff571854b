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
}

// The present time, at the beginning of a second and not within half a minute of midnight, so that the
// clocks are read in the same second and on the same date.
FILETIME BeginningOfASecond() {
    for (FILETIME now{};; Sleep(10)) {
        GetSystemTimeAsFileTime(&now);
        const int second = ToLocalCalendar(now).SecondOfDay();
        if (testing::TicksOf(now) % 10'000'000 < 1'000'000 && second >= 30 && second < 86400 - 30) {
            return now;
        }
    }
}

class ClockCheckOnDevice : public ::testing::Test {
  protected:
    // The check leaves neither its file nor, but where the device fails, a session.
    void Check(bool by_file_view, int expected, int open_sessions = 0) {
        EXPECT_EQ(by_file_view ? CheckDeviceDateTimeForFileView(nullptr, cancel_.Get())
                               : CheckDeviceDateTime(nullptr, cancel_.Get(), accepted_),
                  expected);
        EXPECT_EQ(device_.CloseSessions(), open_sessions);
        EXPECT_FALSE(testing::Exists(device_.PcPath(L"\\CompareDateTime.txt")));
    }

    testing::FolderDevice device_;
    UniqueEvent cancel_ = NewManualResetEvent();
    bool accepted_ = false;
};

TEST_F(ClockCheckOnDevice, AsksWhenTheClocksDiffer) {
    const struct {
        const wchar_t* offset;
        int answer;  // 0: no question.
        int expected;
    } cases[] = {{L"10", 0, 1}, {L"-11", IDOK, 1}, {L"11", IDCANCEL, 0}, {L"86400", IDCANCEL, 0}};
    for (const bool by_file_view : {false, true}) {
        for (const auto& c : cases) {
            SCOPED_TRACE(::testing::PrintToString(c.offset) + (by_file_view ? " in the file view" : ""));
            device_.Set(L"CLOCK_OFFSET", c.offset);
            testing::MessageBoxAnswerer answerer({c.answer});
            accepted_ = false;
            const FILETIME now = BeginningOfASecond();
            Check(by_file_view, c.expected);
            EXPECT_EQ(accepted_, c.expected == 1 && !by_file_view);
            const auto seen = answerer.Seen();
            ASSERT_EQ(seen.size(), c.answer == 0 ? 0U : 1U);
            for (const testing::SeenMessageBox& box : seen) {
                EXPECT_EQ(box.caption, L"Syncronization");
                EXPECT_EQ(box.default_button, IDCANCEL);
                const FILETIME device_now = testing::AddSeconds(now, _wtoi(c.offset));
                EXPECT_EQ(box.text,
                          FormatDateDifferenceMessage(ToLocalCalendar(now), ToLocalCalendar(device_now)));
            }
        }
    }
}

TEST_F(ClockCheckOnDevice, PassesWhatCannotBeRead) {
    device_.Set(L"CLOCK_OFFSET", L"3600");
    for (const wchar_t* refused : {L"CeCreateFile=5", L"CeGetFileTime=5"}) {
        SCOPED_TRACE(::testing::PrintToString(refused));
        device_.Set(L"REFUSE", refused);
        Check(/*by_file_view=*/false, 1, 1);
        EXPECT_FALSE(accepted_);
        Check(/*by_file_view=*/true, 1);
    }
}

}  // namespace
}  // namespace orvane
