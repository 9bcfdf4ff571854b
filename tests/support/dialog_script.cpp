#include "tests/support/dialog_script.h"

#include <gtest/gtest.h>

#include <algorithm>
#include <iterator>
#include <string_view>
#include <thread>
#include <utility>

#include "tests/support/message_boxes.h"
#include "ui/dialog.h"

namespace orvane::testing {

namespace {

// From the topmost to the lowest. A snapshot: going from one window to the next would end where one has just
// been closed.
std::vector<HWND> VisibleDialogs() {
    std::vector<HWND> dialogs;
    const auto look_at = [](HWND window, LPARAM found) -> BOOL {
        DWORD process = 0;
        GetWindowThreadProcessId(window, &process);
        wchar_t name[16] = {};
        GetClassNameW(window, name, static_cast<int>(std::size(name)));
        if (process == GetCurrentProcessId() && IsWindowVisible(window) &&
            name == std::wstring_view(L"#32770")) {
            reinterpret_cast<std::vector<HWND>*>(found)->push_back(window);
        }
        return TRUE;
    };
    EnumWindows(look_at, reinterpret_cast<LPARAM>(&dialogs));
    return dialogs;
}

std::vector<HWND> DialogsOfThread(DWORD thread) {
    std::vector<HWND> dialogs = VisibleDialogs();
    std::erase_if(dialogs,
                  [thread](HWND dialog) { return GetWindowThreadProcessId(dialog, nullptr) != thread; });
    return dialogs;
}

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

INT_PTR RunWithScript(const std::function<INT_PTR()>& modal, const std::function<void(HWND)>& script) {
    std::thread runner([thread = GetCurrentThreadId(), &script] {
        std::vector<HWND> open;
        EXPECT_TRUE(WaitUntil([&] { return !(open = DialogsOfThread(thread)).empty(); }));
        if (!open.empty()) {
            script(open.back());  // A window is always below those it owns.
        }
        while (!(open = DialogsOfThread(thread)).empty()) {
            PostMessageW(open.front(), WM_CLOSE, 0, 0);
            Sleep(20);
        }
    });
    const INT_PTR result = modal();
    runner.join();
    return result;
}

HWND FindDialog(const std::function<bool(HWND)>& matches) {
    const std::vector<HWND> dialogs = VisibleDialogs();
    const auto found = std::find_if(dialogs.begin(), dialogs.end(), matches);
    return found != dialogs.end() ? *found : nullptr;
}

std::vector<HWND> DialogsBeside(HWND window) {
    return DialogsOfThread(GetWindowThreadProcessId(window, nullptr));
}

bool WaitUntil(const std::function<bool()>& condition) {
    const ULONGLONG end = GetTickCount64() + 30'000;
    while (!condition()) {
        if (GetTickCount64() > end) {
            return false;
        }
        Sleep(5);
    }
    return true;
}

std::wstring ItemText(HWND dialog, int id) {
    return ui::WindowText(GetDlgItem(dialog, id));
}

void Press(HWND dialog, int id) {
    PostMessageW(dialog, WM_COMMAND, MAKEWPARAM(id, BN_CLICKED),
                 reinterpret_cast<LPARAM>(GetDlgItem(dialog, id)));
}

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
