// A tab control whose pages are controls of the dialog around it.
#pragma once

#include <windows.h>

#include <unordered_map>
#include <vector>

#include "controls/minimal_standard_hash.h"
#include "ui/control.h"

namespace orvane {

// Posted to the notify window when the user switched the page: wParam the tab control's id, lParam the new
// page.
inline constexpr UINT kTabPageChanged = WM_USER + 997;

// Shows the controls attached to the selected tab and hides those of the page shown before; a control may be
// on several pages. Enables and disables the controls of all pages together with itself. It owns no
// controls. In use: insert the tabs, attach the controls, then select the first tab with SetCurSel. The
// window's thread only; the parent must pass its notifications through ui::Control::Reflect.
class CSTabCtrl : public ui::Control {
  public:
    // The controls of one page in the order in which they were attached.
    using CSTabPage = std::vector<HWND>;
    using CPageToControlsMap = std::unordered_map<int, CSTabPage, MinimalStandardHash>;

    bool Attach(HWND tab_control);

    // Adds the control to the page and hides it, whatever page is shown: it appears when its page is next
    // selected. False, and nothing done, when there is no such tab.
    virtual bool AttachControlToTab(HWND control, int tab);
    // Selects the tab and shows its page without telling the notify window. Returns the tab that was
    // selected, -1 for none.
    virtual int SetCurSel(int tab);

    void SetNotifyWindow(HWND window) { notify_window_ = window; }
    // ShowWindow or EnableWindow on every control of a page; false when the tab has no page.
    bool ShowTabControls(int tab, int show_command);
    bool EnableTabControls(int tab, bool enable);

  protected:
    std::optional<LRESULT> OnMessage(UINT message, WPARAM wparam, LPARAM lparam) override;
    std::optional<LRESULT> OnReflected(UINT message, WPARAM wparam, LPARAM lparam) override;

  private:
    int TabCount() const;
    int SwitchToSelection();

    HWND notify_window_ = nullptr;
    // The page last shown; not adjusted when tabs are inserted or removed.
    int current_page_ = -1;
    CPageToControlsMap pages_{kHashBuckets};
};

}  // namespace orvane
