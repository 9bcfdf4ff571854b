// Subclassed controls, and the reflection that hands a control the notifications its parent receives.
#pragma once

#include <windows.h>

#include <optional>

namespace orvane::ui {

// A control whose messages the program handles itself. The object attaches to an existing window and must
// outlive it or detach before; it does not own the window. Used on the window's thread only.
class Control {
  public:
    Control() = default;
    virtual ~Control();
    Control(const Control&) = delete;
    Control& operator=(const Control&) = delete;

    // Subclasses the window; false when there is no such window or it cannot be subclassed.
    bool Attach(HWND window);
    void Detach();
    // The window, null before Attach and from its WM_NCDESTROY on.
    HWND Handle() const { return window_; }

    // If the notification comes from a control that is subclassed by this layer and handles it there, the
    // result of the handler; else no value. Called first by dialogs and controls for what they receive.
    static std::optional<LRESULT> Reflect(HWND parent, UINT message, WPARAM wparam, LPARAM lparam);

  protected:
    // A message to the control. No value means default processing.
    virtual std::optional<LRESULT> OnMessage(UINT message, WPARAM wparam, LPARAM lparam);
    // A notification about the control that its parent received (WM_NOTIFY, WM_COMMAND, WM_DRAWITEM,
    // WM_MEASUREITEM, WM_COMPAREITEM, WM_DELETEITEM). No value means that the parent handles it.
    virtual std::optional<LRESULT> OnReflected(UINT message, WPARAM wparam, LPARAM lparam);
    // What the control would do without this layer.
    LRESULT Default(UINT message, WPARAM wparam, LPARAM lparam);
    // Asks the control itself, past every subclass. For loops over thousands of items and for drawing: the
    // way through a subclass costs many times what the control needs for its answer. 0 without a window.
    LRESULT Direct(UINT message, WPARAM wparam, LPARAM lparam) const {
        return window_ != nullptr ? CallWindowProcW(class_procedure_, window_, message, wparam, lparam) : 0;
    }

  private:
    static LRESULT CALLBACK Thunk(HWND window, UINT message, WPARAM wparam, LPARAM lparam, UINT_PTR id,
                                  DWORD_PTR object) noexcept;
    std::optional<LRESULT> Dispatch(UINT message, WPARAM wparam, LPARAM lparam) noexcept;

    HWND window_ = nullptr;
    WNDPROC class_procedure_ = nullptr;
    // The next in the list of the controls that are attached on this thread.
    Control* next_attached_ = nullptr;
};

}  // namespace orvane::ui
