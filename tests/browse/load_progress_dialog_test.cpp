#include "browse/load_progress_dialog.h"

#include <gtest/gtest.h>

#include <set>
#include <vector>

#include "res/ids.h"

namespace orvane {

namespace {

TEST(LoadProgressDialog, TurnsFivePicturesAndCannotBeClosed) {
    CLoadProgressDlg dialog(L"Busy", nullptr);
    ASSERT_TRUE(dialog.Create());
    dialog.ShowPainted();
    EXPECT_FALSE(GetUpdateRect(GetDlgItem(dialog.Handle(), IDC_LOAD_TEXT), nullptr, FALSE));
    std::vector<LRESULT> icons;
    for (int tick = 0; tick < 6; ++tick) {
        SendMessageW(dialog.Handle(), WM_TIMER, 1, 0);
        icons.push_back(SendDlgItemMessageW(dialog.Handle(), IDC_LOAD_ICON, STM_GETICON, 0, 0));
    }
    EXPECT_EQ(std::set<LRESULT>(icons.begin(), icons.end()).size(), 5U);
    EXPECT_EQ(icons[0], icons[5]);

    for (const WPARAM key : {IDOK, IDCANCEL}) {
        SendMessageW(dialog.Handle(), WM_COMMAND, key, 0);
    }
    EXPECT_TRUE(IsWindow(dialog.Handle()));
}

}  // namespace

}  // namespace orvane
