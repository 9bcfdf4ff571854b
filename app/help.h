// What the system menu of the main dialog offers besides the system's own items: the guide and the about box.
// All on the thread of the given window.
#pragma once

#include <windows.h>

namespace orvane {

// Adds the items. The guide has one only where its file lies beside the program.
void AppendHelpItems(HMENU system_menu);

// Carries out the WM_SYSCOMMAND command of one of them, over that window; false if it is none of them.
bool RunHelpItem(UINT command, HWND owner);

// Opens guide\user_guide.html, beside the program, with what the user's pages open with. Without the file
// nothing happens.
void OpenGuide(HWND owner);

}  // namespace orvane
