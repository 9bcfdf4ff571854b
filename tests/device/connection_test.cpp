// Connecting, and the check of the device's clock.
#include <gtest/gtest.h>

#include <atomic>
#include <thread>

#include "device/clock_check.h"
#include "device/connect.h"
#include "platform/handles.h"
#include "tests/support/folder_device.h"
#include "tests/support/message_boxes.h"

namespace orvane {
namespace {

class DeviceConnection : public ::testing::Test {
  protected:
    // Checks the clocks. That leaves neither its file nor, but where the device fails, a session.
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

TEST_F(DeviceConnection, AnswersWhatTheWaitEndedIn) {
    const std::tuple<const wchar_t*, const wchar_t*, HRESULT> cases[] = {
        {L"CONNECT_DELAY", L"400", S_OK},
        {L"CONNECT_DELAY", L"900", HRESULT_FROM_WIN32(ERROR_CANCELLED)},
        {L"INIT_RESULT", L"0x80070005", E_ACCESSDENIED},
        {L"CONNECT_RESULT", L"0x80070005", E_ACCESSDENIED},
    };
    for (const auto& [setting, value, expected] : cases) {
        device_.Set(setting, value);
        ResetEvent(cancel_.Get());
        const std::jthread canceller([this] {
            Sleep(650);
            SetEvent(cancel_.Get());
        });
        EXPECT_EQ(ConnectDevice(cancel_.Get()), expected) << setting << value;
        EXPECT_EQ(device_.CloseSessions(), SUCCEEDED(expected) ? 1 : 0);
        device_.Clear(setting);
    }
}

TEST_F(DeviceConnection, ServesSentMessagesWithinTheLimit) {
    device_.Set(L"CONNECT_DELAY", L"3000");
    const HWND window = CreateWindowW(L"STATIC", L"", 0, 0, 0, 0, 0, HWND_MESSAGE, nullptr, nullptr, nullptr);
    PostMessageW(window, WM_APP, 0, 0);
    std::atomic<int> answered{0};
    std::jthread sender([&](const std::stop_token& stop) {
        while (!stop.stop_requested()) {
            // The limit lets this thread end when nobody serves the window any more.
            answered += SendMessageTimeoutW(window, WM_APP, 0, 0, SMTO_NORMAL, 200, nullptr) != 0 ? 1 : 0;
            Sleep(20);
        }
    });
    const ULONGLONG start = GetTickCount64();
    EXPECT_EQ(ConnectDevice(cancel_.Get()), E_FAIL);
    const ULONGLONG elapsed = GetTickCount64() - start;
    EXPECT_GE(answered, 10);
    EXPECT_GE(elapsed, 990U);
    EXPECT_LE(elapsed, 1350U);
    sender = {};
    MSG message;
    EXPECT_TRUE(PeekMessageW(&message, window, WM_APP, WM_APP, PM_REMOVE)) << "posted, not to be dispatched";
    DestroyWindow(window);
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

TEST_F(DeviceConnection, AsksWhenTheClocksDiffer) {
    // The device's offset, the user's answer (0: no question) and the check's.
    const std::tuple<int, int, int> cases[] = {
        {10, 0, 1}, {-11, IDOK, 1}, {11, IDCANCEL, 0}, {86400, IDCANCEL, 0}};
    for (const bool by_file_view : {false, true}) {
        for (const auto& [offset, answer, expected] : cases) {
            SCOPED_TRACE(std::to_string(offset) + (by_file_view ? " in the file view" : ""));
            device_.Set(L"CLOCK_OFFSET", std::to_wstring(offset));
            testing::MessageBoxAnswerer answerer({answer});
            accepted_ = false;
            const FILETIME now = BeginningOfASecond();
            Check(by_file_view, expected);
            EXPECT_EQ(accepted_, expected == 1 && !by_file_view);
            ASSERT_EQ(answerer.Seen().size(), answer == 0 ? 0U : 1U);
            for (const testing::SeenMessageBox& box : answerer.Seen()) {
                EXPECT_EQ(box.default_button, IDCANCEL);
                EXPECT_EQ(box.text,
                          FormatDateDifferenceMessage(ToLocalCalendar(now),
                                                      ToLocalCalendar(testing::AddSeconds(now, offset))));
            }
        }
    }
}

TEST_F(DeviceConnection, WithoutAClockIsNoReasonToStop) {
    device_.Set(L"CLOCK_OFFSET", L"3600");
    for (const wchar_t* refused : {L"CeCreateFile=5", L"CeGetFileTime=5"}) {
        device_.Set(L"REFUSE", refused);
        Check(/*by_file_view=*/false, 1, 1);
        EXPECT_FALSE(accepted_);
        Check(/*by_file_view=*/true, 1);
    }
}

}  // namespace
}  // namespace orvane
