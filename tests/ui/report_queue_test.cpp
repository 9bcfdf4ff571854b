#include "ui/report_queue.h"

#include <gtest/gtest.h>

#include <thread>
#include <utility>

namespace orvane::ui {
namespace {

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
    int handled = 0;
    int last = 0;
    const auto handle = [&](const auto& report) {
        ++handled;
        last = report.first;
    };
    EXPECT_FALSE(queue_.Drain(0, handle));
    queue_.PushLast({1, 0});
    EXPECT_EQ(PostedMessages(), 0) << "the window drains again without being told";
    EXPECT_EQ(last, 0);
    EXPECT_TRUE(queue_.Drain(60'000, handle));
    EXPECT_EQ(handled, 20'001);
    EXPECT_EQ(last, 1);
    queue_.PushLast({});
    EXPECT_EQ(PostedMessages(), 1);
}

}  // namespace
}  // namespace orvane::ui
