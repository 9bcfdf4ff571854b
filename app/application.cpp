#include "app/application.h"

#include <windows.h>

#include <commctrl.h>

#include "app/sync_dialog.h"
#include "platform/resources.h"

namespace orvane {

void RegisterDialogClass() {
    WNDCLASSW dialog_class{};
    if (GetClassInfoW(nullptr, L"#32770", &dialog_class)) {
        dialog_class.lpszClassName = L"Qel_Orvanelink";
        dialog_class.hInstance = ResourceModule();
        RegisterClassW(&dialog_class);
    }
}

bool CWendlowApp::InitInstance() {
    const INITCOMMONCONTROLSEX controls = {sizeof(INITCOMMONCONTROLSEX), ICC_WIN95_CLASSES};
    InitCommonControlsEx(&controls);
    RegisterDialogClass();

    CWendlowDlg dialog;
    dialog.DoModal();
    if (dialog.HasRunningWorker()) {
        // The process ends under the worker, before the objects that it uses are gone.
        ExitProcess(0);
    }
    return false;
}

}  // namespace orvane
