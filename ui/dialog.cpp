#include "ui/dialog.h"

#include <utility>

#include "platform/resources.h"
#include "qelutils/xlate.h"
#include "res/ids.h"
#include "ui/control.h"
#include "ui/waiting.h"

namespace orvane::ui {

namespace {

// The messages whose result a dialog procedure returns itself instead of leaving it in DWLP_MSGRESULT.
bool ReturnsResultDirectly(UINT message) {
    switch (message) {
        case WM_CTLCOLORMSGBOX:
        case WM_CTLCOLOREDIT:
        case WM_CTLCOLORLISTBOX:
        case WM_CTLCOLORBTN:
        case WM_CTLCOLORDLG:
        case WM_CTLCOLORSCROLLBAR:
        case WM_CTLCOLORSTATIC:
        case WM_INITDIALOG:
        case WM_COMPAREITEM:
        case WM_VKEYTOITEM:
        case WM_CHARTOITEM:
        case WM_QUERYDRAGICON:
            return true;
        default:
            return false;
    }
}

}  // namespace

void DataExchange::Text(int id, std::wstring& value) const {
    if (save_) {
        value = WindowText(GetDlgItem(dialog_, id));
    } else {
        SetDlgItemTextW(dialog_, id, value.c_str());
    }
}

void DataExchange::Check(int id, bool& value) const {
    if (save_) {
        value = IsDlgButtonChecked(dialog_, id) == BST_CHECKED;
    } else {
        CheckDlgButton(dialog_, id, value ? BST_CHECKED : BST_UNCHECKED);
    }
}

std::wstring WindowText(HWND window) {
    std::wstring text(static_cast<std::size_t>(GetWindowTextLengthW(window)), L'\0');
    if (!text.empty()) {
        // The length may shrink between the two calls.
        const int length = GetWindowTextW(window, text.data(), static_cast<int>(text.size()) + 1);
        text.resize(static_cast<std::size_t>(length));
    }
    return text;
}

int ShowMessageBox(HWND about, const std::wstring& text, UINT style, const std::wstring& caption) {
    const std::wstring title = caption.empty() ? ResourceString(IDS_APPLICATION_NAME) : caption;
    HWND owner = about != nullptr ? GetLastActivePopup(GetAncestor(about, GA_ROOT)) : nullptr;
    return MessageBoxW(owner, text.c_str(), title.c_str(), style);
}

Dialog::~Dialog() {
    Destroy();
}

// The system's loop of a modal dialog offers each message to the thread's hook first; dialogs above this one
// share it.
INT_PTR Dialog::DoModal() {
    thread_local HHOOK key_hook = nullptr;
    const bool is_first = key_hook == nullptr;
    if (is_first) {
        key_hook = SetWindowsHookExW(WH_MSGFILTER, KeyHook, nullptr, GetCurrentThreadId());
    }
    const INT_PTR result = DialogBoxParamW(ResourceModule(), MAKEINTRESOURCEW(template_id_), parent_, Thunk,
                                           reinterpret_cast<LPARAM>(this));
    if (is_first) {
        UnhookWindowsHookEx(std::exchange(key_hook, nullptr));
    }
    return result;
}

LRESULT CALLBACK Dialog::KeyHook(int code, WPARAM wparam, LPARAM lparam) noexcept {
    const MSG& message = *reinterpret_cast<const MSG*>(lparam);
    if (code == MSGF_DIALOGBOX && message.message == WM_KEYDOWN) {
        HWND root = GetAncestor(message.hwnd, GA_ROOT);
        auto* dialog = reinterpret_cast<Dialog*>(GetWindowLongPtrW(root, DWLP_USER));
        // A message box is a dialog, too, but none of this layer.
        const bool is_ours =
            GetWindowLongPtrW(root, DWLP_DLGPROC) == reinterpret_cast<LONG_PTR>(Dialog::Thunk);
        if (is_ours && dialog != nullptr && dialog->DispatchKey(static_cast<UINT>(message.wParam))) {
            return TRUE;
        }
    }
    return CallNextHookEx(nullptr, code, wparam, lparam);
}

bool Dialog::DispatchKey(UINT key) noexcept {
    try {
        return OnKey(key);
    } catch (...) {
        return true;  // As in Dispatch.
    }
}

bool Dialog::Create() {
    return CreateDialogParamW(ResourceModule(), MAKEINTRESOURCEW(template_id_), parent_, Thunk,
                              reinterpret_cast<LPARAM>(this)) != nullptr;
}

void Dialog::Destroy() {
    if (window_ != nullptr) {
        DestroyWindow(window_);
    }
}

void Dialog::ShowPainted() {
    ShowWindow(window_, SW_SHOW);
    RedrawWindow(window_, nullptr, nullptr, RDW_INVALIDATE | RDW_ERASE | RDW_UPDATENOW | RDW_ALLCHILDREN);
}

void Dialog::UpdateData(bool save) {
    DataExchange exchange(window_, save);
    DoDataExchange(exchange);
}

void Dialog::OnOK() {
    UpdateData(true);
    End(IDOK);
}

void Dialog::OnCancel() {
    End(IDCANCEL);
}

bool Dialog::Initialise() {
    UpdateData(false);
    XlateWnd(window_);
    return OnInitDialog();
}

bool Dialog::HandleClick(int id) {
    if (OnClicked(id)) {
        return true;
    }
    if (id == IDOK) {
        OnOK();
    } else if (id == IDCANCEL) {
        OnCancel();
    }
    return id == IDOK || id == IDCANCEL;
}

std::optional<LRESULT> Dialog::HandleMessage(UINT message, WPARAM wparam, LPARAM lparam) {
    if (message == WM_INITDIALOG) {
        return Initialise() ? TRUE : FALSE;
    }
    if (const auto reflected = Control::Reflect(window_, message, wparam, lparam)) {
        return reflected;
    }
    if (message == WM_COMMAND && HIWORD(wparam) == BN_CLICKED && HandleClick(LOWORD(wparam))) {
        return 0;
    }
    if (message == WM_SETCURSOR && LOWORD(lparam) == HTCLIENT && WaitCursor::IsShown()) {
        SetCursor(LoadCursorW(nullptr, IDC_WAIT));
        return TRUE;
    }
    return OnMessage(message, wparam, lparam);
}

std::optional<LRESULT> Dialog::Dispatch(UINT message, WPARAM wparam, LPARAM lparam) noexcept {
    try {
        return HandleMessage(message, wparam, lparam);
    } catch (...) {
        // An exception must not unwind through the system's code. Memory is all that can have failed here;
        // default processing keeps the window alive.
        return std::nullopt;
    }
}

INT_PTR CALLBACK Dialog::Thunk(HWND window, UINT message, WPARAM wparam, LPARAM lparam) noexcept {
    if (message == WM_INITDIALOG) {
        SetWindowLongPtrW(window, DWLP_USER, lparam);
        reinterpret_cast<Dialog*>(lparam)->window_ = window;
    }
    auto* dialog = reinterpret_cast<Dialog*>(GetWindowLongPtrW(window, DWLP_USER));
    if (dialog == nullptr) {
        return FALSE;
    }
    const auto result = dialog->Dispatch(message, wparam, lparam);
    if (message == WM_NCDESTROY) {
        SetWindowLongPtrW(window, DWLP_USER, 0);
        dialog->window_ = nullptr;
    }
    if (!result) {
        return FALSE;
    }
    if (ReturnsResultDirectly(message)) {
        return static_cast<INT_PTR>(*result);
    }
    SetWindowLongPtrW(window, DWLP_MSGRESULT, *result);
    return TRUE;
}

}  // namespace orvane::ui
