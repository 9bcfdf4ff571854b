// Drives the windows of another program from a script. A window is named by its caption, by the start of it
// and a "*", or by "#ID" if it shows a control of that id; a control by its id. Every command waits up to two
// minutes for what it needs and ends with exit code 1 if that does not come.
//
//   window_driver wait CAPTION               until the window is shown and takes input
//   window_driver gone CAPTION               until there is no such window
//   window_driver rect CAPTION               prints where the window is: WIDTHxHEIGHT+LEFT+TOP
//   window_driver open CAPTION ID OTHER      presses a button and prints where the other window is
//   window_driver click CAPTION ID           presses a button once it takes input, and waits no longer
//   window_driver wait-text CAPTION ID TEXT  until the control's text is TEXT
//   window_driver wait-disabled CAPTION ID   until the control takes no input
//   window_driver list CAPTION ID            prints the lines of a list box, in UTF-8
//   window_driver tab CAPTION ID INDEX       turns to a page of a tab control
//   window_driver command CAPTION ID NUMBER  sends the control a menu command; ID 0: the window one of its
//                                            system menu
//
// The windows are looked for on the desktop that the environment variable WINDOW_DESKTOP names, by default
// on that of the driver itself. Captions and texts are those in English; WINDOW_LANGUAGE ("de", "pt-BR")
// names the language that the program shows them in.

#include <windows.h>

#include <commctrl.h>

#include <cstdio>
#include <cstdlib>
#include <functional>
#include <iterator>
#include <string>

#include "qelutils/message_catalog.h"

namespace {

constexpr ULONGLONG kPatienceMs = 120'000;
constexpr DWORD kPollMs = 50;

bool WaitUntil(const std::function<bool()>& condition) {
    const ULONGLONG end = GetTickCount64() + kPatienceMs;
    while (!condition()) {
        if (GetTickCount64() >= end) {
            return false;
        }
        Sleep(kPollMs);
    }
    return true;
}

std::wstring TextOf(HWND window) {
    std::wstring text(1024, L'\0');
    const LRESULT length =
        SendMessageW(window, WM_GETTEXT, text.size(), reinterpret_cast<LPARAM>(text.data()));
    text.resize(static_cast<std::size_t>(length));
    return text;
}

std::wstring Variable(const wchar_t* name) {
    wchar_t value[64] = {};
    GetEnvironmentVariableW(name, value, static_cast<DWORD>(std::size(value)));
    return value;
}

// What the program shows for that English text.
std::wstring InItsLanguage(const std::wstring& english) {
    static const auto catalog = qel_text::LoadCatalog(
        LANGIDFROMLCID(LocaleNameToLCID(Variable(L"WINDOW_LANGUAGE").c_str(), LOCALE_ALLOW_NEUTRAL_NAMES)));
    const auto found = catalog.find(english);
    return found != catalog.end() ? found->second : english;
}

bool HasCaption(HWND window, const std::wstring& caption) {
    if (caption.starts_with(L'#')) {
        HWND control = GetDlgItem(window, static_cast<int>(std::wcstol(caption.c_str() + 1, nullptr, 10)));
        return control != nullptr && IsWindowVisible(control);
    }
    const std::wstring text = TextOf(window);
    return caption.ends_with(L'*') ? text.starts_with(caption.substr(0, caption.size() - 1))
                                   : text == caption;
}

// The shown window of that caption that takes input, null if there is none.
HWND FindDialog(const std::wstring& caption) {
    struct Search {
        const std::wstring& caption;
        HWND found;
    } search{caption, nullptr};
    EnumWindows(
        [](HWND window, LPARAM parameter) -> BOOL {
            auto& wanted = *reinterpret_cast<Search*>(parameter);
            if (IsWindowVisible(window) && IsWindowEnabled(window) && HasCaption(window, wanted.caption)) {
                wanted.found = window;
                return FALSE;
            }
            return TRUE;
        },
        reinterpret_cast<LPARAM>(&search));
    return search.found;
}

void PrintLine(const std::wstring& line) {
    std::string utf8(line.size() * 3, '\0');
    const int length = WideCharToMultiByte(CP_UTF8, 0, line.data(), static_cast<int>(line.size()),
                                           utf8.data(), static_cast<int>(utf8.size()), nullptr, nullptr);
    utf8.resize(static_cast<std::size_t>(length));
    std::puts(utf8.c_str());
}

void PrintList(HWND list) {
    const LRESULT count = SendMessageW(list, LB_GETCOUNT, 0, 0);
    for (LRESULT line = 0; line < count; ++line) {
        const LRESULT length = SendMessageW(list, LB_GETTEXTLEN, static_cast<WPARAM>(line), 0);
        std::wstring text(static_cast<std::size_t>(length) + 1, L'\0');
        SendMessageW(list, LB_GETTEXT, static_cast<WPARAM>(line), reinterpret_cast<LPARAM>(text.data()));
        text.resize(static_cast<std::size_t>(length));
        PrintLine(text);
    }
}

bool RunOnControl(const std::wstring& verb, HWND dialog, int id, const std::wstring& text) {
    const auto number = static_cast<WPARAM>(std::wcstol(text.c_str(), nullptr, 10));
    if (verb == L"command" && id == 0) {
        return PostMessageW(dialog, WM_SYSCOMMAND, number, 0) != FALSE;
    }
    HWND control = GetDlgItem(dialog, id);
    if (control == nullptr) {
        return false;
    }
    if (verb == L"click") {
        return WaitUntil([&] { return IsWindowEnabled(control) != FALSE; }) &&
               PostMessageW(control, BM_CLICK, 0, 0) != FALSE;
    }
    if (verb == L"wait-text") {
        return WaitUntil([&] { return TextOf(control) == text; });
    }
    if (verb == L"wait-disabled") {
        return WaitUntil([&] { return !IsWindowEnabled(control); });
    }
    if (verb == L"tab") {
        return PostMessageW(control, TCM_SETCURFOCUS, number, 0) != FALSE;
    }
    if (verb == L"command") {
        return PostMessageW(control, WM_COMMAND, number, 0) != FALSE;
    }
    if (verb == L"list") {
        PrintList(control);
        return true;
    }
    return false;
}

HWND AwaitDialog(const std::wstring& caption) {
    HWND dialog = nullptr;
    WaitUntil([&] { return (dialog = FindDialog(caption)) != nullptr; });
    return dialog;
}

bool PrintPlace(HWND dialog) {
    RECT place{};
    if (!GetWindowRect(dialog, &place)) {
        return false;
    }
    std::printf("%ldx%ld+%ld+%ld\n", place.right - place.left, place.bottom - place.top, place.left,
                place.top);
    return true;
}

bool Run(const std::wstring& verb, const std::wstring& caption, int id, const std::wstring& text) {
    if (verb == L"gone") {
        return WaitUntil([&] { return FindDialog(caption) == nullptr; });
    }
    HWND dialog = AwaitDialog(caption);
    if (dialog == nullptr || verb == L"wait") {
        return dialog != nullptr;
    }
    if (verb == L"rect") {
        return PrintPlace(dialog);
    }
    if (verb == L"open") {
        return RunOnControl(L"click", dialog, id, L"") && PrintPlace(AwaitDialog(text));
    }
    return RunOnControl(verb, dialog, id, text);
}

// Windows of another desktop are out of reach. Wine's virtual desktops are desktops of their own.
bool MoveToDesktop() {
    const std::wstring name = Variable(L"WINDOW_DESKTOP");
    if (name.empty()) {
        return true;
    }
    // It may not have been made yet. The handle is needed as long as the driver runs.
    return WaitUntil([&] {
        HDESK desktop = OpenDesktopW(name.c_str(), 0, FALSE, GENERIC_ALL);
        return desktop != nullptr && SetThreadDesktop(desktop);
    });
}

}  // namespace

int wmain(int argc, wchar_t** argv) {
    if (argc < 3) {
        std::fputs("window_driver VERB CAPTION [ID [TEXT]]\n", stderr);
        return 2;
    }
    const int id = argc > 3 ? static_cast<int>(std::wcstol(argv[3], nullptr, 10)) : 0;
    const std::wstring text = argc > 4 ? argv[4] : L"";
    return MoveToDesktop() && Run(argv[1], InItsLanguage(argv[2]), id, InItsLanguage(text)) ? 0 : 1;
}
