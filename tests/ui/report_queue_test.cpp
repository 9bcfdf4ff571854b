#include "ui/report_queue.h"

#include <gtest/gtest.h>

#include <array>
#include <thread>
#include <vector>

namespace orvane::ui {
namespace {

constexpr UINT kReports = WM_APP + 1;

struct Report {
    std::size_t thread = 0;
    int number = 0;
};

class ReportQueueTest : public ::testing::Test {
  protected:
    ReportQueueTest() { queue_.SetTarget(window_, kReports); }
    ~ReportQueueTest() override { DestroyWindow(window_); }

    int PostedMessages() const {
        MSG message;
        int count = 0;
        while (PeekMessageW(&message, window_, kReports, kReports, PM_REMOVE)) {
            ++count;
        }
        return count;
    }
    void Push(int count) {
        for (int number = 0; number < count; ++number) {
            queue_.Push({0, number});
        }
    }

    HWND window_ = CreateWindowExW(0, L"STATIC", L"", 0, 0, 0, 0, 0, HWND_MESSAGE, nullptr, nullptr, nullptr);
    ReportQueue<Report> queue_;
};

TEST_F(ReportQueueTest, LosesNothingFromSeveralThreads) {
    constexpr int kPerThread = 25'000;
    std::array<int, 4> next{};
    std::vector<std::thread> threads;
    for (std::size_t thread = 0; thread < next.size(); ++thread) {
        threads.emplace_back([this, thread] {
            for (int number = 0; number < kPerThread; ++number) {
                queue_.Push({thread, number});
            }
        });
    }
    // Only what the queue posts makes this thread look: a notification that is left out hangs the test.
    std::size_t received = 0;
    while (received < next.size() * kPerThread) {
        MSG message;
        ASSERT_GT(GetMessageW(&message, window_, kReports, kReports), 0);
        while (!queue_.Drain(1, [&](const Report& report) {
            EXPECT_EQ(report.number, next[report.thread]++);
            ++received;
        })) {
        }
    }
    for (std::thread& thread : threads) {
        thread.join();
    }
    EXPECT_TRUE(queue_.Drain(0, [](const Report&) { ADD_FAILURE() << "a report too many"; }));
}

TEST_F(ReportQueueTest, NotifiesOncePerFilling) {
    Push(20'000);  // More than a message queue holds.
    EXPECT_EQ(PostedMessages(), 1);
    int handled = 0;
    const auto count = [&](const Report&) { ++handled; };
    EXPECT_FALSE(queue_.Drain(0, count));
    EXPECT_EQ(handled, 1);
    Push(10);
    EXPECT_EQ(PostedMessages(), 0) << "the window drains again without being told";
    EXPECT_TRUE(queue_.Drain(60'000, count));
    EXPECT_EQ(handled, 20'010);
    Push(2);
    EXPECT_EQ(PostedMessages(), 1);
    EXPECT_FALSE(queue_.Drain(0, count));
    EXPECT_TRUE(queue_.Drain(0, count)) << "that was the last one";
    Push(1);
    EXPECT_EQ(PostedMessages(), 1);
}

TEST_F(ReportQueueTest, TakesReportsAfterTheWindowIsGone) {
    DestroyWindow(window_);
    Push(3);
    int handled = 0;
    EXPECT_TRUE(queue_.Drain(60'000, [&](const Report&) { ++handled; }));
    EXPECT_EQ(handled, 3);
}

}  // namespace
}  // namespace orvane::ui
