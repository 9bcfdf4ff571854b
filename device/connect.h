// Opening a Remote API session.
#pragma once

#include <windows.h>

namespace orvane {

// Opens a session for the calling thread and waits until the device confirms it, at most 1000 ms and no
// longer than `cancel_event` (owned by the caller) stays unsignalled. While it waits, messages that other
// threads send to windows of this thread are delivered; posted messages are not dispatched.
//
// Returns a value >= 0 when the session stands: the caller closes it with CeRapiUninit on the same thread.
// A negative value leaves no session open: what CeRapiInitEx or the device answered, 0x800704C7 (the
// HRESULT of ERROR_CANCELLED) after the cancel event, E_FAIL when the device did not confirm in time.
HRESULT ConnectDevice(HANDLE cancel_event);

}  // namespace orvane
