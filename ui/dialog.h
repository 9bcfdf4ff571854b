// Dialogs on templates, the exchange of their controls' data, and message boxes.
#pragma once

#include <windows.h>

#include <atomic>
#include <optional>
#include <string>

namespace orvane::ui {

// The exchange between a dialog's controls and its members, one description for both directions.
class DataExchange {
  public:
    // `save` true: the controls' data go into the members; false: the members are shown in the controls.
    DataExchange(HWND dialog, bool save) : dialog_(dialog), save_(save) {}

    void Text(int id, std::wstring& value) const;
    // A check box; true for ticked.
    void Check(int id, bool& value) const;

  private:
    HWND dialog_;
    bool save_;
};

// The whole text of a window, however long.
std::wstring WindowText(HWND window);

// Shows a message box of the given MB_ style and returns the chosen button's id (0 if it cannot be shown).
// An empty caption means the application's name. `about` is the window that the box is about, a dialog or one
// of its controls: the owner is what stands on top of that dialog, a box that is up already for instance, so
// that this one is answered first. Null for a box of its own.
int ShowMessageBox(HWND about, const std::wstring& text, UINT style = MB_OK,
                   const std::wstring& caption = {});

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
    // Shows the window and paints all of it before it returns, for what keeps the thread busy afterwards.
    void ShowPainted();
    // The window, null before it exists and from its WM_NCDESTROY on. Other threads may ask.
    HWND Handle() const { return window_; }

    // Runs DoDataExchange: controls to members (`save` true) or members to controls.
    void UpdateData(bool save);

  protected:
    HWND Parent() const { return parent_; }
    HWND Item(int id) const { return GetDlgItem(window_, id); }
    void End(INT_PTR result) { EndDialog(window_, result); }

    // WM_INITDIALOG, after the members were shown in the controls and the window was translated. True lets
    // the system set the focus to the first control.
    virtual bool OnInitDialog() { return true; }
    // OK and Cancel, from their buttons, Enter and Escape. The base of OnOK takes the control values and ends
    // with IDOK, that of OnCancel ends with IDCANCEL.
    virtual void OnOK();
    virtual void OnCancel();
    // A key pressed anywhere in the dialog, before the control with the focus gets it. True: it is used up.
    virtual bool OnKey(UINT /*key*/) { return false; }
    // A click on a button. False: it is none of the dialog's own; OK and Cancel get their handlers then.
    virtual bool OnClicked(int /*id*/) { return false; }
    // Any other message, other commands included. No value means default processing, which is all that the
    // base does.
    virtual std::optional<LRESULT> OnMessage(UINT /*message*/, WPARAM /*wparam*/, LPARAM /*lparam*/) {
        return std::nullopt;
    }
    virtual void DoDataExchange(DataExchange& /*exchange*/) {}

  private:
    static INT_PTR CALLBACK Thunk(HWND window, UINT message, WPARAM wparam, LPARAM lparam) noexcept;
    std::optional<LRESULT> Dispatch(UINT message, WPARAM wparam, LPARAM lparam) noexcept;
    std::optional<LRESULT> HandleMessage(UINT message, WPARAM wparam, LPARAM lparam);
    static LRESULT CALLBACK KeyHook(int code, WPARAM wparam, LPARAM lparam) noexcept;
    bool DispatchKey(UINT key) noexcept;
    bool Initialise();
    bool HandleClick(int id);

    UINT template_id_;
    HWND parent_;
    std::atomic<HWND> window_ = nullptr;
};

}  // namespace orvane::ui
