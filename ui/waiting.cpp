#include "ui/waiting.h"

#include "platform/handles.h"

namespace orvane::ui {

namespace {

thread_local int wait_cursors = 0;

// Whether the message asks to close the dialog. What comes from its close box, its menu or the task list, a
// dialog turns into the command "Cancel".
bool AsksToClose(const MSG& message) {
    return message.message == WM_QUIT || (message.message == WM_KEYDOWN && message.wParam == VK_ESCAPE) ||
           (message.message == WM_COMMAND && LOWORD(message.wParam) == IDCANCEL);
}

// Whether the message is on the way to become a request to close: a press on the close box or Alt+F4.
bool LeadsToClose(const MSG& message) {
    switch (message.message) {
        case WM_NCLBUTTONDOWN:
            return message.wParam == HTCLOSE;
        case WM_SYSKEYDOWN:
            return message.wParam == VK_F4;
        case WM_SYSCOMMAND:
            return (message.wParam & 0xFFF0U) == SC_CLOSE;  // The system uses the low four bits itself.
        default:
            return false;
    }
}

bool IsInput(const MSG& message) {
    const auto between = [&message](UINT first, UINT last) {
        return message.message >= first && message.message <= last;
    };
    return between(WM_NCMOUSEMOVE, WM_NCXBUTTONDBLCLK) || between(WM_MOUSEFIRST, WM_MOUSELAST) ||
           between(WM_KEYFIRST, WM_KEYLAST) || message.message == WM_COMMAND ||
           message.message == WM_SYSCOMMAND;
}

// Handles what is pending for the thread. False when the user asked to close.
bool HandlePending(HANDLE stop_event) {
    bool go_on = true;
    for (MSG message; PeekMessageW(&message, nullptr, 0, 0, PM_REMOVE);) {
        if (AsksToClose(message)) {
            go_on = false;
            if (stop_event != nullptr) {
                SetEvent(stop_event);
            }
        } else if (LeadsToClose(message) || !IsInput(message)) {
            DispatchMessageW(&message);
        }
    }
    return go_on;
}

struct Job {
    const std::function<void()>& work;
    bool done = false;
};

DWORD WINAPI RunJob(void* parameter) noexcept {
    Job& job = *static_cast<Job*>(parameter);
    try {
        job.work();
        job.done = true;
    } catch (...) {
        // Memory is all that can have failed: the job is not done.
    }
    return 0;
}

}  // namespace

WaitCursor::WaitCursor() {
    ++wait_cursors;
    SetCursor(LoadCursorW(nullptr, IDC_WAIT));
}

WaitCursor::~WaitCursor() {
    if (--wait_cursors == 0) {
        SetCursor(LoadCursorW(nullptr, IDC_ARROW));
    }
}

bool WaitCursor::IsShown() {
    return wait_cursors > 0;
}

bool WaitAndPaint(HANDLE worker, HANDLE stop_event) {
    bool go_on = true;
    for (;;) {
        // Ends with the worker at the latest, which a stop event tells to end; wakes for messages before.
        const DWORD waited =
            MsgWaitForMultipleObjectsEx(1, &worker, INFINITE, QS_ALLINPUT, MWMO_INPUTAVAILABLE);
        go_on = HandlePending(stop_event) && go_on;
        if (waited != WAIT_OBJECT_0 + 1) {
            return go_on;
        }
    }
}

Waited RunAndPaint(const std::function<void()>& work, HANDLE stop_event, SIZE_T stack_bytes) {
    ResetEvent(stop_event);
    Job job{work};
    const UniqueThread worker(CreateThread(nullptr, stack_bytes, RunJob, &job, 0, nullptr));
    if (!worker) {
        return Waited::kFailed;
    }
    if (!WaitAndPaint(worker.Get(), stop_event)) {
        return Waited::kClosed;
    }
    return job.done ? Waited::kDone : Waited::kFailed;
}

void DropPendingInput() {
    MSG message;
    while (PeekMessageW(&message, nullptr, WM_NCMOUSEMOVE, WM_NCXBUTTONDBLCLK, PM_REMOVE) ||
           PeekMessageW(&message, nullptr, WM_MOUSEFIRST, WM_MOUSELAST, PM_REMOVE) ||
           PeekMessageW(&message, nullptr, WM_KEYFIRST, WM_KEYLAST, PM_REMOVE)) {
    }
}

}  // namespace orvane::ui
