#include "device/connect.h"

#include "device/remote_api.h"

namespace orvane {

namespace {

constexpr int kConnectLimitMs = 1000;
constexpr DWORD kFallbackWaitMs = 100;

constexpr DWORD kCancelSignalled = WAIT_OBJECT_0;
constexpr DWORD kSessionSignalled = WAIT_OBJECT_0 + 1;

// Waits for the one event or the other: kCancelSignalled, kSessionSignalled, or any other value when
// neither came in time. Ends after kConnectLimitMs, counted from the first wait, whatever is sent to the
// windows of this thread meanwhile.
DWORD WaitForSession(HANDLE cancel_event, HANDLE session_event) {
    const HANDLE events[] = {cancel_event, session_event};
    const DWORD start = GetTickCount();
    int remaining = kConnectLimitMs;
    DWORD outcome = WAIT_TIMEOUT;
    while (remaining >= 0) {
        outcome = MsgWaitForMultipleObjects(2, events, FALSE, static_cast<DWORD>(remaining), QS_SENDMESSAGE);
        if (outcome == WAIT_TIMEOUT) {
            break;
        }
        if (outcome == WAIT_FAILED) {
            outcome = WaitForMultipleObjects(2, events, FALSE, kFallbackWaitMs);
        }
        if (outcome == kCancelSignalled || outcome == kSessionSignalled || outcome == WAIT_FAILED) {
            break;
        }
        // Looking for a message lets the system deliver the sent ones; posted ones stay where they are.
        MSG message;
        PeekMessageW(&message, nullptr, 0, 0, PM_NOREMOVE);
        remaining = kConnectLimitMs - static_cast<int>(GetTickCount() - start);
    }
    return outcome;
}

}  // namespace

HRESULT ConnectDevice(const CancelEvent& cancel_event) {
    rapi::InitRecord record{};
    record.size = sizeof(record);
    const HRESULT started = CeRapiInitEx(&record);
    if (FAILED(started)) {
        return started;
    }
    HRESULT result = E_FAIL;
    switch (WaitForSession(cancel_event.Handle(), record.init_event)) {
        case kSessionSignalled:
            cancel_event.CountAsLook();  // Of two signalled events the wait would have told the first.
            result = record.init_result;
            break;
        case kCancelSignalled:
            result = HRESULT_FROM_WIN32(ERROR_CANCELLED);
            break;
        default:
            break;
    }
    if (FAILED(result)) {
        CeRapiUninit();
    }
    return result;
}

}  // namespace orvane
