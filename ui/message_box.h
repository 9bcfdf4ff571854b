// Message boxes.
#pragma once

#include <windows.h>

#include <string>

namespace orvane::ui {

// Shows a message box of the given MB_ style and returns the chosen button's id (0 if it cannot be shown).
// An empty caption means the application's name.
int ShowMessageBox(HWND owner, const std::wstring& text, UINT style = MB_OK,
                   const std::wstring& caption = {});

}  // namespace orvane::ui
