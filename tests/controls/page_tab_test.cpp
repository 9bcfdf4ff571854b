#include "controls/page_tab.h"

#include <gmock/gmock.h>
#include <gtest/gtest.h>

#include "tests/controls/list_window.h"

namespace orvane::testing {
namespace {

using ::testing::ElementsAre;
using ::testing::IsEmpty;

constexpr int kTabId = 1046;

// Two tabs; a control of each page and one that is on both.
struct TabWindow : ParentWindow {
    TabWindow() {
        tabs.Attach(AddControl(WC_TABCONTROLW, 0, kTabId, {0, 0, 400, 30}));
        for (int tab = 0; tab < 2; ++tab) {
            TCITEMW item{};
            SendMessageW(tabs.Handle(), TCM_INSERTITEMW, 0, reinterpret_cast<LPARAM>(&item));
        }
        tabs.SetNotifyWindow(Handle());
        EXPECT_FALSE(tabs.AttachControlToTab(first, 2));
        EXPECT_TRUE(IsWindowVisible(first));
        EXPECT_TRUE(tabs.AttachControlToTab(second, 1));
        EXPECT_TRUE(tabs.AttachControlToTab(both, 1));
        EXPECT_TRUE(tabs.AttachControlToTab(first, 0));
        EXPECT_TRUE(tabs.AttachControlToTab(both, 0));
    }

    std::vector<bool> Visible() const {
        return {IsWindowVisible(first) != 0, IsWindowVisible(second) != 0, IsWindowVisible(both) != 0};
    }

    HWND first = AddControl(L"BUTTON", 0, 1, {0, 40, 50, 60});
    HWND second = AddControl(L"BUTTON", 0, 2, {60, 40, 110, 60});
    HWND both = AddControl(L"BUTTON", 0, 3, {120, 40, 170, 60});
    CSTabCtrl tabs;
};

TEST(PageTab, ShowsThePageThatIsSelectedAndTellsOfTheUsersSelection) {
    TabWindow window;
    EXPECT_THAT(window.Visible(), ElementsAre(false, false, false)) << "whatever tab is selected";
    window.tabs.SetCurSel(0);
    EXPECT_THAT(window.Visible(), ElementsAre(true, false, true));
    EXPECT_EQ(window.tabs.SetCurSel(1), 0);
    EXPECT_THAT(window.Visible(), ElementsAre(false, true, true));
    EXPECT_THAT(window.Pump(), IsEmpty()) << "only the user's selections are told";
    SendMessageW(window.tabs.Handle(), WM_LBUTTONDOWN, MK_LBUTTON, MAKELPARAM(10, 10));
    EXPECT_THAT(window.Visible(), ElementsAre(true, false, true));
    EXPECT_THAT(window.Pump(), ElementsAre(ParentWindow::Posted{2021, kTabId, 0}));
}

TEST(PageTab, EnablesAllPagesWithItself) {
    TabWindow window;
    for (const bool enabled : {false, true}) {
        EnableWindow(window.tabs.Handle(), enabled);
        for (HWND control : {window.first, window.second, window.both}) {
            EXPECT_EQ(IsWindowEnabled(control) != FALSE, enabled);
        }
    }
}

}  // namespace
}  // namespace orvane::testing
