// The real manual view on a thread of its own, over a PC folder and the folder device.
#pragma once

#include <gtest/gtest.h>
#include <windows.h>

#include <commctrl.h>

#include <algorithm>
#include <atomic>
#include <functional>
#include <string>
#include <thread>
#include <vector>

#include "res/ids.h"
#include "tests/support/dialog_script.h"
#include "tests/support/folder_device.h"
#include "tests/support/message_boxes.h"
#include "tests/support/temp_folder.h"
#include "transfer/transfer_dialog.h"

namespace orvane::testing {

using Names = std::vector<std::wstring>;
// Stands for the options dialog.
using Options = std::function<bool(SyncSettings&)>;

class TestedDialog : public CCeFileTransfDlg {
  public:
    TestedDialog(const SyncSettings& settings, bool date_check_done, Options options,
                 std::atomic<HWND>& opened)
        : CCeFileTransfDlg(RefreshSettingsBlock(settings), date_check_done, nullptr),
          options_(options),
          opened_(opened) {}

  protected:
    bool OnInitDialog() override {
        const bool set_focus = CCeFileTransfDlg::OnInitDialog();
        opened_ = Handle();
        return set_focus;
    }
    bool RunOptions(SyncSettings& settings) override { return options_(settings); }

  private:
    const Options options_;
    std::atomic<HWND>& opened_;
};

// One run of the dialog. The test drives it by messages from its own thread, as a user would.
class TransferRun {
  public:
    // Starts the dialog and returns when its lists are filled or it has ended.
    explicit TransferRun(const SyncSettings& settings, bool date_check_done = true, Options options = {})
        : thread_([=, this] {
              TestedDialog dialog(settings, date_check_done, options, window_);
              result_ = dialog.DoModal();
              ended_ = true;
          }) {
        WaitUntil([this] { return HasEnded() || window_ != nullptr; });
    }
    ~TransferRun() { Result(); }
    TransferRun(const TransferRun&) = delete;
    TransferRun& operator=(const TransferRun&) = delete;

    // Closes the dialog if it is still open. What DoModal answered.
    INT_PTR Result() {
        if (thread_.joinable()) {
            PressAndGoOn(IDC_TRANSFER_CLOSE);
            thread_.join();
        }
        return result_;
    }
    bool HasEnded() const { return ended_; }

    HWND Window() const { return window_; }
    HWND Item(int id) const { return GetDlgItem(window_, id); }
    bool IsEnabled(int id) const { return IsWindowEnabled(Item(id)) != FALSE; }
    bool IsChecked(int id) const { return SendMessageW(Item(id), BM_GETCHECK, 0, 0) == BST_CHECKED; }
    std::wstring Text(int id) const { return ItemText(window_, id); }
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

    // Presses a button and returns when the dialog has done what it is for, or without waiting.
    void Press(int id) const { SendMessageW(Item(id), BM_CLICK, 0, 0); }
    void PressAndGoOn(int id) const { PostMessageW(window_, WM_COMMAND, MAKEWPARAM(id, BN_CLICKED), 0); }
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

  private:
    std::atomic<HWND> window_{nullptr};
    std::atomic<bool> ended_{false};
    std::atomic<INT_PTR> result_{-1};
    std::thread thread_;
};

// Job folders on both sides and settings that let some types take part and overwrite older files.
class TransferTest : public ::testing::Test {
  protected:
    TransferTest() {
        MakeFolder(OnDevice(L""));
        settings_.sync_path_dt = pc_.Path() + L"\\";
        settings_.sync_path_ce = L"\\Jobs\\";
        settings_.types.set().reset(RowOfType(L".bmp"));
        settings_.overwrite_old_files = true;
    }

    std::wstring OnPc(const std::wstring& name) const { return pc_ / name; }
    std::wstring OnDevice(const std::wstring& name) const { return device_.PcPath(L"\\Jobs\\" + name); }
    // Files of that name, written that long after noon.
    void PutOnPc(const std::wstring& name, int seconds = 0) const {
        WriteTextFile(OnPc(name), "from the PC", AddSeconds(noon_, seconds));
    }
    void PutOnDevice(const std::wstring& name, int seconds = 0) const {
        WriteTextFile(OnDevice(name), "from the device", AddSeconds(noon_, seconds));
    }

    FolderDevice device_;
    TempFolder pc_;
    SyncSettings settings_;
    const FILETIME noon_ = UtcTime(2024, 3, 1, 12);
};

}  // namespace orvane::testing
