// The sessions of the process: what CeRapiInitEx starts and CeRapiUninit ends. A session belongs to the
// thread that opened it; all members but AnyInProcess speak of the calling thread's.
//
// Threads are told apart by their numbers, and not by data of their own: what the language keeps for a thread
// may be gone before the DLL hears of the thread's end. A number is used anew only after that.
#pragma once

#include <windows.h>

#include <algorithm>
#include <mutex>
#include <vector>

#include "platform/handles.h"
#include "rapi/remote_api.h"

namespace folder_device {

class Sessions {
  public:
    // Opens one whose connection ends in `result` after `delay` milliseconds: at once for 0, never for
    // INFINITE. Fills the record, which stays the caller's and is not written later; its event, which is
    // signalled then, is closed with the session. False when the system has no event left.
    bool Open(rapi::InitRecord& record, HRESULT result, DWORD delay) {
        // A timer is an event that signals itself.
        const bool late = delay != 0 && delay != INFINITE;
        orvane::UniqueEvent event(late ? CreateWaitableTimerW(nullptr, TRUE, nullptr)
                                       : CreateEventW(nullptr, TRUE, delay == 0, nullptr));
        LARGE_INTEGER due;
        due.QuadPart = static_cast<LONGLONG>(delay) * -10'000;
        if (!event || (late && !SetWaitableTimer(event.Get(), &due, 0, nullptr, nullptr, FALSE))) {
            return false;
        }
        record.init_event = event.Get();
        record.init_result = result;
        const std::scoped_lock lock(mutex_);
        sessions_.push_back({.thread = GetCurrentThreadId(),
                             .event = std::move(event),
                             .result = result,
                             .has_come_about = delay == 0});
        return true;
    }
    // Ends the youngest one; false when there is none.
    bool Close() {
        const std::scoped_lock lock(mutex_);
        const auto youngest = std::find_if(sessions_.rbegin(), sessions_.rend(), OfThisThread);
        if (youngest == sessions_.rend()) {
            return false;
        }
        sessions_.erase(std::next(youngest).base());
        return true;
    }
    // The thread ends. The lock that this takes is held over nothing but memory and the closing of events.
    void EndThread() {
        const std::scoped_lock lock(mutex_);
        std::erase_if(sessions_, OfThisThread);
    }

    std::size_t Count() const {
        const std::scoped_lock lock(mutex_);
        return static_cast<std::size_t>(std::count_if(sessions_.begin(), sessions_.end(), OfThisThread));
    }
    // Whether the connection of one of them has come about.
    bool IsConnected() {
        const std::scoped_lock lock(mutex_);
        return std::any_of(sessions_.begin(), sessions_.end(), [](Session& session) {
            return OfThisThread(session) && SUCCEEDED(session.result) && HasComeAbout(session);
        });
    }
    bool AnyInProcess() const {
        const std::scoped_lock lock(mutex_);
        return !sessions_.empty();
    }

  private:
    struct Session {
        DWORD thread;
        orvane::UniqueEvent event;
        HRESULT result;
        bool has_come_about;
    };
    // A look at the event costs more than many a call: it is left out once a connection has come about.
    static bool HasComeAbout(Session& session) {
        session.has_come_about = session.has_come_about || orvane::IsSignalled(session.event.Get());
        return session.has_come_about;
    }
    static bool OfThisThread(const Session& session) { return session.thread == GetCurrentThreadId(); }

    mutable std::mutex mutex_;
    std::vector<Session> sessions_;  // From the oldest to the youngest.
};

}  // namespace folder_device
