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
        for (const wchar_t* text : {L"Mobile Device", L"PC"}) {
            TCITEMW item{};
            item.mask = TCIF_TEXT;
            item.pszText = const_cast<wchar_t*>(text);
            SendMessageW(tabs.Handle(), TCM_INSERTITEMW, 0, reinterpret_cast<LPARAM>(&item));
        }
        tabs.SetNotifyWindow(Handle());
    }

    void ClickTab(int tab) const {
        RECT place{};
        SendMessageW(tabs.Handle(), TCM_GETITEMRECT, static_cast<WPARAM>(tab),
                     reinterpret_cast<LPARAM>(&place));
        const LPARAM point = MAKELPARAM((place.left + place.right) / 2, (place.top + place.bottom) / 2);
        SendMessageW(tabs.Handle(), WM_LBUTTONDOWN, MK_LBUTTON, point);
        SendMessageW(tabs.Handle(), WM_LBUTTONUP, 0, point);
    }
    template <class Test>
    std::vector<bool> Each(Test test) const {
        return {test(first) != 0, test(second) != 0, test(both) != 0};
    }

    HWND first = AddControl(L"BUTTON", 0, 1, {0, 40, 50, 60});
    HWND second = AddControl(L"BUTTON", 0, 2, {60, 40, 110, 60});
    HWND both = AddControl(L"BUTTON", 0, 3, {120, 40, 170, 60});
    CSTabCtrl tabs;
};

void AttachAll(TabWindow& window) {
    EXPECT_TRUE(window.tabs.AttachControlToTab(window.second, 1));
    EXPECT_TRUE(window.tabs.AttachControlToTab(window.both, 1));
    EXPECT_TRUE(window.tabs.AttachControlToTab(window.first, 0));
    EXPECT_TRUE(window.tabs.AttachControlToTab(window.both, 0));
}

TEST(PageTab, ShowsThePageThatIsSelected) {
    TabWindow window;
    for (const int no_tab : {2, -1}) {
        EXPECT_FALSE(window.tabs.AttachControlToTab(window.first, no_tab));
        EXPECT_TRUE(IsWindowVisible(window.first)) << no_tab;
    }
    AttachAll(window);
    EXPECT_THAT(window.Each(IsWindowVisible), ElementsAre(false, false, false)) << "whatever tab is selected";
    EXPECT_EQ(window.tabs.SetCurSel(0), 1) << "what was inserted first was selected and moved on";
    EXPECT_THAT(window.Each(IsWindowVisible), ElementsAre(true, false, true));
    EXPECT_THAT(window.Pump(), IsEmpty()) << "only the user's selections are told";
    window.ClickTab(1);
    EXPECT_THAT(window.Each(IsWindowVisible), ElementsAre(false, true, true));
    EXPECT_THAT(window.Pump(), ElementsAre(ParentWindow::Posted{2021, kTabId, 1}));
}

TEST(PageTab, EnablesAllPagesWithItself) {
    TabWindow window;
    AttachAll(window);
    EXPECT_TRUE(window.tabs.EnableTabControls(0, false));
    EXPECT_THAT(window.Each(IsWindowEnabled), ElementsAre(false, true, false));
    EXPECT_FALSE(window.tabs.EnableTabControls(2, false));
    EnableWindow(window.tabs.Handle(), FALSE);
    EXPECT_THAT(window.Each(IsWindowEnabled), ElementsAre(false, false, false));
    EnableWindow(window.tabs.Handle(), TRUE);
    EXPECT_THAT(window.Each(IsWindowEnabled), ElementsAre(true, true, true));
    DestroyWindow(window.tabs.Handle());
    EXPECT_FALSE(window.tabs.ShowTabControls(0, SW_SHOW)) << "the pages end with the window";
}

}  // namespace
}  // namespace orvane::testing
