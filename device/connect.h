// Opening a Remote API session.
#pragma once

#include <windows.h>

#include "device/remote_api.h"
#include "platform/cancel_event.h"

namespace orvane {

// Opens a session for the calling thread and waits until the device confirms it, at most 1000 ms and no
// longer than `cancel_event` (owned by the caller) stays unsignalled. While it waits, messages that other
// threads send to windows of this thread are delivered; posted messages are not dispatched.
//
// Returns a value >= 0 when the session stands: the caller closes it with CeRapiUninit on the same thread.
// A negative value leaves no session open: what CeRapiInitEx or the device answered, 0x800704C7 (the
// HRESULT of ERROR_CANCELLED) after the cancel event, E_FAIL when the device did not confirm in time or
// `cancel_event` has none.
HRESULT ConnectDevice(const CancelEvent& cancel_event);

// Whose session an operation works in: one of its own, or the one that its caller holds on the same thread.
enum class Session { kOwn, kCallers };

// A session for the length of a scope: opened by ConnectDevice, closed at the end on the same thread if it
// stands. Code that cannot go on without a device tests it first. With kCallers nothing is opened and nothing
// closed here.
class DeviceSession {
  public:
    explicit DeviceSession(const CancelEvent& cancel, Session session = Session::kOwn)
        : owned_(session == Session::kOwn && SUCCEEDED(ConnectDevice(cancel))),
          stands_(session == Session::kCallers || owned_) {}
    DeviceSession(const DeviceSession&) = delete;
    DeviceSession& operator=(const DeviceSession&) = delete;
    ~DeviceSession() { Close(); }

    explicit operator bool() const { return stands_; }

    // Ends the session ahead of the scope.
    void Close() {
        if (owned_) {
            CeRapiUninit();
        }
        Release();
    }
    // Gives the session up as it is: somebody else closes it, or has closed it.
    void Release() { owned_ = stands_ = false; }

  private:
    bool owned_;
    bool stands_;
};

// Whether a session can be opened now. What failed in a session that stands may so be told from a connection
// that is gone. Takes as long as ConnectDevice.
inline bool IsDeviceThere(const CancelEvent& cancel) {
    return static_cast<bool>(DeviceSession(cancel));
}

}  // namespace orvane
