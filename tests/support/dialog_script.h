// The dialogs of the test process as a user sees them, and a script that uses a modal one.
#pragma once

#include <windows.h>

#include <functional>
#include <string>
#include <vector>

namespace orvane::testing {

// Calls `modal`, which shows a dialog that no other dialog owns, and runs `script` on another thread as soon
// as that dialog can be seen. Dialogs that the script leaves open are closed. Returns what `modal` returns.
INT_PTR RunWithScript(const std::function<INT_PTR()>& modal, const std::function<void(HWND)>& script);

// The topmost visible dialog or message box of this process that matches, null when there is none.
HWND FindDialog(const std::function<bool(HWND)>& matches);
// The visible dialogs of the window's thread, the window itself among them.
std::vector<HWND> DialogsBeside(HWND window);

// Waits up to half a minute; whether the condition came true.
bool WaitUntil(const std::function<bool()>& condition);

std::wstring ItemText(HWND dialog, int id);
void Press(HWND dialog, int id);

}  // namespace orvane::testing
