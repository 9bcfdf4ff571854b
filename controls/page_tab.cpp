#include "controls/page_tab.h"

#include <commctrl.h>

namespace orvane {

bool CSTabCtrl::Attach(HWND tab_control) {
    current_page_ = -1;
    return ui::Control::Attach(tab_control);
}

bool CSTabCtrl::AttachControlToTab(HWND control, int tab) {
    if (tab < 0 || tab >= TabCount()) {
        return false;
    }
    pages_[tab].push_back(control);
    ShowWindow(control, SW_HIDE);
    return true;
}

int CSTabCtrl::SetCurSel(int tab) {
    const auto previous = SendMessageW(Handle(), TCM_SETCURSEL, static_cast<WPARAM>(tab), 0);
    SwitchToSelection();
    return static_cast<int>(previous);
}

bool CSTabCtrl::ShowTabControls(int tab, int show_command) {
    const auto page = pages_.find(tab);
    if (page == pages_.end()) {
        return false;
    }
    for (HWND control : page->second) {
        ShowWindow(control, show_command);
    }
    return true;
}

bool CSTabCtrl::EnableTabControls(int tab, bool enable) {
    const auto page = pages_.find(tab);
    if (page == pages_.end()) {
        return false;
    }
    for (HWND control : page->second) {
        EnableWindow(control, enable);
    }
    return true;
}

std::optional<LRESULT> CSTabCtrl::OnMessage(UINT message, WPARAM wparam, LPARAM lparam) {
    switch (message) {
        case WM_ENABLE: {
            const LRESULT result = Default(message, wparam, lparam);
            for (int tab = 0; tab < TabCount(); ++tab) {
                EnableTabControls(tab, wparam != FALSE);
            }
            return result;
        }
        case WM_DESTROY: {
            const LRESULT result = Default(message, wparam, lparam);
            pages_.clear();
            return result;
        }
        default:
            return std::nullopt;
    }
}

std::optional<LRESULT> CSTabCtrl::OnReflected(UINT message, WPARAM /*wparam*/, LPARAM lparam) {
    if (message != WM_NOTIFY || reinterpret_cast<const NMHDR*>(lparam)->code != TCN_SELCHANGE) {
        return std::nullopt;
    }
    const int page = SwitchToSelection();
    // What is reflected here always names this window as its source.
    if (notify_window_ != nullptr) {
        PostMessageW(notify_window_, kTabPageChanged, reinterpret_cast<const NMHDR*>(lparam)->idFrom, page);
    }
    return 0;
}

int CSTabCtrl::TabCount() const {
    return static_cast<int>(SendMessageW(Handle(), TCM_GETITEMCOUNT, 0, 0));
}

// Hides the page shown before first: a control that is on both pages must end up visible.
int CSTabCtrl::SwitchToSelection() {
    const int page = static_cast<int>(SendMessageW(Handle(), TCM_GETCURSEL, 0, 0));
    ShowTabControls(current_page_, SW_HIDE);
    ShowTabControls(page, SW_SHOW);
    current_page_ = page;
    return page;
}

}  // namespace orvane
