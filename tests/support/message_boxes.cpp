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

UINT ButtonsOf(HWND box) {
    if (GetDlgItem(box, IDYES) != nullptr) {
        return MB_YESNO;
    }
    // A box with nothing but OK may use Cancel's id for it.
    return GetDlgItem(box, IDOK) != nullptr && GetDlgItem(box, IDCANCEL) != nullptr ? MB_OKCANCEL : MB_OK;
}

// The system's icons of message boxes have consecutive numbers in the order of their styles.
UINT StyleOfIcon(HICON icon) {
    for (UINT kind = 1; kind <= 4; ++kind) {
        if (icon == LoadIconW(nullptr, MAKEINTRESOURCEW(32512U + kind))) {
            return kind * MB_ICONERROR;
        }
    }
    return 0;
}

SeenMessageBox Describe(HWND box) {
    SeenMessageBox seen;
    seen.caption = ui::WindowText(box);
    seen.owner = GetWindow(box, GW_OWNER);
    seen.style = ButtonsOf(box);
    if ((GetWindowLongPtrW(box, GWL_EXSTYLE) & WS_EX_TOPMOST) != 0) {
        seen.style |= MB_SYSTEMMODAL;
    }
    UINT button_count = 0;
    for (HWND child = GetWindow(box, GW_CHILD); child != nullptr; child = GetWindow(child, GW_HWNDNEXT)) {
        const LONG_PTR style = GetWindowLongPtrW(child, GWL_STYLE);
        if ((style & WS_VISIBLE) == 0) {
            continue;
        }
        if ((SendMessageW(child, WM_GETDLGCODE, 0, 0) & DLGC_BUTTON) != 0) {
            seen.style |= (style & BS_TYPEMASK) == BS_DEFPUSHBUTTON ? button_count * MB_DEFBUTTON2 : 0;
            ++button_count;
        } else if ((style & SS_TYPEMASK) == SS_ICON) {
            seen.style |= StyleOfIcon(reinterpret_cast<HICON>(SendMessageW(child, STM_GETICON, 0, 0)));
        } else {
            seen.text += ui::WindowText(child);
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
    WORD button = LOWORD(SendMessageW(box, DM_GETDEFID, 0, 0));
    {
        const std::lock_guard lock(mutex_);
        if (seen_.size() < answers_.size() && GetDlgItem(box, answers_[seen_.size()]) != nullptr) {
            button = static_cast<WORD>(answers_[seen_.size()]);
        }
        seen_.push_back(seen);
    }
    PostMessageW(box, WM_COMMAND, MAKEWPARAM(button, BN_CLICKED),
                 reinterpret_cast<LPARAM>(GetDlgItem(box, button)));
    // Until the box has taken the answer it would be found again.
    while (IsWindow(box) && IsWindowVisible(box) && !stop_) {
        Sleep(10);
    }
}

}  // namespace orvane::testing
