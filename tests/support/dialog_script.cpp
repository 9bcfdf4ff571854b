#include "tests/support/dialog_script.h"

#include <gtest/gtest.h>

#include <algorithm>
#include <array>
#include <thread>

#include "ui/dialog.h"

namespace orvane::testing {

namespace {

BOOL CALLBACK AddDialog(HWND window, LPARAM dialogs) {
    if (IsVisibleDialog(window)) {
        reinterpret_cast<std::vector<HWND>*>(dialogs)->push_back(window);
    }
    return TRUE;
}

std::vector<HWND> DialogsOfThread(DWORD thread) {
    std::vector<HWND> dialogs;
    EnumThreadWindows(thread, AddDialog, reinterpret_cast<LPARAM>(&dialogs));
    return dialogs;
}

// The dialog that all others of the thread stand on.
HWND FindFirst(DWORD thread) {
    const std::vector<HWND> dialogs = DialogsOfThread(thread);
    const auto found = std::find_if(dialogs.begin(), dialogs.end(), [&dialogs](HWND dialog) {
        return std::find(dialogs.begin(), dialogs.end(), GetWindow(dialog, GW_OWNER)) == dialogs.end();
    });
    return found != dialogs.end() ? *found : nullptr;
}

}  // namespace

INT_PTR RunWithScript(const std::function<INT_PTR()>& modal, const std::function<void(HWND)>& script) {
    const DWORD thread = GetCurrentThreadId();
    std::thread runner([thread, &script] {
        HWND dialog = nullptr;
        if (!WaitUntil([&] { return (dialog = FindFirst(thread)) != nullptr; })) {
            ADD_FAILURE() << "the dialog does not show";
            return;
        }
        script(dialog);
        while (IsWindow(dialog) && IsWindowVisible(dialog)) {
            for (HWND open : DialogsOfThread(thread)) {
                PostMessageW(open, WM_CLOSE, 0, 0);
            }
            Sleep(20);
        }
    });
    const INT_PTR result = modal();
    runner.join();
    return result;
}

bool IsVisibleDialog(HWND window) {
    std::array<wchar_t, 16> name{};
    GetClassNameW(window, name.data(), static_cast<int>(name.size()));
    return IsWindowVisible(window) && std::wstring(name.data()) == L"#32770";
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
