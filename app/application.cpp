#include "app/application.h"

#include <windows.h>

#include <commctrl.h>

#include "app/sync_dialog.h"
#include "platform/resources.h"
#include "qelutils/xlate.h"
#include "res/ids.h"
#include "settings/settings_store.h"

namespace orvane {

void FollowLanguageSwitch() {
    std::wstring name;
    if (!RegReadString(HKEY_CURRENT_USER, ResourceString(IDS_SETTINGS_KEY), L"Language", name)) {
        return;
    }
    if (const LCID locale = LocaleNameToLCID(name.c_str(), LOCALE_ALLOW_NEUTRAL_NAMES)) {
        qel_text::SetCatalogLanguage(LANGIDFROMLCID(locale));
    }
}

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
    // A window that waits for the device is to be seen, not a picture of it that takes no clicks.
    DisableProcessWindowsGhosting();
    // A card that was taken out is a failed call, not a box of the system.
    SetErrorMode(SetErrorMode(0) | SEM_FAILCRITICALERRORS);
    RegisterDialogClass();
    FollowLanguageSwitch();

    CWendlowDlg dialog;
    dialog.DoModal();
    if (dialog.HasRunningWorker()) {
        // The process ends under the worker, before the objects that it uses are gone.
        ExitProcess(0);
    }
    return false;
}

}  // namespace orvane
