// The real synchronization dialog over a PC folder and the folder device.
#pragma once

#include <windows.h>

#include <commctrl.h>

#include <algorithm>
#include <string>

#include "app/application.h"
#include "app/sync_dialog.h"
#include "jobs/file_types.h"
#include "platform/resources.h"
#include "qelutils/xlate.h"
#include "res/ids.h"
#include "settings/settings_store.h"
#include "tests/support/dialog_thread.h"
#include "tests/support/job_folders.h"
#include "tests/support/message_boxes.h"

namespace orvane::testing {

class SyncRun : public DialogThread<CWendlowDlg> {
  public:
    SyncRun() { WaitUntilOpen(); }

    Lines Log() const {
        Lines lines(static_cast<std::size_t>(SendMessageW(Item(IDC_SYNC_LOG), LB_GETCOUNT, 0, 0)));
        for (std::size_t line = 0; line < lines.size(); ++line) {
            wchar_t text[512] = {};
            SendMessageW(Item(IDC_SYNC_LOG), LB_GETTEXT, line, reinterpret_cast<LPARAM>(text));
            lines[line] = text;
        }
        return lines;
    }
    // How often the log holds the line.
    std::ptrdiff_t Logged(const wchar_t* line) const {
        const Lines log = Log();
        return std::count(log.begin(), log.end(), line);
    }
    std::wstring Status() const { return Text(IDC_SYNC_STATUS); }
    std::wstring Button() const { return Text(IDC_SYNC_CANCEL_EXIT); }
    bool IsBarVisible() const { return IsWindowVisible(Item(IDC_SYNC_PROGRESS)) != FALSE; }
    LRESULT BarMaximum() const { return SendMessageW(Item(IDC_SYNC_PROGRESS), PBM_GETRANGE, FALSE, 0); }
    bool HasWorker() const {
        bool runs = false;
        Call([&](CWendlowDlg& dialog) { runs = dialog.HasRunningWorker(); });
        return runs;
    }
    // Presses "Synchronize" and waits until the run is complete. A press that is ignored fails the test.
    void Synchronize() const {
        const std::ptrdiff_t before = Logged(kComplete);
        Press(IDC_SYNC_START);
        ASSERT_TRUE(WaitUntil([this] { return Status() == kComplete && !IsBarVisible(); }));
        ASSERT_EQ(Logged(kComplete), before + 1);
    }

  private:
    static constexpr const wchar_t* kComplete = L"Synchronization complete.";
};

// Settings that let every type take part and overwrite older files.
class SyncTest : public JobFolders {
  protected:
    SyncTest() {
        RegisterDialogClass();
        qel_text::SetCatalogLanguage(MAKELANGID(LANG_ENGLISH, SUBLANG_ENGLISH_US));
        Setting(L"SyncPath_DT", pc_.Path() + L"\\");
        Setting(L"SyncPath_CE", L"\\Jobs\\");
        for (const FileType& type : kFileTypes) {
            Setting(ResourceString(type.setting), L"1");
        }
        Setting(L"Overwrite_old_files", L"1");
    }

    // Sets a value of the settings for the dialogs that start from now on.
    static void Setting(const std::wstring& name, const std::wstring& text) {
        EXPECT_TRUE(RegWriteString(HKEY_CURRENT_USER, L"Software\\Veltrano\\CE Devices", name, text));
    }
    // Creates files new_0.qvj, new_1.qvj, ... on the PC.
    void PutManyOnPc(int count) const {
        for (int i = 0; i < count; ++i) {
            PutOnPc(L"new_" + std::to_wstring(i) + L".qvj", 0, "content");
        }
    }
};

}  // namespace orvane::testing
