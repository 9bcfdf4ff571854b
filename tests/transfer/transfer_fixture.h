// The real manual view on a thread of its own, over a PC folder and the folder device.
#pragma once

#include <gtest/gtest.h>
#include <windows.h>

#include <atomic>
#include <functional>
#include <string>
#include <thread>
#include <vector>

#include "res/ids.h"
#include "settings/settings_store.h"
#include "tests/support/folder_device.h"
#include "tests/support/message_boxes.h"
#include "tests/support/temp_folder.h"

namespace orvane::testing {

using Names = std::vector<std::wstring>;

// One run of the dialog. The test drives it by messages from its own thread, as a user would.
class TransferRun {
  public:
    // Starts the dialog and returns when its lists are filled or it has ended. `options` stands for the
    // options dialog.
    explicit TransferRun(const SyncSettingsBlock& settings, bool date_check_done = true,
                         std::function<bool(SyncSettingsBlock&)> options = {});
    // Closes the dialog if that has not happened.
    ~TransferRun();
    TransferRun(const TransferRun&) = delete;
    TransferRun& operator=(const TransferRun&) = delete;

    HWND Window() const { return window_; }
    HWND Item(int id) const { return GetDlgItem(window_, id); }
    bool IsEnabled(int id) const { return IsWindowEnabled(Item(id)) != FALSE; }
    bool IsChecked(int id) const { return SendMessageW(Item(id), BM_GETCHECK, 0, 0) == BST_CHECKED; }
    std::wstring Text(int id) const;
    // The texts of a list's column, from top to bottom.
    Names Column(int list_id, int column = 0) const;

    // Presses a button and returns when the dialog has done what it is for, or without waiting.
    void Press(int id) const;
    void PressAndGoOn(int id) const;
    // Ticks the entry of that name with the space bar.
    void Tick(int list_id, const std::wstring& name) const;
    void SelectPage(int page) const;

    // What DoModal answered; only after the end.
    INT_PTR Result();
    bool HasEnded() const { return ended_; }

    // Waits, at most half a minute, until the condition holds; whether it came to hold.
    static bool WaitUntil(const std::function<bool()>& condition);

  private:
    void Run(const SyncSettingsBlock& settings, bool date_check_done,
             const std::function<bool(SyncSettingsBlock&)>& options);

    std::atomic<HWND> window_{nullptr};
    std::atomic<bool> ended_{false};
    std::atomic<INT_PTR> result_{-1};
    std::thread thread_;
};

// The progress window of this process, null when there is none.
HWND ProgressWindow();

// Job folders on both sides and settings that let every type take part and overwrite older files.
class TransferTest : public ::testing::Test {
  protected:
    TransferTest();

    std::wstring OnPc(const std::wstring& name) const { return pc_ / name; }
    std::wstring OnDevice(const std::wstring& name) const { return device_.PcPath(L"\\Jobs\\" + name); }
    void PutOnPc(const std::wstring& name, int seconds = 0) const;
    void PutOnDevice(const std::wstring& name, int seconds = 0) const;

    FolderDevice device_;
    TempFolder pc_;
    SyncSettingsBlock settings_;
    const FILETIME noon_ = UtcTime(2024, 3, 1, 12);
};

}  // namespace orvane::testing
