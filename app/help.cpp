#include "app/help.h"

#include <objbase.h>
#include <shellapi.h>

#include <string>

#include "platform/paths.h"
#include "platform/resources.h"
#include "qelutils/text_format.h"
#include "qelutils/xlate.h"
#include "res/ids.h"
#include "res/version.h"
#include "ui/dialog.h"

namespace orvane {

namespace {

// The path of the guide, or empty when there is none.
std::wstring GuidePath() {
    std::wstring program(MAX_PATH, L'\0');
    DWORD length = 0;
    while ((length = GetModuleFileNameW(nullptr, program.data(), static_cast<DWORD>(program.size()))) ==
           program.size()) {
        program.resize(program.size() * 2);
    }
    program.resize(length);
    std::wstring guide = JoinPath(ParentPath(program), L"guide\\user_guide.html");
    return GetFileAttributesW(guide.c_str()) == INVALID_FILE_ATTRIBUTES ? std::wstring() : guide;
}

class CAboutDlg : public ui::Dialog {
  public:
    explicit CAboutDlg(HWND parent) : Dialog(IDD_ABOUT, parent) {}

  protected:
    bool OnInitDialog() override {
        using qel_text::detail::qel_safefmt_impl;
        SetDlgItemTextW(Handle(), IDC_ABOUT_VERSION,
                        qel_safefmt_impl(Xlate(L"Orvanelink, version {1}"), {L"" ORVANE_VERSION}).c_str());
        SetDlgItemTextW(Handle(), IDC_ABOUT_SETTINGS,
                        JoinPath(L"HKEY_CURRENT_USER", ResourceString(IDS_SETTINGS_KEY)).c_str());
        return true;
    }
};

}  // namespace

void AppendHelpItems(HMENU system_menu) {
    AppendMenuW(system_menu, MF_SEPARATOR, 0, nullptr);
    if (!GuidePath().empty()) {
        AppendMenuW(system_menu, MF_STRING, IDM_HELP, Xlate(L"Help").c_str());
    }
    AppendMenuW(system_menu, MF_STRING, IDM_ABOUT, Xlate(L"About Orvanelink...").c_str());
}

bool RunHelpItem(UINT command, HWND owner) {
    switch (command & 0xFFF0U) {  // The system uses the low four bits of a command itself.
        case IDM_HELP:
            OpenGuide(owner);
            return true;
        case IDM_ABOUT:
            CAboutDlg(owner).DoModal();
            return true;
        default:
            return false;
    }
}

void OpenGuide(HWND owner) {
    const std::wstring guide = GuidePath();
    if (guide.empty()) {
        return;
    }
    // Some programs are reached through COM.
    const bool com = SUCCEEDED(CoInitializeEx(nullptr, COINIT_APARTMENTTHREADED | COINIT_DISABLE_OLE1DDE));
    ShellExecuteW(owner, L"open", guide.c_str(), nullptr, nullptr, SW_SHOWNORMAL);
    if (com) {
        CoUninitialize();
    }
}

}  // namespace orvane
