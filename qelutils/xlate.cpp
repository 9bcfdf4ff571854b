#include "qelutils/xlate.h"

#include <array>
#include <atomic>

#include "qelutils/message_catalog.h"

namespace {

using qel_text::MessageCatalog;

// The catalog in use. A catalog is never changed once it is here and never freed: a worker may be in the
// midst of a look-up when the language changes or the process ends.
std::atomic<const MessageCatalog*>& CurrentCatalog() {
    static std::atomic<const MessageCatalog*> catalog =
        new MessageCatalog(qel_text::LoadCatalog(GetUserDefaultUILanguage()));
    return catalog;
}

const std::wstring* FindTranslation(std::wstring_view key) {
    const MessageCatalog& catalog = *CurrentCatalog().load();
    const auto found = catalog.find(key);
    return found != catalog.end() ? &found->second : nullptr;
}

bool HoldsUserText(HWND window) {
    std::array<wchar_t, 256> name{};  // Longer class names do not exist.
    GetClassNameW(window, name.data(), static_cast<int>(name.size()));
    for (const wchar_t* type : {L"Edit", L"ListBox", L"ComboBox", L"ComboBoxEx32"}) {
        if (lstrcmpiW(name.data(), type) == 0) {
            return true;
        }
    }
    return false;
}

void TranslateText(HWND window) {
    std::wstring text(static_cast<size_t>(GetWindowTextLengthW(window)), L'\0');
    text.resize(static_cast<size_t>(GetWindowTextW(window, text.data(), static_cast<int>(text.size() + 1))));
    if (const std::wstring* translation = FindTranslation(text)) {
        SetWindowTextW(window, translation->c_str());
    }
}

BOOL CALLBACK TranslateChild(HWND child, LPARAM /*unused*/) noexcept {
    if (!HoldsUserText(child)) {
        TranslateText(child);
    }
    return TRUE;
}

void TranslateItem(HMENU menu, UINT position) {
    MENUITEMINFOW item{};
    item.cbSize = sizeof(item);
    item.fMask = MIIM_STRING | MIIM_SUBMENU;
    if (!GetMenuItemInfoW(menu, position, TRUE, &item)) {
        return;
    }
    if (item.hSubMenu != nullptr) {
        XlateMenu(item.hSubMenu);
    }
    std::wstring text(item.cch, L'\0');
    item.fMask = MIIM_STRING;
    item.dwTypeData = text.data();
    item.cch = static_cast<UINT>(text.size() + 1);
    if (text.empty() || !GetMenuItemInfoW(menu, position, TRUE, &item)) {
        return;
    }
    if (const std::wstring* translation = FindTranslation(text)) {
        std::wstring replacement = *translation;  // The structure wants writable memory.
        item.dwTypeData = replacement.data();
        SetMenuItemInfoW(menu, position, TRUE, &item);
    }
}

}  // namespace

std::wstring Xlate(qel_text::TextKey key) {
    const std::wstring* translation = FindTranslation(key.English());
    return translation != nullptr ? *translation : std::wstring(key.English());
}

void XlateWnd(HWND window) {
    if (window == nullptr) {
        return;  // Its "children" would be the top-level windows of all programs.
    }
    TranslateText(window);
    EnumChildWindows(window, TranslateChild, 0);
}

void XlateMenu(HMENU menu) {
    const int count = GetMenuItemCount(menu);  // -1 without a menu
    for (int position = 0; position < count; ++position) {
        TranslateItem(menu, static_cast<UINT>(position));
    }
}

namespace qel_text {

void SetCatalogLanguage(LANGID language) {
    CurrentCatalog() = new MessageCatalog(LoadCatalog(language));
}

}  // namespace qel_text
