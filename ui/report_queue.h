// Reports from worker threads to a window: none is lost, doubled or out of order.
#pragma once

#include <windows.h>

#include <deque>
#include <mutex>
#include <optional>
#include <utility>

namespace orvane::ui {

// A worker pushes; the window's thread drains when it gets the notification message. At most one
// notification is under way at any time, so that the limit of posted messages in a thread's queue (10,000)
// cannot be reached, however many reports there are. Owned by the window's dialog.
template <class Report>
class ReportQueue {
  public:
    // Where and how to notify. To be called while no worker pushes.
    void SetTarget(HWND window, UINT message) {
        window_ = window;
        message_ = message;
    }

    // Any thread. Never waits for the window.
    void Push(Report report) {
        const std::lock_guard lock(mutex_);
        pushed_.push_back(std::move(report));
        Notify();
    }

    // The same for the last report of the only worker that pushes. It needs no memory and so cannot fail, if
    // moving a report cannot.
    void PushLast(Report report) noexcept {
        const std::lock_guard lock(mutex_);
        last_pushed_ = std::move(report);
        Notify();
    }

    // Window's thread. Calls `handle` with each report, the oldest first, for at most `budget_ms`
    // milliseconds (and always for one report). True when the queue is empty; after false, no notification
    // comes and the caller has to drain again.
    template <class Handler>
    bool Drain(DWORD budget_ms, Handler handle) {
        const ULONGLONG end = GetTickCount64() + budget_ms;
        while (Refill()) {
            handle(TakeOldest());
            if (GetTickCount64() >= end) {
                return !Refill();
            }
        }
        return true;
    }

  private:
    // With the mutex locked.
    void Notify() {
        if (!notified_) {
            notified_ = PostMessageW(window_, message_, 0, 0) != FALSE;
        }
    }

    // Takes over what was pushed when all that was taken is handled. False when nothing is left; only then
    // may the next push notify again.
    bool Refill() {
        if (taken_.empty() && !last_taken_) {
            const std::lock_guard lock(mutex_);
            taken_.swap(pushed_);
            last_taken_.swap(last_pushed_);
            notified_ = !taken_.empty() || last_taken_;
        }
        return !taken_.empty() || last_taken_;
    }

    Report TakeOldest() {
        if (taken_.empty()) {
            return *std::exchange(last_taken_, std::nullopt);
        }
        Report report = std::move(taken_.front());
        taken_.pop_front();
        return report;
    }

    std::mutex mutex_;
    std::deque<Report> pushed_;
    std::optional<Report> last_pushed_;  // After all in pushed_.
    bool notified_ = false;
    HWND window_ = nullptr;
    UINT message_ = 0;
    // Used by the window's thread only.
    std::deque<Report> taken_;
    std::optional<Report> last_taken_;  // After all in taken_.
};

}  // namespace orvane::ui
