#include "app/about_dialog.h"

#include "qelutils/xlate.h"
#include "res/ids.h"

namespace orvane {

CAboutDlg::CAboutDlg(HWND parent) : Dialog(IDD_ABOUT, parent) {}

bool CAboutDlg::OnInitDialog() {
    const bool default_focus = Dialog::OnInitDialog();
    XlateWnd(Handle());
    return default_focus;
}

}  // namespace orvane
