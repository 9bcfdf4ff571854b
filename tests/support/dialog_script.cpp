#include "tests/support/dialog_script.h"

#include <gtest/gtest.h>

#include <algorithm>
#include <iterator>
#include <string_view>
#include <thread>

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

}  // namespace orvane::testing
