#include "device/connect.h"

#include <gtest/gtest.h>

#include <thread>

#include "platform/handles.h"
#include "tests/support/folder_device.h"

namespace orvane {
namespace {

constexpr UINT kSentMessage = WM_USER + 1;
constexpr UINT kPostedMessage = WM_USER + 2;

// Signals an event after a while, from a thread of its own.
class LateSignal {
  public:
    LateSignal(HANDLE event, DWORD delay_ms)
        : thread_([event, delay_ms] {
              Sleep(delay_ms);
              SetEvent(event);
          }) {}
    ~LateSignal() { thread_.join(); }

  private:
    std::thread thread_;
};

struct ConnectCase {
    const char* what;
    const wchar_t* setting;
    const wchar_t* value;
    DWORD cancel_after_ms;
    HRESULT expected;
    ULONGLONG at_least_ms;
    ULONGLONG at_most_ms;
};

TEST(Connect, AnswersWhatTheWaitEndedIn) {
    constexpr DWORD kNever = INFINITE;
    const HRESULT cancelled = HRESULT_FROM_WIN32(ERROR_CANCELLED);
    const HRESULT refused = HRESULT_FROM_WIN32(ERROR_ACCESS_DENIED);
    const ConnectCase cases[] = {
        {"at once", L"CONNECT_DELAY", L"", kNever, S_OK, 0, 300},
        {"within the limit", L"CONNECT_DELAY", L"600", kNever, S_OK, 550, 950},
        {"after the limit", L"CONNECT_DELAY", L"1400", kNever, E_FAIL, 990, 1350},
        {"cancelled before", L"CONNECT_DELAY", L"600", 0, cancelled, 0, 300},
        {"cancelled meanwhile", L"CONNECT_DELAY", L"900", 250, cancelled, 200, 700},
        {"refused at once", L"INIT_RESULT", L"0x80070005", kNever, refused, 0, 300},
        {"refused by the device", L"CONNECT_RESULT", L"0x80070005", kNever, refused, 0, 300},
    };
    for (const ConnectCase& c : cases) {
        SCOPED_TRACE(c.what);
        testing::FolderDevice device;
        device.Set(c.setting, c.value);
        const UniqueEvent cancel = NewManualResetEvent();
        std::optional<LateSignal> signal;
        if (c.cancel_after_ms == 0) {
            SetEvent(cancel.Get());
        } else if (c.cancel_after_ms != kNever) {
            signal.emplace(cancel.Get(), c.cancel_after_ms);
        }
        const ULONGLONG start = GetTickCount64();
        EXPECT_EQ(ConnectDevice(cancel.Get()), c.expected);
        const ULONGLONG elapsed = GetTickCount64() - start;
        EXPECT_GE(elapsed, c.at_least_ms);
        EXPECT_LE(elapsed, c.at_most_ms);
        EXPECT_EQ(device.CloseSessions(), SUCCEEDED(c.expected) ? 1 : 0);
    }
}

TEST(Connect, WithoutAnEventToCancelItFails) {
    testing::FolderDevice device;
    EXPECT_EQ(ConnectDevice(nullptr), E_FAIL);
    EXPECT_EQ(device.CloseSessions(), 0);
}

int sent_count = 0;
int posted_count = 0;

LRESULT CALLBACK CountMessages(HWND window, UINT message, WPARAM wparam, LPARAM lparam) {
    sent_count += message == kSentMessage ? 1 : 0;
    posted_count += message == kPostedMessage ? 1 : 0;
    return DefWindowProcW(window, message, wparam, lparam);
}

TEST(Connect, ServesSentMessagesWithinTheLimit) {
    testing::FolderDevice device;
    device.Set(L"CONNECT_DELAY", L"3000");
    const HWND window =
        CreateWindowExW(0, L"STATIC", nullptr, 0, 0, 0, 0, 0, HWND_MESSAGE, nullptr, nullptr, nullptr);
    ASSERT_NE(window, nullptr);
    SetWindowLongPtrW(window, GWLP_WNDPROC, reinterpret_cast<LONG_PTR>(CountMessages));
    sent_count = 0;
    posted_count = 0;
    PostMessageW(window, kPostedMessage, 0, 0);

    std::atomic<bool> stop{false};
    std::atomic<int> answered{0};
    std::thread sender([&] {
        while (!stop) {
            DWORD_PTR result = 0;
            // The limit lets this thread end when nobody serves the window any more.
            if (SendMessageTimeoutW(window, kSentMessage, 0, 0, SMTO_NORMAL, 200, &result) != 0) {
                ++answered;
            }
            Sleep(20);
        }
    });
    const UniqueEvent cancel = NewManualResetEvent();
    const ULONGLONG start = GetTickCount64();
    EXPECT_EQ(ConnectDevice(cancel.Get()), E_FAIL);
    const ULONGLONG elapsed = GetTickCount64() - start;
    stop = true;
    sender.join();

    EXPECT_GE(elapsed, 990U);
    EXPECT_LE(elapsed, 1350U);
    EXPECT_GE(answered, 10);
    EXPECT_GE(sent_count, 10);
    EXPECT_EQ(posted_count, 0);
    DestroyWindow(window);
}

}  // namespace
}  // namespace orvane
