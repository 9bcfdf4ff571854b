#include "qelutils/xlate.h"

#include <gtest/gtest.h>

#include <array>

#include "qelutils/text_format.h"

namespace {

constexpr LANGID kEnglish = 0x0409;
constexpr LANGID kAustrian = 0x0C07;  // There is a catalog of German in general only.

class Translation : public ::testing::Test {
  protected:
    Translation() { qel_text::SetCatalogLanguage(kAustrian); }
    ~Translation() override { qel_text::SetCatalogLanguage(kEnglish); }
};

INT_PTR CALLBACK NoHandler(HWND, UINT, WPARAM, LPARAM) {
    return FALSE;
}

std::wstring TextOf(HWND window) {
    std::array<wchar_t, 100> text{};
    SendMessageW(window, WM_GETTEXT, text.size(), reinterpret_cast<LPARAM>(text.data()));
    return text.data();
}

std::wstring TextOf(HMENU menu, UINT position) {
    std::array<wchar_t, 100> text{};
    GetMenuStringW(menu, position, text.data(), static_cast<int>(text.size()), MF_BYPOSITION);
    return text.data();
}

TEST_F(Translation, LooksUpTheUsersLanguageAndFallsBackToTheKey) {
    EXPECT_EQ(Xlate(L"Exit"), L"Beenden");
    EXPECT_EQ(Xlate(L"one file"), L"eine Datei");
    for (const wchar_t* key : {L"", L"Exit it", L"Not translated yet"}) {
        EXPECT_EQ(Xlate(key), key);
    }
    EXPECT_EQ(qel_text::detail::qel_safefmt_impl(Xlate(L"{{Copying File {1}/{2}  - {3}}"),
                                                 {L"3", L"7", Xlate(L"From PC to Device")}),
              L"Vom PC zum Ger\u00E4t: {Datei 3 von 7}");
    EXPECT_EQ(Xlate(L"The file:\n{1} \n\nWill be replaced by the file:\n{2}"),
              L"{2}\n\u00FCberschreibt\n{1}");
    qel_text::SetCatalogLanguage(kEnglish);
    EXPECT_EQ(Xlate(L"Exit"), L"Exit");
}

TEST_F(Translation, TranslatesADialogButNotWhatTheUserEnters) {
    HWND dialog = CreateDialogParamW(nullptr, MAKEINTRESOURCEW(30000), nullptr, NoHandler, 0);
    ASSERT_NE(dialog, nullptr);
    for (const int user_text : {5, 6, 7}) {
        SetDlgItemTextW(dialog, user_text, L"Exit");
    }
    XlateWnd(dialog);
    EXPECT_EQ(TextOf(dialog), L"Abgleich zwischen PC und Ger\u00E4t");
    const wchar_t* const texts[] = {
        L"Beenden", L"Ordner auf dem PC", L"Vorlieben", L"Not in the catalog", L"Exit", L"Exit", L"Exit"};
    for (int id = 1; id <= 7; ++id) {
        EXPECT_EQ(TextOf(GetDlgItem(dialog, id)), texts[id - 1]) << id;
    }
    // A dialog tells from a button's text what it does.
    EXPECT_EQ(TextOf(GetDlgItem(dialog, 1)), Xlate(L"Exit"));
    EXPECT_NE(TextOf(GetDlgItem(dialog, 1)), Xlate(L"Cancel"));
    DestroyWindow(dialog);
}

TEST_F(Translation, TranslatesAMenuWithItsPopUps) {
    HMENU menu = LoadMenuW(nullptr, MAKEINTRESOURCEW(30001));
    ASSERT_NE(menu, nullptr);
    XlateMenu(menu);
    HMENU popup = GetSubMenu(menu, 0);
    EXPECT_EQ(TextOf(menu, 0), L"Einstellungen");
    EXPECT_EQ(TextOf(popup, 0), L"Auffrischen");
    EXPECT_EQ(TextOf(popup, 2), L"Dateiansicht");
    EXPECT_EQ(TextOf(GetSubMenu(popup, 2), 0), L"Eigenschaften...");
    // All but the texts is as before.
    EXPECT_EQ(GetMenuItemID(popup, 0), 11U);
    EXPECT_TRUE(GetMenuState(popup, 1, MF_BYPOSITION) & MF_SEPARATOR);
    EXPECT_TRUE(GetMenuState(menu, 12, MF_BYCOMMAND) & MF_GRAYED);
    DestroyMenu(menu);
}

}  // namespace
