// The event that ends an operation early.
#pragma once

#include <windows.h>

#include <atomic>
#include <chrono>

#include "platform/handles.h"

namespace orvane {

// A manual-reset event and a flag beside it. To look at an event costs a call of the system (in Wine a round
// trip to another process); the flag costs nothing, but only who signals through this object sets it. So
// whoever polls in a loop looks at the flag each time and at the event itself now and then. Any thread may
// use an object at any time.
class CancelEvent {
  public:
    // How late a loop may notice an event that was signalled by its handle alone.
    static constexpr std::chrono::milliseconds kLookInterval{10};

    // With a new event of its own, not signalled.
    CancelEvent() : owned_(NewManualResetEvent()), event_(owned_.Get()) {}
    // With an event that somebody else owns and that outlives this object; null for one that never comes.
    // Not explicit: whatever takes a CancelEvent takes a plain event too.
    CancelEvent(HANDLE event) : event_(event) {}
    CancelEvent(const CancelEvent&) = delete;
    CancelEvent& operator=(const CancelEvent&) = delete;

    // For the waits of the system; not to be closed. Null when there is no event.
    HANDLE Handle() const { return event_; }

    void Signal();
    void Reset();

    // Whether Signal was called; the event is not looked at.
    bool WasSignalled() const { return signalled_; }
    // Looks at the event itself.
    bool IsSignalled() const;
    // The same for loops: true at once after Signal, at most kLookInterval late after SetEvent on the handle.
    // A loop begins with IsSignalled.
    bool Poll() const;
    // For who has waited on the handle and found it not signalled: that stands for a look.
    void CountAsLook() const { looked_at_ = Clock::now(); }

  private:
    using Clock = std::chrono::steady_clock;

    UniqueEvent owned_;
    HANDLE event_;
    std::atomic<bool> signalled_{false};
    mutable std::atomic<Clock::time_point> looked_at_{};
};

}  // namespace orvane
