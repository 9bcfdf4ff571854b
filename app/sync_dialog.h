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
#include "ui/screen.h"

namespace orvane {

// How far a synchronization has come. The caption of button 1009 and the status line show it.
enum class RunState {
    kIdle,
    kRunning,
    kCancelled,
    kComplete,
    kDiskFull,  // The target's disk was full: no worker is left.
};

// Holds the settings in memory, starts and cancels synchronizations, and shows what their workers report.
// All of it runs on the user-interface thread. The object must outlive its worker (HasRunningWorker).
class CWendlowDlg : public ui::Dialog {
  public:
    // Loads the settings, which opens a device session and may take as long as ConnectDevice waits.
    CWendlowDlg();

    // Whether a worker's thread has not ended yet. Other threads may ask once the dialog has closed.
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
    bool OnPaint();
    std::optional<LRESULT> OnCtlColor(UINT message, HDC dc);

    // A run from its start to its end.
    void FillTask(JobTable pc, JobTable device);
    void ShowStart();
    void StartWorker(LPTHREAD_START_ROUTINE procedure);
    void CancelRun();
    void HandleReport(SyncReport report);
    void OnWorkerEnded(const SyncReport& report);
    void OnComplete();

    void Enter(RunState state);
    void ShowStatus(std::wstring text);
    void AddLogLine(const std::wstring& text);
    void SelectLastLogLine();
    void ShowReports();

    bool stay_hidden_ = false;
    UniqueBrush background_;
    ui::WindowIcons icons_;
    SyncSettings settings_;
    DeviceTreeReader device_tree_;
    bool reads_job_folders_ = false;  // All input is dropped.
    RunState state_ = RunState::kIdle;
    ULONGLONG cancelled_at_ = 0;  // By "Cancel", in ticks.
    std::wstring status_;         // What the status line shows.
    SyncTask task_;
    UniqueThread worker_;  // From its start until its last report has been handled.
    // What reports have changed and the controls do not show yet; since when they do not, in ticks.
    LRESULT unshown_steps_ = 0;
    std::vector<std::wstring> unshown_lines_;
    ULONGLONG reports_shown_at_ = 0;
};

}  // namespace orvane
