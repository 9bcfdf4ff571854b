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
    for (; !stop_; Sleep(10)) {
        HWND box = FindDialog(IsMessageBox);
        if (box == nullptr) {
            continue;
        }
        const SeenMessageBox seen = Describe(box);
        std::unique_lock lock(mutex_);
        const int wanted = seen_.size() < answers_.size() ? answers_[seen_.size()] : 0;
        seen_.push_back(seen);
        lock.unlock();
        Press(box, GetDlgItem(box, wanted) != nullptr ? wanted : seen.default_button);
        // Until the box has taken the answer it would be found again.
        while (IsWindow(box) && IsWindowVisible(box) && !stop_) {
            Sleep(10);
        }
    }
}

}  // namespace orvane::testing
