#include "ui/dialog.h"

#include "platform/resources.h"
#include "ui/control.h"

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

Dialog::~Dialog() {
    Destroy();
}

INT_PTR Dialog::DoModal() {
    return DialogBoxParamW(ResourceModule(), MAKEINTRESOURCEW(template_id_), parent_, Thunk,
                           reinterpret_cast<LPARAM>(this));
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

void Dialog::UpdateData(bool save) {
    DataExchange exchange(window_, save);
    DoDataExchange(exchange);
}

bool Dialog::OnInitDialog() {
    UpdateData(false);
    return true;
}

void Dialog::OnOK() {
    UpdateData(true);
    End(IDOK);
}

void Dialog::OnCancel() {
    End(IDCANCEL);
}

bool Dialog::OnCommand(int /*id*/, UINT /*code*/) {
    return false;
}

std::optional<LRESULT> Dialog::OnMessage(UINT /*message*/, WPARAM /*wparam*/, LPARAM /*lparam*/) {
    return std::nullopt;
}

void Dialog::DoDataExchange(DataExchange& /*exchange*/) {}

std::optional<LRESULT> Dialog::DispatchCommand(int id, UINT code) {
    if (OnCommand(id, code)) {
        return 0;
    }
    if (code == BN_CLICKED && id == IDOK) {
        OnOK();
        return 0;
    }
    if (code == BN_CLICKED && id == IDCANCEL) {
        OnCancel();
        return 0;
    }
    return std::nullopt;
}

std::optional<LRESULT> Dialog::Dispatch(UINT message, WPARAM wparam, LPARAM lparam) noexcept {
    try {
        if (message == WM_INITDIALOG) {
            return OnInitDialog() ? TRUE : FALSE;
        }
        if (const auto reflected = Control::Reflect(window_, message, wparam, lparam)) {
            return reflected;
        }
        if (message == WM_COMMAND) {
            return DispatchCommand(LOWORD(wparam), HIWORD(wparam));
        }
        return OnMessage(message, wparam, lparam);
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
