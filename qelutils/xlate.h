// Translation of the user interface. The English text is the key; a text without a translation, and every
// text where the program has no message catalog for the user's language, is shown in English. The
// functions of this header are in no namespace: every text that the user sees goes through them.
#pragma once

#include <windows.h>

#include <cstddef>
#include <string>
#include <string_view>

namespace qel_text {
class TextKey;
}

// Marks a text as one to be translated where a table or a condition names it: XlateKey(L"Date").
// tools/make_pot.sh collects the texts that stand in calls of Xlate and XlateKey, and Xlate takes no others,
// so that a text which is missing in the catalogs does not compile.
template <std::size_t Size>
consteval qel_text::TextKey XlateKey(const wchar_t (&english)[Size]);

namespace qel_text {

// The English text of something, to be translated when it is shown.
class TextKey {
  public:
    constexpr std::wstring_view English() const { return english_; }

  private:
    template <std::size_t Size>
    friend consteval TextKey(::XlateKey)(const wchar_t (&english)[Size]);
    consteval explicit TextKey(std::wstring_view english) : english_(english) {}

    std::wstring_view english_;
};

namespace detail {

// What Xlate takes so that a text can stand in the call itself; for nothing else.
struct Literal {
    template <std::size_t Size>
    consteval Literal(const wchar_t (&english)[Size]) : key(XlateKey(english)) {}
    TextKey key;
};

}  // namespace detail
}  // namespace qel_text

template <std::size_t Size>
consteval qel_text::TextKey XlateKey(const wchar_t (&english)[Size]) {
    return qel_text::TextKey({english, Size - 1});
}

// The text in the user's language, or the key itself. May be called on any thread, also while the process
// ends. Two calls with one key give equal texts, so that a control's text can be compared with it.
std::wstring Xlate(qel_text::TextKey key);
inline std::wstring Xlate(qel_text::detail::Literal text) {
    return Xlate(text.key);
}

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
