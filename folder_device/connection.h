// One session's connection: what CeRapiInitEx starts and CeRapiUninit ends. The record given to
// CeRapiInitEx belongs to the caller and is written only until the session is closed; the event belongs to
// the connection and is closed with the session.
#pragma once

#include <windows.h>

#include <atomic>
#include <memory>
#include <mutex>

#include "folder_device/owned_handle.h"
#include "rapi/remote_api.h"

namespace folder_device {

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
    OwnedHandle event_;
    OwnedHandle ended_;  // Ends the wait of a delayed connection.
    std::atomic<bool> up_{false};
};

}  // namespace folder_device
