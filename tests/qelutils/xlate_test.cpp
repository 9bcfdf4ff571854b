#include "qelutils/xlate.h"

#include <gtest/gtest.h>

#include <array>

#include "ui/dialog.h"

namespace {

constexpr LANGID kEnglish = 0x0409;
constexpr LANGID kAustrian = 0x0C07;  // There is a catalog of German in general only.

class Translation : public ::testing::Test {
  protected:
    Translation() { qel_text::SetCatalogLanguage(kAustrian); }
    ~Translation() override { qel_text::SetCatalogLanguage(kEnglish); }
};

TEST_F(Translation, LooksUpTheUsersLanguageAndFallsBackToTheKey) {
    EXPECT_EQ(Xlate(L"Exit it"), L"Exit it");
    EXPECT_EQ(Xlate(L"The file:\n{1} \n\nWill be replaced by the file:\n{2}"),
              L"Die Datei\n{1} \n\nwird ersetzt durch die Datei\n{2}");
    qel_text::SetCatalogLanguage(kEnglish);
    EXPECT_EQ(Xlate(L"Exit"), L"Exit");
}

TEST_F(Translation, TranslatesADialogButNotWhatTheUserEnters) {
    HWND dialog = CreateDialogParamW(nullptr, MAKEINTRESOURCEW(30000), nullptr, nullptr, 0);
    ASSERT_NE(dialog, nullptr);
    for (const int user_text : {5, 6, 7}) {
        SetDlgItemTextW(dialog, user_text, L"Exit");
    }
    XlateWnd(dialog);
    const wchar_t* const texts[] = {L"Synchronisierung von PC und Mobilger\u00E4t",
                                    L"Beenden",
                                    L"Ordner auf dem PC",
                                    L"Einstellungen",
                                    L"Not in the catalog",
                                    L"Exit",
                                    L"Exit",
                                    L"Exit"};
    for (int id = 0; id <= 7; ++id) {
        EXPECT_EQ(orvane::ui::WindowText(id == 0 ? dialog : GetDlgItem(dialog, id)), texts[id]) << id;
    }
    DestroyWindow(dialog);
}

TEST_F(Translation, TranslatesAMenuWithItsPopUps) {
    HMENU menu = LoadMenuW(nullptr, MAKEINTRESOURCEW(30001));
    XlateMenu(menu);
    std::array<wchar_t, 100> text{};
    GetMenuStringW(menu, 0, text.data(), 100, MF_BYPOSITION);
    EXPECT_STREQ(text.data(), L"Einstellungen");
    GetMenuStringW(menu, 12, text.data(), 100, MF_BYCOMMAND);
    EXPECT_STREQ(text.data(), L"Eigenschaften...");
    DestroyMenu(menu);
}

}  // namespace
