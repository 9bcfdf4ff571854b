#include "tests/support/message_boxes.h"

#include <utility>

#include "tests/support/dialog_script.h"
#include "ui/dialog.h"

namespace orvane::testing {

namespace {

// A dialog whose procedure lies in the system's own library is a message box.
bool IsMessageBox(HWND window) {
    const auto procedure = reinterpret_cast<LPCWSTR>(GetWindowLongPtrW(window, DWLP_DLGPROC));
    HMODULE module = nullptr;
    return GetModuleHandleExW(
               GET_MODULE_HANDLE_EX_FLAG_FROM_ADDRESS | GET_MODULE_HANDLE_EX_FLAG_UNCHANGED_REFCOUNT,
               procedure, &module) &&
           module == GetModuleHandleW(L"user32.dll");
}

BOOL CALLBACK FindBox(HWND window, LPARAM found) {
    DWORD process = 0;
    GetWindowThreadProcessId(window, &process);
    if (process != GetCurrentProcessId() || !IsVisibleDialog(window) || !IsMessageBox(window)) {
        return TRUE;
    }
    *reinterpret_cast<HWND*>(found) = window;
    return FALSE;
}

SeenMessageBox Describe(HWND box) {
    SeenMessageBox seen{.caption = ui::WindowText(box), .owner = GetWindow(box, GW_OWNER)};
    for (HWND child = GetWindow(box, GW_CHILD); child != nullptr; child = GetWindow(child, GW_HWNDNEXT)) {
        const LONG_PTR style = GetWindowLongPtrW(child, GWL_STYLE);
        if ((style & WS_VISIBLE) == 0) {
            continue;
        }
        if ((SendMessageW(child, WM_GETDLGCODE, 0, 0) & DLGC_BUTTON) == 0) {
            seen.text += ui::WindowText(child);
        } else if ((style & BS_TYPEMASK) == BS_DEFPUSHBUTTON) {
            seen.default_button = GetDlgCtrlID(child);
        }
    }
    return seen;
}

}  // namespace

MessageBoxAnswerer::MessageBoxAnswerer(std::vector<int> answers)
    : answers_(std::move(answers)), thread_([this] { Run(); }) {}

MessageBoxAnswerer::~MessageBoxAnswerer() {
    stop_ = true;
    thread_.join();
}

std::vector<SeenMessageBox> MessageBoxAnswerer::Seen() const {
    const std::lock_guard lock(mutex_);
    return seen_;
}

void MessageBoxAnswerer::Run() {
    while (!stop_) {
        HWND box = nullptr;
        EnumWindows(FindBox, reinterpret_cast<LPARAM>(&box));
        if (box != nullptr) {
            Answer(box);
        }
        Sleep(10);
    }
}

void MessageBoxAnswerer::Answer(HWND box) {
    const SeenMessageBox seen = Describe(box);
    int button = seen.default_button;
    {
        const std::lock_guard lock(mutex_);
        if (seen_.size() < answers_.size() && GetDlgItem(box, answers_[seen_.size()]) != nullptr) {
            button = answers_[seen_.size()];
        }
        seen_.push_back(seen);
    }
    Press(box, button);
    // Until the box has taken the answer it would be found again.
    while (IsWindow(box) && IsWindowVisible(box) && !stop_) {
        Sleep(10);
    }
}

}  // namespace orvane::testing
