#include "platform/cancel_event.h"

namespace orvane {

void CancelEvent::Signal() {
    signalled_ = true;
    if (event_ != nullptr) {
        SetEvent(event_);
    }
}

void CancelEvent::Reset() {
    if (event_ != nullptr) {
        ResetEvent(event_);
    }
    signalled_ = false;
}

bool CancelEvent::IsSignalled() const {
    CountAsLook();
    return signalled_ || orvane::IsSignalled(event_);
}

bool CancelEvent::Poll() const {
    if (signalled_) {
        return true;
    }
    return Clock::now() - looked_at_.load() >= kLookInterval && IsSignalled();
}

}  // namespace orvane
