#include "tests/support/message_boxes.h"

#include <array>
#include <utility>

namespace orvane::testing {

namespace {

std::wstring TextOf(HWND window) {
    std::wstring text(static_cast<std::size_t>(GetWindowTextLengthW(window)), L'\0');
    GetWindowTextW(window, text.data(), static_cast<int>(text.size()) + 1);
    return text;
}

std::wstring ClassOf(HWND window) {
    std::array<wchar_t, 64> name{};
    GetClassNameW(window, name.data(), static_cast<int>(name.size()));
    return name.data();
}

// A dialog whose procedure lies in the system's own library is a message box.
bool IsMessageBox(HWND window) {
    const auto procedure = reinterpret_cast<LPCWSTR>(GetWindowLongPtrW(window, DWLP_DLGPROC));
    HMODULE module = nullptr;
    return GetModuleHandleExW(
               GET_MODULE_HANDLE_EX_FLAG_FROM_ADDRESS | GET_MODULE_HANDLE_EX_FLAG_UNCHANGED_REFCOUNT,
               procedure, &module) &&
           module == GetModuleHandleW(L"user32.dll");
}

BOOL CALLBACK FindBox(HWND window, LPARAM found) {
    DWORD process = 0;
    GetWindowThreadProcessId(window, &process);
    if (process != GetCurrentProcessId() || !IsWindowVisible(window) || ClassOf(window) != L"#32770" ||
        !IsMessageBox(window)) {
        return TRUE;
    }
    *reinterpret_cast<HWND*>(found) = window;
    return FALSE;
}

UINT ButtonsOf(HWND box) {
    const bool has_cancel = GetDlgItem(box, IDCANCEL) != nullptr;
    if (GetDlgItem(box, IDYES) != nullptr) {
        return has_cancel ? MB_YESNOCANCEL : MB_YESNO;
    }
    if (GetDlgItem(box, IDRETRY) != nullptr) {
        return has_cancel ? MB_RETRYCANCEL : MB_ABORTRETRYIGNORE;
    }
    // A box with nothing but OK may use Cancel's id for it.
    return GetDlgItem(box, IDOK) != nullptr && has_cancel ? MB_OKCANCEL : MB_OK;
}

UINT StyleOfIcon(HICON icon) {
    const std::array<std::pair<LPCWSTR, UINT>, 4> icons = {{{IDI_ERROR, MB_ICONERROR},
                                                            {IDI_QUESTION, MB_ICONQUESTION},
                                                            {IDI_WARNING, MB_ICONWARNING},
                                                            {IDI_INFORMATION, MB_ICONINFORMATION}}};
    for (const auto& [name, style] : icons) {
        if (icon == LoadIconW(nullptr, name)) {
            return style;
        }
    }
    return 0;
}

bool IsDefault(HWND button) {
    return (GetWindowLongPtrW(button, GWL_STYLE) & BS_TYPEMASK) == BS_DEFPUSHBUTTON;
}

SeenMessageBox Describe(HWND box) {
    SeenMessageBox seen;
    seen.caption = TextOf(box);
    seen.owner = GetWindow(box, GW_OWNER);
    seen.style = ButtonsOf(box);
    if ((GetWindowLongPtrW(box, GWL_EXSTYLE) & WS_EX_TOPMOST) != 0) {
        seen.style |= MB_SYSTEMMODAL;
    }
    UINT button_count = 0;
    for (HWND child = GetWindow(box, GW_CHILD); child != nullptr; child = GetWindow(child, GW_HWNDNEXT)) {
        if (!(GetWindowLongPtrW(child, GWL_STYLE) & WS_VISIBLE)) {
            continue;
        }
        if (ClassOf(child) == L"Button") {
            if (IsDefault(child)) {
                seen.style |= button_count * MB_DEFBUTTON2;
            }
            ++button_count;
        } else if ((GetWindowLongPtrW(child, GWL_STYLE) & SS_TYPEMASK) == SS_ICON) {
            seen.style |= StyleOfIcon(reinterpret_cast<HICON>(SendMessageW(child, STM_GETICON, 0, 0)));
        } else {
            seen.text += TextOf(child);
        }
    }
    return seen;
}

}  // namespace

MessageBoxAnswerer::MessageBoxAnswerer(std::vector<int> answers)
    : answers_(std::move(answers)), thread_([this] { Run(); }) {}

MessageBoxAnswerer::~MessageBoxAnswerer() {
    stop_ = true;
    thread_.join();
}

std::vector<SeenMessageBox> MessageBoxAnswerer::Seen() const {
    const std::lock_guard lock(mutex_);
    return seen_;
}

void MessageBoxAnswerer::Run() {
    while (!stop_) {
        HWND box = nullptr;
        EnumWindows(FindBox, reinterpret_cast<LPARAM>(&box));
        if (box != nullptr) {
            Answer(box);
        }
        Sleep(10);
    }
}

void MessageBoxAnswerer::Answer(HWND box) {
    const SeenMessageBox seen = Describe(box);
    WORD button = LOWORD(SendMessageW(box, DM_GETDEFID, 0, 0));
    {
        const std::lock_guard lock(mutex_);
        if (seen_.size() < answers_.size() && GetDlgItem(box, answers_[seen_.size()]) != nullptr) {
            button = static_cast<WORD>(answers_[seen_.size()]);
        }
        seen_.push_back(seen);
    }
    PostMessageW(box, WM_COMMAND, MAKEWPARAM(button, BN_CLICKED),
                 reinterpret_cast<LPARAM>(GetDlgItem(box, button)));
    // Until the box has taken the answer it would be found again.
    while (IsWindow(box) && IsWindowVisible(box) && !stop_) {
        Sleep(10);
    }
}

}  // namespace orvane::testing
