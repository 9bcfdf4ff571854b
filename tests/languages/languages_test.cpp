// Every language of the program has every text, whole, and every text has room where it is shown.
#include <gtest/gtest.h>
#include <windows.h>

#include <array>
#include <cstring>
#include <regex>
#include <set>
#include <string>
#include <vector>

#include "app/application.h"
#include "qelutils/message_catalog.h"
#include "qelutils/text_format.h"
#include "qelutils/xlate.h"
#include "res/ids.h"
#include "settings/settings_store.h"
#include "tests/support/scratch_registry.h"
#include "ui/dialog.h"

namespace {

using qel_text::LoadCatalog;
using qel_text::MessageCatalog;

constexpr LANGID kEnglish = 0x0009;

// The numbers of the program's resources of that type: for catalogs, the languages.
std::vector<WORD> ResourceNumbers(LPCWSTR type) {
    std::vector<WORD> numbers;
    EnumResourceNamesW(
        nullptr, type,
        [](HMODULE, LPCWSTR, LPWSTR name, LONG_PTR found) -> BOOL {
            reinterpret_cast<std::vector<WORD>*>(found)->push_back(LOWORD(name));
            return TRUE;
        },
        reinterpret_cast<LONG_PTR>(&numbers));
    return numbers;
}

std::multiset<std::wstring> Placeholders(const std::wstring& text) {
    static const std::wregex placeholder(L"\\{\\{|\\{\\d+\\}");
    return {std::wsregex_token_iterator(text.begin(), text.end(), placeholder), {}};
}

TEST(Languages, HaveEveryTextWithItsPlaceholders) {
    const MessageCatalog english = LoadCatalog(kEnglish);
    ASSERT_EQ(ResourceNumbers(qel_text::kCatalogType).size(), 13U);
    for (const LANGID language : ResourceNumbers(qel_text::kCatalogType)) {
        const MessageCatalog catalog = LoadCatalog(language);
        EXPECT_EQ(catalog.size(), english.size()) << "language " << language;
        for (const auto& [key, text] : catalog) {
            EXPECT_TRUE(english.contains(key)) << "language " << language;
            EXPECT_EQ(Placeholders(text), Placeholders(key)) << "language " << language;
        }
    }
}

// Where a control or a caption shows another text than its template's. Message boxes, menus and the log take
// what room they need.
constexpr int kCaption = 0;
struct Place {
    UINT dialog;
    int control;
    std::vector<std::wstring> keys;
    int width = 0;  // In pixels at 100 %; 0 for that of the control.
};
const Place kPlaces[] = {
    {IDD_SYNC, kCaption, {L"Desktop-Mobile Device Synchronization"}},
    {IDD_SYNC, IDC_SYNC_CANCEL_EXIT, {L"Exit"}},
    {IDD_SYNC,
     IDC_SYNC_STATUS,
     {L"Synchronization in progress...", L"Sychronization cancelled", L"Synchronization complete.",
      L"No mobile device with a job folder was found."}},
    {IDD_ABOUT, IDC_ABOUT_VERSION, {L"Orvanelink, version {1}"}},
    {IDD_TRANSFER,
     IDC_TRANSFER_COPY,
     {L"Copy Selected File(s) from PC to Device", L"Copy Selected File(s) from Device to PC"}},
    {IDD_TRANSFER, IDC_TRANSFER_TABS, {L"PC", L"Mobile Device"}, 200},
    // The columns are 300 and 130 wide; margins and the arrow of a sorted one take 30.
    {IDD_TRANSFER, IDC_TRANSFER_PC_LIST, {L"File Name"}, 270},
    {IDD_TRANSFER, IDC_TRANSFER_PC_LIST, {L"Date"}, 100},
    {IDD_COPY_PROGRESS, kCaption, {L"{{Copying File {1}/{2}  - {3}}"}},
    {IDD_BROWSE, kCaption, {L"Mobile Device Browse"}},
    {IDD_LOAD_PROGRESS, IDC_LOAD_TEXT, {L"Reading from remote device. Please wait..."}},
    {IDD_FILE_PROPERTY, IDC_PROPERTY_TYPE, {L"Folder", L" File"}, 100},
    {IDD_FILE_PROPERTY, IDC_PROPERTY_DATE_LABEL, {L"Created:", L"Modified:"}},
    {IDD_FILE_PROPERTY, IDC_PROPERTY_DATE, {L"Invalid DateTime"}},
    {IDD_FILE_PROPERTY, IDC_PROPERTY_SIZE, {L"{1} bytes"}},
};
// Texts of templates that nobody sees, and the numbers of pictures.
bool IsNoText(const std::wstring& text) {
    static const std::set<std::wstring> unseen = {L"", L"Static", L"Tree2",
                                                  L"Desktop-Mobille Device Synchronization"};
    return unseen.contains(text) || text[0] == L'\xFFFF';
}

// A dialog, not shown, whose font is larger by that percentage: so is all of it then, as on a screen of that
// density.
HWND CreateScaled(UINT id, int percent) {
    HRSRC resource = FindResourceW(nullptr, MAKEINTRESOURCEW(id), RT_DIALOG);
    const auto* bytes = static_cast<const char*>(LockResource(LoadResource(nullptr, resource)));
    std::vector<DWORD> content(SizeofResource(nullptr, resource) / sizeof(DWORD) + 1);
    std::memcpy(content.data(), bytes, SizeofResource(nullptr, resource));
    content[3] &= ~DWORD{WS_VISIBLE};  // The style of an extended template.
    WORD* item = reinterpret_cast<WORD*>(content.data()) + 13;
    for (int name = 0; name < 3; ++name) {  // Menu, class and caption: a number behind 0xFFFF, or a string.
        item += *item == 0xFFFF ? 2 : wcslen(reinterpret_cast<wchar_t*>(item)) + 1;
    }
    *item = static_cast<WORD>(*item * percent / 100);
    return CreateDialogIndirectParamW(nullptr, reinterpret_cast<DLGTEMPLATE*>(content.data()), nullptr,
                                      nullptr, 0);
}

LONG StyleOf(HWND window) {
    return static_cast<LONG>(GetWindowLongPtrW(window, GWL_STYLE));
}

bool IsButton(HWND control) {
    std::array<wchar_t, 20> name{};
    GetClassNameW(control, name.data(), static_cast<int>(name.size()));
    return lstrcmpiW(name.data(), L"Button") == 0;
}

// What a window has for its text.
SIZE RoomOf(HWND window, int percent) {
    RECT client{};
    GetClientRect(window, &client);
    const LONG type = StyleOf(window) & BS_TYPEMASK;
    // Beside the text, in pixels at 100 %: the caption's icon and close box, the corners of a frame, a box to
    // tick and the gap behind it, a button's border and focus frame.
    const int taken = GetParent(window) == nullptr ? 60
                      : !IsButton(window)          ? 0
                      : type == BS_GROUPBOX        ? 18
                      : type == BS_AUTOCHECKBOX    ? 17
                                                   : 6;
    return {client.right - MulDiv(taken, percent, 100), client.bottom};
}

// The place that the text takes in that width. A full-width character is as wide as high, and lines break
// beside it: so is an "M" with a blank, in fonts that this system has.
SIZE Measure(HWND window, const std::wstring& text, int width) {
    static const std::wregex full_width(L"[\u2E80-\uFFEF]");
    const std::wstring narrow = std::regex_replace(text, full_width, L"M ");
    const bool one_line = IsButton(window) || GetParent(window) == nullptr;
    HDC dc = GetDC(window);
    SelectObject(dc, reinterpret_cast<HFONT>(SendMessageW(window, WM_GETFONT, 0, 0)));
    RECT needed{0, 0, width, 0};
    DrawTextW(dc, narrow.c_str(), -1, &needed, DT_CALCRECT | (one_line ? DT_SINGLELINE : DT_WORDBREAK));
    ReleaseDC(window, dc);
    return {needed.right, needed.bottom};
}

// One dialog in one language at one density.
struct Layout {
    const UINT id;
    const LANGID language;
    const int percent;
    const HWND dialog = CreateScaled(id, percent);

    // With that width in pixels, or that of the window's text.
    void CheckText(HWND window, const std::wstring& text, int width = 0) const {
        // What is cut off with an ellipsis is meant to be.
        if (IsNoText(text) || (width == 0 && (StyleOf(window) & SS_ELLIPSISMASK) != 0)) {
            return;
        }
        SIZE room = RoomOf(window, percent);
        room.cx = width != 0 ? width : room.cx;
        const SIZE needed = Measure(window, text, room.cx);
        EXPECT_TRUE(needed.cx <= room.cx && (needed.cy <= room.cy || window == dialog))
            << "dialog " << id << ", language " << language << ", " << percent << " %: \"" << text
            << "\" needs " << needed.cx << "x" << needed.cy << " of " << room.cx << "x" << room.cy;
    }
    void Check() const {
        ASSERT_NE(dialog, nullptr) << id;
        const MessageCatalog catalog = LoadCatalog(language);
        std::vector<HWND> windows = {dialog};
        for (HWND child = GetWindow(dialog, GW_CHILD); child; child = GetWindow(child, GW_HWNDNEXT)) {
            windows.push_back(child);
        }
        for (HWND window : windows) {
            const std::wstring key = orvane::ui::WindowText(window);
            EXPECT_TRUE(IsNoText(key) || catalog.contains(key)) << "\"" << key << "\" of dialog " << id;
        }
        qel_text::SetCatalogLanguage(language);
        XlateWnd(dialog);
        std::set<wint_t> mnemonics;
        for (HWND window : windows) {
            const std::wstring text = orvane::ui::WindowText(window);
            const std::size_t mark = text.find(L'&');
            EXPECT_TRUE(mark == std::wstring::npos || mnemonics.insert(towupper(text[mark + 1])).second)
                << "dialog " << id << ", language " << language << ": \"" << text << "\"";
            if (window == dialog || (StyleOf(window) & WS_VISIBLE) != 0) {
                CheckText(window, text);
            }
        }
        for (const auto& [in, control, keys, width] : kPlaces) {
            for (std::size_t i = 0; in == id && i < keys.size(); ++i) {
                // With long values in its placeholders.
                CheckText(control == kCaption ? dialog : GetDlgItem(dialog, control),
                          qel_text::detail::qel_safefmt_impl(
                              catalog.at(keys[i]), {L"1000000", L"1000000", Xlate(L"From PC to Device")}),
                          MulDiv(width, percent, 100));
            }
        }
        DestroyWindow(dialog);
    }
};

TEST(Languages, HaveRoomForEveryText) {
    orvane::RegisterDialogClass();
    for (const WORD dialog : ResourceNumbers(RT_DIALOG)) {
        for (const LANGID language : ResourceNumbers(qel_text::kCatalogType)) {
            for (const int percent : {100, 150}) {
                Layout{dialog, language, percent}.Check();
            }
        }
    }
    qel_text::SetCatalogLanguage(kEnglish);
}

TEST(Languages, FollowTheSwitchInTheRegistry) {
    const orvane::testing::ScratchRegistry registry;
    const std::pair<const wchar_t*, const wchar_t*> switches[] = {
        {L"de", L"Beenden"}, {L"pt-BR", L"Sair"}, {L"zh-Hans", L"\u9000\u51FA"}, {L"en", L"Exit"}};
    for (const auto& [name, exit] : switches) {
        orvane::RegWriteString(HKEY_CURRENT_USER, L"Software\\Veltrano\\CE Devices", L"Language", name);
        orvane::FollowLanguageSwitch();
        EXPECT_EQ(Xlate(L"Exit"), exit) << name;
    }
}

}  // namespace
