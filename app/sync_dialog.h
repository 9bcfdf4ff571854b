// The synchronization dialog, the program's main window.
#pragma once

#include <cstdint>
#include <string>
#include <vector>

#include "app/sync_task.h"
#include "device/device_tree_reader.h"
#include "platform/handles.h"
#include "settings/settings_store.h"
#include "ui/dialog.h"

namespace orvane {

// Holds the settings in memory, starts and cancels synchronizations, and shows what their workers report.
// All of it runs on the user-interface thread. The object must outlive its workers (HasRunningWorker).
class CWendlowDlg : public ui::Dialog {
  public:
    // Loads the settings, which opens a device session and may take as long as ConnectDevice waits.
    CWendlowDlg();

    // Whether a worker's thread has not ended yet. Any thread may ask once the dialog has closed.
    bool HasRunningWorker() const;

  protected:
    bool OnInitDialog() override;
    void OnCancel() override;
    bool OnClicked(int id) override;
    std::optional<LRESULT> OnMessage(UINT message, WPARAM wparam, LPARAM lparam) override;

  private:
    void OnSynchronize();
    void OnCancelExit();
    void OnSettings();
    void OnFileView();
    void OnSyncNotify();
    bool OnSysCommand(UINT command);
    bool OnPaint();
    std::optional<LRESULT> OnCtlColor(UINT message, HDC dc);

    // Starting a synchronization.
    bool SettleEarlierRun();
    void FillTask(JobTable pc, JobTable device);
    void ShowStart();
    void StartWorker(UniqueThread& worker, LPTHREAD_START_ROUTINE procedure);

    // Handling a report.
    void HandleReport(SyncReport report);
    void OnAddInfo();
    void OnErrorInfo();
    void OnFirstPassComplete();
    void OnSecondPassComplete();

    void CancelWorker();
    void AwaitAndForget(UniqueThread& worker);
    void AddLogLine(const std::wstring& text);
    void SelectLastLogLine();
    void ShowReports();

    bool stay_hidden_ = false;
    UniqueBrush background_;
    HICON icon_;
    SyncSettings settings_;
    SyncSettingsBlock settings_block_;
    DeviceTreeReader device_tree_;
    SyncTask task_;
    // What reports have changed and the controls do not show yet; since when they do not, in ticks.
    LRESULT unshown_steps_ = 0;
    std::vector<std::wstring> unshown_lines_;
    ULONGLONG reports_shown_at_ = 0;
    UniqueThread first_worker_;   // Desktop to device.
    UniqueThread second_worker_;  // Device to desktop.
};

}  // namespace orvane
