#include "ui/dialog.h"

#include <gtest/gtest.h>

#include <functional>
#include <stdexcept>
#include <thread>
#include <utility>
#include <vector>

#include "ui/control.h"
#include "ui/report_queue.h"

namespace orvane::ui {
namespace {

constexpr int kEdit = 10;
// Does not fit 32 bits, and its lower half is negative.
constexpr LRESULT kWide = 0x12345'9ABC'DEF0;

using Handler = std::function<std::optional<LRESULT>(UINT)>;

class TestDialog : public Dialog {
  public:
    TestDialog() : Dialog(30000) {}
    HWND Edit() const { return Item(kEdit); }

    Handler handler = [](UINT) { return std::nullopt; };

  protected:
    std::optional<LRESULT> OnMessage(UINT message, WPARAM /*wparam*/, LPARAM /*lparam*/) override {
        return handler(message);
    }
};

class TestControl : public Control {
  public:
    Handler handler = [](UINT) { return std::nullopt; };

  protected:
    std::optional<LRESULT> OnMessage(UINT message, WPARAM /*wparam*/, LPARAM /*lparam*/) override {
        return handler(message);
    }
    std::optional<LRESULT> OnReflected(UINT message, WPARAM /*wparam*/, LPARAM /*lparam*/) override {
        return handler(message);
    }
};

std::optional<LRESULT> Throw(UINT /*message*/) {
    throw std::runtime_error("no handler may do that");
}

TEST(Dialog, ReturnsResultsWholeAndTellsZeroFromUnhandled) {
    TestDialog dialog;
    ASSERT_TRUE(dialog.Create());
    const auto answer = [&](UINT message) { return SendMessageW(dialog.Handle(), message, 0, 0); };
    EXPECT_EQ(answer(WM_QUERYENDSESSION), TRUE) << "what the system answers";
    dialog.handler = [](UINT) { return 0; };
    EXPECT_EQ(answer(WM_QUERYENDSESSION), FALSE);
    dialog.handler = Throw;
    EXPECT_EQ(answer(WM_QUERYENDSESSION), TRUE);
    dialog.handler = [](UINT) { return kWide; };
    for (const UINT message :
         std::initializer_list<UINT>{WM_CTLCOLOREDIT, WM_CTLCOLORDLG, WM_CHARTOITEM, WM_APP}) {
        EXPECT_EQ(answer(message), kWide) << message;
    }
    dialog.handler = [](UINT) { return std::nullopt; };
}

TEST(Control, HandlesItsMessagesAndItsNotificationsBeforeTheDialog) {
    TestDialog dialog;
    TestControl control;
    ASSERT_TRUE(dialog.Create());
    const auto code = [&] { return SendMessageW(dialog.Edit(), WM_GETDLGCODE, 0, 0); };
    const auto notify = [&] {
        NMHDR header{dialog.Edit(), kEdit, 1};
        return SendMessageW(dialog.Handle(), WM_NOTIFY, kEdit, reinterpret_cast<LPARAM>(&header));
    };
    const LRESULT system_answer = code();
    dialog.handler = [](UINT message) { return message == WM_NOTIFY ? std::optional(7) : std::nullopt; };
    ASSERT_TRUE(control.Attach(dialog.Edit()));
    EXPECT_EQ(notify(), 7) << "left to the dialog";
    control.handler = [](UINT) { return kWide; };
    EXPECT_EQ(notify(), kWide);
    EXPECT_EQ(code(), kWide);
    MEASUREITEMSTRUCT measure{ODT_MENU, kEdit, 0, 0, 0, 0};
    EXPECT_EQ(SendMessageW(dialog.Handle(), WM_MEASUREITEM, kEdit, reinterpret_cast<LPARAM>(&measure)), 0)
        << "a menu's item of the control's number";
    control.handler = Throw;
    EXPECT_EQ(notify(), 0);
    EXPECT_EQ(code(), system_answer);
    dialog.Destroy();
    EXPECT_EQ(control.Handle(), nullptr);
}

constexpr UINT kReports = WM_APP + 1;

class ReportQueueTest : public ::testing::Test {
  protected:
    ReportQueueTest() { queue_.SetTarget(window_, kReports); }
    ~ReportQueueTest() override { DestroyWindow(window_); }

    int PostedMessages() const {
        int count = 0;
        for (MSG message; PeekMessageW(&message, window_, kReports, kReports, PM_REMOVE); ++count) {
        }
        return count;
    }
    void Push(int count, int thread = 0) {
        for (int number = 0; number < count; ++number) {
            queue_.Push({thread, number});
        }
    }

    HWND window_ = CreateWindowExW(0, L"STATIC", L"", 0, 0, 0, 0, 0, HWND_MESSAGE, nullptr, nullptr, nullptr);
    ReportQueue<std::pair<int, int>> queue_;  // A thread and its report's number.
};

TEST_F(ReportQueueTest, LosesNothingFromSeveralThreads) {
    constexpr int kPerThread = 25'000;
    std::jthread first([this] { Push(kPerThread); });
    std::jthread second([this] { Push(kPerThread, 1); });
    // Only what the queue posts makes this thread look: a notification that is left out hangs the test.
    for (int next[2] = {}; next[0] + next[1] < 2 * kPerThread;) {
        MSG message;
        ASSERT_GT(GetMessageW(&message, window_, kReports, kReports), 0);
        while (
            !queue_.Drain(1, [&](const auto& report) { EXPECT_EQ(report.second, next[report.first]++); })) {
        }
    }
}

TEST_F(ReportQueueTest, NotifiesOncePerFilling) {
    Push(20'000);  // More than a message queue holds.
    EXPECT_EQ(PostedMessages(), 1);
    std::vector<int> handled;
    const auto handle = [&](const auto& report) { handled.push_back(report.first); };
    EXPECT_FALSE(queue_.Drain(0, handle));
    queue_.PushLast({1, 0});
    EXPECT_EQ(PostedMessages(), 0) << "the window drains again without being told";
    EXPECT_TRUE(queue_.Drain(60'000, handle));
    ASSERT_EQ(handled.size(), 20'001U);
    EXPECT_EQ(handled.back(), 1);
    queue_.PushLast({});
    EXPECT_EQ(PostedMessages(), 1);
}

}  // namespace
}  // namespace orvane::ui
