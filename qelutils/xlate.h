// Translation of the user interface. The English text is the key; a text without a translation, and every
// text where the program has no message catalog for the user's language, is shown in English. The
// functions of this header are in no namespace: every text that the user sees goes through them.
#pragma once

#include <windows.h>

#include <string>
#include <string_view>

// The text in the user's language, or the key itself. May be called on any thread, also while the process
// ends. Two calls with one key give equal texts, so that a control's text can be compared with it.
std::wstring Xlate(std::wstring_view key);

// Translates a dialog that has just been created from its template: its caption and the texts of all
// windows within it. The contents of edit, list and combo boxes belong to the user and stay as they are.
// To be called on the window's thread. A null window is left alone.
void XlateWnd(HWND window);

// Translates the texts of all items of a menu and of its pop-ups. Where the menu is the bar of a visible
// window, its owner redraws it. A null menu is left alone.
void XlateMenu(HMENU menu);

namespace qel_text {

// Takes the texts of that language from now on in place of those of the user's display language. A text
// that is on the screen already stays as it is.
void SetCatalogLanguage(LANGID language);

}  // namespace qel_text
