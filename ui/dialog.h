// Dialogs on templates.
#pragma once

#include <windows.h>

#include <atomic>
#include <optional>

#include "ui/data_exchange.h"

namespace orvane::ui {

// A modal or modeless dialog on a template of the program's resources. The object must outlive the window;
// a modeless window is destroyed with the object. Window and object belong to the thread that calls DoModal
// or Create.
class Dialog {
  public:
    explicit Dialog(UINT template_id, HWND parent = nullptr) : template_id_(template_id), parent_(parent) {}
    virtual ~Dialog();
    Dialog(const Dialog&) = delete;
    Dialog& operator=(const Dialog&) = delete;

    // Runs the dialog until it ends; the value given to End, or -1 when the window cannot be created.
    INT_PTR DoModal();
    // Creates the modeless window; false when that fails.
    bool Create();
    void Destroy();
    // The window, null before it exists and from its WM_NCDESTROY on. Other threads may ask.
    HWND Handle() const { return window_; }

    // Runs DoDataExchange: controls to members (`save` true) or members to controls.
    void UpdateData(bool save);

  protected:
    HWND Parent() const { return parent_; }
    HWND Item(int id) const { return GetDlgItem(window_, id); }
    void End(INT_PTR result) { EndDialog(window_, result); }

    // WM_INITDIALOG. True lets the system set the focus to the first control. The base writes the members
    // to the controls.
    virtual bool OnInitDialog();
    // OK and Cancel, from their buttons, Enter and Escape. The base of OnOK takes the control values and ends
    // with IDOK, that of OnCancel ends with IDCANCEL.
    virtual void OnOK();
    virtual void OnCancel();
    // A command from a control, a menu or an accelerator; false means default processing.
    virtual bool OnCommand(int id, UINT code);
    // Any other message. No value means default processing.
    virtual std::optional<LRESULT> OnMessage(UINT message, WPARAM wparam, LPARAM lparam);
    virtual void DoDataExchange(DataExchange& exchange);

  private:
    static INT_PTR CALLBACK Thunk(HWND window, UINT message, WPARAM wparam, LPARAM lparam) noexcept;
    std::optional<LRESULT> Dispatch(UINT message, WPARAM wparam, LPARAM lparam) noexcept;
    std::optional<LRESULT> DispatchCommand(int id, UINT code);

    UINT template_id_;
    HWND parent_;
    std::atomic<HWND> window_ = nullptr;
};

}  // namespace orvane::ui
