// The real manual view on a thread of its own, over a PC folder and the folder device.
#pragma once

#include <windows.h>

#include <commctrl.h>

#include <algorithm>
#include <functional>
#include <string>

#include "res/ids.h"
#include "tests/support/dialog_thread.h"
#include "tests/support/job_folders.h"
#include "tests/support/message_boxes.h"
#include "transfer/transfer_dialog.h"

namespace orvane::testing {

using Names = Lines;
// Stands for the options dialog.
using Options = std::function<bool(SyncSettings&)>;

class TestedDialog : public CCeFileTransfDlg {
  public:
    TestedDialog(const SyncSettings& settings, bool date_check_done, Options options)
        : CCeFileTransfDlg(RefreshSettingsBlock(settings), date_check_done, nullptr), options_(options) {}

  protected:
    bool RunOptions(SyncSettings& settings) override { return options_(settings); }

  private:
    const Options options_;
};

class TransferRun : public DialogThread<TestedDialog> {
  public:
    // Returns when the dialog's lists are filled or it has ended.
    explicit TransferRun(const SyncSettings& settings, bool date_check_done = true, Options options = {})
        : DialogThread(settings, date_check_done, options) {
        WaitUntilOpen();
    }

    bool IsEnabled(int id) const { return IsWindowEnabled(Item(id)) != FALSE; }
    bool IsChecked(int id) const { return SendMessageW(Item(id), BM_GETCHECK, 0, 0) == BST_CHECKED; }
    // The texts of a list's column, from top to bottom.
    Names Column(int list_id, int column = 0) const {
        Names texts(static_cast<std::size_t>(SendMessageW(Item(list_id), LVM_GETITEMCOUNT, 0, 0)));
        for (std::size_t row = 0; row < texts.size(); ++row) {
            wchar_t text[512] = {};
            LVITEMW item{};
            item.iSubItem = column;
            item.pszText = text;
            item.cchTextMax = static_cast<int>(std::size(text));
            SendMessageW(Item(list_id), LVM_GETITEMTEXTW, row, reinterpret_cast<LPARAM>(&item));
            texts[row] = text;
        }
        return texts;
    }

    // Ticks the entry of that name with the space bar.
    void Tick(int list_id, const std::wstring& name) const {
        const Names names = Column(list_id);
        const auto row = std::find(names.begin(), names.end(), name) - names.begin();
        ASSERT_LT(row, std::ssize(names)) << "not listed";
        LVITEMW item{};
        item.state = item.stateMask = LVIS_SELECTED | LVIS_FOCUSED;
        SendMessageW(Item(list_id), LVM_SETITEMSTATE, static_cast<WPARAM>(row),
                     reinterpret_cast<LPARAM>(&item));
        SendMessageW(Item(list_id), WM_KEYDOWN, VK_SPACE, 1);
    }
    void SelectDevicePage() const {
        SendMessageW(Item(IDC_TRANSFER_TABS), TCM_SETCURFOCUS, 1, 0);
        EXPECT_TRUE(
            WaitUntil([&] { return Text(IDC_TRANSFER_COPY) == L"Copy Selected File(s) from Device to PC"; }));
    }
};

// Settings that let some types take part and overwrite older files.
class TransferTest : public JobFolders {
  protected:
    TransferTest() {
        settings_.sync_path_dt = pc_.Path() + L"\\";
        settings_.sync_path_ce = L"\\Jobs\\";
        settings_.types.set().reset(RowOfType(L".bmp"));
        settings_.overwrite_old_files = true;
    }

    SyncSettings settings_;
};

}  // namespace orvane::testing
