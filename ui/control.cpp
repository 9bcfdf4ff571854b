#include "ui/control.h"

#include <commctrl.h>

namespace orvane::ui {

namespace {

// One subclass per window: the procedure and this number identify it.
constexpr UINT_PTR kSubclassId = 1;
// The window property that holds the address of the object attached to a window. (The system could tell it
// from the subclass itself, but not every import library has that call.)
constexpr wchar_t kObjectProperty[] = L"orvane.control";

// The control that a notification is about, null for messages that are none.
HWND NotifyingControl(HWND parent, UINT message, LPARAM lparam) {
    switch (message) {
        case WM_NOTIFY:
            return reinterpret_cast<const NMHDR*>(lparam)->hwndFrom;
        case WM_COMMAND:
            return reinterpret_cast<HWND>(lparam);
        case WM_DRAWITEM: {
            const auto* item = reinterpret_cast<const DRAWITEMSTRUCT*>(lparam);
            return item->CtlType == ODT_MENU ? nullptr : item->hwndItem;
        }
        case WM_MEASUREITEM: {
            const auto* item = reinterpret_cast<const MEASUREITEMSTRUCT*>(lparam);
            return item->CtlType == ODT_MENU ? nullptr : GetDlgItem(parent, static_cast<int>(item->CtlID));
        }
        case WM_COMPAREITEM:
            return reinterpret_cast<const COMPAREITEMSTRUCT*>(lparam)->hwndItem;
        case WM_DELETEITEM:
            return reinterpret_cast<const DELETEITEMSTRUCT*>(lparam)->hwndItem;
        default:
            return nullptr;
    }
}

}  // namespace

Control::~Control() {
    Detach();
}

bool Control::Attach(HWND window) {
    Detach();
    if (!SetWindowSubclass(window, Thunk, kSubclassId, reinterpret_cast<DWORD_PTR>(this))) {
        return false;
    }
    window_ = window;
    if (!SetPropW(window, kObjectProperty, this)) {
        Detach();
        return false;
    }
    return true;
}

void Control::Detach() {
    if (window_ != nullptr) {
        RemovePropW(window_, kObjectProperty);
        RemoveWindowSubclass(window_, Thunk, kSubclassId);
        window_ = nullptr;
    }
}

std::optional<LRESULT> Control::OnMessage(UINT /*message*/, WPARAM /*wparam*/, LPARAM /*lparam*/) {
    return std::nullopt;
}

std::optional<LRESULT> Control::OnReflected(UINT /*message*/, WPARAM /*wparam*/, LPARAM /*lparam*/) {
    return std::nullopt;
}

LRESULT Control::Default(UINT message, WPARAM wparam, LPARAM lparam) {
    return DefSubclassProc(window_, message, wparam, lparam);
}

std::optional<LRESULT> Control::Reflect(HWND parent, UINT message, WPARAM wparam, LPARAM lparam) {
    HWND source = NotifyingControl(parent, message, lparam);
    auto* control = source != nullptr ? static_cast<Control*>(GetPropW(source, kObjectProperty)) : nullptr;
    return control != nullptr ? control->OnReflected(message, wparam, lparam) : std::nullopt;
}

std::optional<LRESULT> Control::Dispatch(UINT message, WPARAM wparam, LPARAM lparam) noexcept {
    try {
        if (const auto reflected = Reflect(window_, message, wparam, lparam)) {
            return reflected;
        }
        return OnMessage(message, wparam, lparam);
    } catch (...) {
        // An exception must not unwind through the system's code. Memory is all that can have failed here;
        // default processing keeps the window alive.
        return std::nullopt;
    }
}

LRESULT CALLBACK Control::Thunk(HWND window, UINT message, WPARAM wparam, LPARAM lparam, UINT_PTR /*id*/,
                                DWORD_PTR object) noexcept {
    auto* control = reinterpret_cast<Control*>(object);
    const auto result = control->Dispatch(message, wparam, lparam);
    if (message == WM_NCDESTROY) {
        control->Detach();
    }
    return result ? *result : DefSubclassProc(window, message, wparam, lparam);
}

}  // namespace orvane::ui
