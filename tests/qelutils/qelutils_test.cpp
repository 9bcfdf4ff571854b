// The text helpers: patterns, catalogs of translations, and their use on windows and menus.
#include <gtest/gtest.h>

#include <algorithm>
#include <cstring>

#include "qelutils/message_catalog.h"
#include "qelutils/text_format.h"
#include "qelutils/xlate.h"
#include "ui/dialog.h"

namespace qel_text {
namespace {

TEST(TextFormat, FillsPlaceholdersAndKeepsEverythingElse) {
    // The arguments are "3", "7" and, as a text that looks like a pattern, "{1}{{".
    const wchar_t* const cases[][2] = {
        {L"{{Copying File {1}/{2}  - x}", L"{Copying File 3/7  - x}"},
        {L"{3}{2}{1}", L"{1}{{73"},
        {L"{0}{4}{-1}{x}{}{ 1}{18446744073709551617}", L"{0}{4}{-1}{x}{}{ 1}{18446744073709551617}"},
        {L"{4{1}", L"{43"},
        {L"a{1", L"a{1"},
    };
    for (const auto& [pattern, expected] : cases) {
        EXPECT_EQ(detail::qel_safefmt_impl(pattern, {L"3", L"7", L"{1}{{"}), expected) << pattern;
    }
}

// The catalog file that is built into this program.
std::string GermanFile() {
    HRSRC resource = FindResourceW(nullptr, MAKEINTRESOURCEW(0x0007), kCatalogType);
    return {static_cast<const char*>(LockResource(LoadResource(nullptr, resource))),
            SizeofResource(nullptr, resource)};
}

// Parses a copy that ends where readable memory ends, so that a read behind it is a crash.
MessageCatalog Parse(const std::string& content) {
    constexpr size_t kReadable = 0x10000;
    static char* const end =
        static_cast<char*>(VirtualAlloc(nullptr, 2 * kReadable, MEM_RESERVE, PAGE_NOACCESS)) + kReadable;
    VirtualAlloc(end - kReadable, kReadable, MEM_COMMIT, PAGE_READWRITE);
    std::copy(content.begin(), content.end(), end - content.size());
    return ParseCatalog(std::as_bytes(std::span(end - content.size(), content.size())));
}

TEST(MessageCatalog, GivesNoTextsWhenDamagedAnywhere) {
    const std::string sound = GermanFile();
    ASSERT_FALSE(Parse(sound).empty());
    for (size_t size = 0; size + 1 < sound.size(); ++size) {
        EXPECT_TRUE(Parse(sound.substr(0, size)).empty()) << "cut to " << size;
    }
    uint32_t count = 0;
    std::memcpy(&count, &sound[8], sizeof(count));
    for (size_t offset = 0; offset < 28 + size_t{count} * 16; offset += 4) {
        for (const auto number : {0xFFFFFFFFU, static_cast<uint32_t>(sound.size() + 1)}) {
            std::string damaged = sound;
            std::memcpy(&damaged[offset], &number, sizeof(number));
            // The low half of the revision and the two numbers of the hash table are of no matter.
            EXPECT_EQ(Parse(damaged).empty(),
                      (offset != 4 || number > 0xFFFF) && offset != 20 && offset != 24)
                << number << " at " << offset;
        }
    }
    EXPECT_TRUE(Parse(sound.substr(0, sound.size() - 2) + "\xFF").empty()) << "not UTF-8";
}

TEST(MessageCatalog, ChoosesWithinThePrimaryLanguage) {
    using Languages = std::vector<LANGID>;
    constexpr LANGID kNeutral = 0x0007;
    constexpr LANGID kGermany = 0x0407;
    constexpr LANGID kAustria = 0x0C07;
    constexpr LANGID kLuxembourg = 0x1007;
    constexpr LANGID kFrance = 0x040C;
    EXPECT_EQ(ChooseCatalogLanguage(Languages{kNeutral, kGermany, kAustria}, kAustria), kAustria);
    EXPECT_EQ(ChooseCatalogLanguage(Languages{kLuxembourg, kGermany, kNeutral}, kAustria), kNeutral);
    EXPECT_EQ(ChooseCatalogLanguage(Languages{kLuxembourg, kGermany, kFrance}, kAustria), kGermany);
    EXPECT_EQ(ChooseCatalogLanguage(Languages{kFrance, 0}, kGermany), std::nullopt);
}

constexpr LANGID kEnglish = 0x0409;
constexpr LANGID kAustrian = 0x0C07;  // There is a catalog of German in general only.

class Translation : public ::testing::Test {
  protected:
    Translation() { SetCatalogLanguage(kAustrian); }
    ~Translation() override { SetCatalogLanguage(kEnglish); }
};

TEST_F(Translation, LooksUpTheUsersLanguageAndFallsBackToTheKey) {
    EXPECT_EQ(Xlate(L"Exit it"), L"Exit it");
    EXPECT_EQ(Xlate(L"The file:\n{1} \n\nWill be replaced by the file:\n{2}"),
              L"Die Datei\n{1} \n\nwird ersetzt durch die Datei\n{2}");
    SetCatalogLanguage(kEnglish);
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
}  // namespace qel_text
