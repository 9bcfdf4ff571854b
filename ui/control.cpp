#include "ui/control.h"

#include <commctrl.h>

namespace orvane::ui {

namespace {

// One subclass per window: the procedure and this number identify it.
constexpr UINT_PTR kSubclassId = 1;

// The objects that are attached to windows of this thread, a handful at most, each leading to the next. (The
// system could tell them from the subclass, but not every import library has that call, and lists notify too
// often for a question to the system.) A plain pointer: an object with a destructor may lose its memory
// before that runs, when a thread other than the first one ends.
thread_local Control* first_attached = nullptr;

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
    class_procedure_ = reinterpret_cast<WNDPROC>(GetClassLongPtrW(window, GCLP_WNDPROC));
    next_attached_ = first_attached;
    first_attached = this;
    return true;
}

void Control::Detach() {
    if (window_ != nullptr) {
        Control** link = &first_attached;
        while (*link != nullptr && *link != this) {
            link = &(*link)->next_attached_;
        }
        if (*link == this) {
            *link = next_attached_;
        }
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
    Control* control = source != nullptr ? first_attached : nullptr;
    while (control != nullptr && control->window_ != source) {
        control = control->next_attached_;
    }
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
