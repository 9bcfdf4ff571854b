#include "device/connect.h"

#include <gtest/gtest.h>

#include <atomic>
#include <thread>

#include "platform/handles.h"
#include "tests/support/folder_device.h"

namespace orvane {
namespace {

TEST(Connect, AnswersWhatTheWaitEndedIn) {
    constexpr DWORD kNever = 0;
    const HRESULT cancelled = HRESULT_FROM_WIN32(ERROR_CANCELLED);
    const struct {
        const wchar_t* setting;
        const wchar_t* value;
        DWORD cancel_after_ms;
        HRESULT expected;
        ULONGLONG at_least_ms;
        ULONGLONG at_most_ms;
    } cases[] = {
        {L"CONNECT_DELAY", L"600", kNever, S_OK, 550, 950},
        {L"CONNECT_DELAY", L"900", 250, cancelled, 200, 700},
        {L"INIT_RESULT", L"0x80070005", kNever, E_ACCESSDENIED, 0, 300},
        {L"CONNECT_RESULT", L"0x80070005", kNever, E_ACCESSDENIED, 0, 300},
    };
    for (const auto& c : cases) {
        SCOPED_TRACE(::testing::Message() << c.setting << "=" << c.value);
        testing::FolderDevice device;
        device.Set(c.setting, c.value);
        const UniqueEvent cancel = NewManualResetEvent();
        std::jthread signal([&] {
            Sleep(c.cancel_after_ms);
            SetEvent(c.cancel_after_ms != kNever ? cancel.Get() : nullptr);
        });
        const ULONGLONG start = GetTickCount64();
        EXPECT_EQ(ConnectDevice(cancel.Get()), c.expected);
        const ULONGLONG elapsed = GetTickCount64() - start;
        EXPECT_GE(elapsed, c.at_least_ms);
        EXPECT_LE(elapsed, c.at_most_ms);
        EXPECT_EQ(device.CloseSessions(), SUCCEEDED(c.expected) ? 1 : 0);
    }
}

TEST(Connect, ServesSentMessagesWithinTheLimit) {
    testing::FolderDevice device;
    device.Set(L"CONNECT_DELAY", L"3000");
    const HWND window =
        CreateWindowExW(0, L"STATIC", nullptr, 0, 0, 0, 0, 0, HWND_MESSAGE, nullptr, nullptr, nullptr);
    PostMessageW(window, WM_APP, 0, 0);
    std::atomic<int> answered{0};
    std::jthread sender([&](const std::stop_token& stop) {
        while (!stop.stop_requested()) {
            // The limit lets this thread end when nobody serves the window any more.
            answered += SendMessageTimeoutW(window, WM_APP, 0, 0, SMTO_NORMAL, 200, nullptr) != 0 ? 1 : 0;
            Sleep(20);
        }
    });
    const UniqueEvent cancel = NewManualResetEvent();
    const ULONGLONG start = GetTickCount64();
    EXPECT_EQ(ConnectDevice(cancel.Get()), E_FAIL);
    const ULONGLONG elapsed = GetTickCount64() - start;
    EXPECT_GE(answered, 10);
    EXPECT_GE(elapsed, 990U);
    EXPECT_LE(elapsed, 1350U);
    sender.request_stop();
    sender.join();
    MSG message;
    EXPECT_TRUE(PeekMessageW(&message, window, WM_APP, WM_APP, PM_REMOVE)) << "posted, not to be dispatched";
    DestroyWindow(window);
}

}  // namespace
}  // namespace orvane
