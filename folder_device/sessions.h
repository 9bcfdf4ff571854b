// The sessions of the process, each with its connection: what CeRapiInitEx starts and CeRapiUninit ends.
#pragma once

#include <windows.h>

#include <atomic>
#include <memory>
#include <mutex>
#include <vector>

#include "platform/handles.h"
#include "rapi/remote_api.h"

namespace folder_device {

// One session's connection. The record given to CeRapiInitEx belongs to the caller and is written only until
// the session is closed; the event belongs to the connection and is closed with the session.
class Connection {
  public:
    // Starts a connection that ends in `result` after `delay` milliseconds: at once for 0, never for
    // INFINITE, else on a thread of its own that keeps the DLL loaded. Null when the system has no event or
    // thread left.
    static std::shared_ptr<Connection> Begin(rapi::InitRecord& record, HRESULT result, DWORD delay);

    bool IsUp() const { return up_; }
    // The session is closed or its thread is gone: the record is not touched again.
    void End();

  private:
    struct Delayed;

    static DWORD WINAPI WaitAndComplete(void* parameter);
    void Complete(HRESULT result);

    std::mutex mutex_;
    rapi::InitRecord* record_ = nullptr;
    orvane::UniqueEvent event_;
    orvane::UniqueEvent ended_;  // Ends the wait of a delayed connection.
    std::atomic<bool> up_{false};
};

// A session belongs to the thread that opened it. All members but EndAll speak of the calling thread's.
//
// Threads are told apart by their numbers, and not by data of their own: what the language keeps for a thread
// may be gone before the DLL hears of the thread's end. A number is used anew only after that.
class Sessions {
  public:
    void Open(std::shared_ptr<Connection> connection);
    // Ends the youngest one; false when there is none.
    bool Close();
    // The thread ends. The lock that this takes is held over nothing but memory.
    void EndThread();

    std::size_t Count() const;
    // Whether one of them is connected.
    bool IsConnected() const;
    // Whether any thread has one.
    bool AnyInProcess() const;
    void EndAll();

  private:
    struct Session {
        DWORD thread;
        std::shared_ptr<Connection> connection;
    };

    mutable std::mutex mutex_;
    std::vector<Session> sessions_;  // From the oldest to the youngest.
};

}  // namespace folder_device
