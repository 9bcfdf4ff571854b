#include "app/sync_dialog.h"

#include <commctrl.h>

#include <utility>

#include "app/help.h"
#include "app/sync_pass.h"
#include "device/clock_check.h"
#include "platform/paths.h"
#include "qelutils/xlate.h"
#include "res/ids.h"
#include "settings/options_dialog.h"
#include "transfer/job_folders.h"
#include "transfer/transfer_dialog.h"
#include "ui/waiting.h"

namespace orvane {

namespace {

constexpr COLORREF kBackground = RGB(0xEC, 0xE9, 0xD8);
constexpr COLORREF kFieldText = RGB(0x00, 0xFF, 0x00);
constexpr COLORREF kBlack = RGB(0x00, 0x00, 0x00);

// How long a worker that the user leaves behind may take to put away what it is about. A question to the user
// or a silent device may hold it up for longer: nothing waits for those.
constexpr DWORD kLeavingWaitMs = 500;

// Reports are handled for so long at a time, then the user's clicks and the painting have their turn.
constexpr DWORD kReportBudgetMs = 30;
constexpr UINT_PTR kReportTimer = 1;

// Painting a step of the bar or a line of the log takes longer than most files take to be copied: what the
// reports change is shown in one go, this often at most.
constexpr DWORD kShowIntervalMs = 50;

std::wstring StatusText(RunState state) {
    switch (state) {
        case RunState::kRunning:
        case RunState::kDiskFull:  // That the run looks like running until the user cancels it is meant.
            return Xlate(L"Synchronization in progress...");
        case RunState::kCancelled:
            return Xlate(L"Sychronization cancelled");
        case RunState::kComplete:
            return Xlate(L"Synchronization complete.");
        default:
            return {};
    }
}

bool CanBeCancelled(RunState state) {
    return state == RunState::kRunning || state == RunState::kDiskFull;
}

}  // namespace

CWendlowDlg::CWendlowDlg()
    : Dialog(IDD_SYNC), background_(CreateSolidBrush(kBackground)), settings_(LoadSettings()) {}

bool CWendlowDlg::HasRunningWorker() const {
    return worker_ && WaitForSingleObject(worker_.Get(), 0) == WAIT_TIMEOUT;
}

bool CWendlowDlg::OnInitDialog() {
    icons_.Set(Handle(), IDI_APPLICATION_ICON);
    SetWindowTextW(Handle(), Xlate(L"Desktop-Mobile Device Synchronization").c_str());
    Enter(RunState::kIdle);

    AppendHelpItems(GetSystemMenu(Handle(), FALSE));
    task_.reports.SetTarget(Handle(), WM_SYNC_NOTIFY);

    if (settings_.start_file_view) {
        // The program is a file viewer then; this dialog never comes into view.
        stay_hidden_ = true;
        OnFileView();
        End(0);
        return true;
    }
    if (settings_.sync_path_ce.empty()) {
        ShowStatus(Xlate(L"No mobile device with a job folder was found."));
    }
    ShowPainted();
    const ui::WaitCursor wait;
    bool accepted = false;
    if (CheckDeviceDateTime(Handle(), device_tree_.StopEvent(), accepted) == 0) {
        End(0);
        return false;
    }
    return true;
}

// Escape and the close box.
void CWendlowDlg::OnCancel() {
    if (worker_) {
        CancelRun();
        WaitForSingleObject(worker_.Get(), kLeavingWaitMs);
    }
    Dialog::OnCancel();
}

bool CWendlowDlg::OnClicked(int id) {
    if (reads_job_folders_) {
        return true;
    }
    if (state_ == RunState::kIdle) {
        ShowStatus({});  // That there was no device at the start is no news any more.
    }
    switch (id) {
        case IDC_SYNC_START:
            OnSynchronize();
            return true;
        case IDC_SYNC_CANCEL_EXIT:
            OnCancelExit();
            return true;
        case IDC_SYNC_SETTINGS:
            OnSettings();
            return true;
        case IDC_SYNC_FILE_VIEW:
            OnFileView();
            return true;
        default:
            return false;
    }
}

std::optional<LRESULT> CWendlowDlg::OnMessage(UINT message, WPARAM wparam, LPARAM lparam) {
    switch (message) {
        case WM_SYNC_NOTIFY:
            OnSyncNotify();
            return 0;
        case WM_TIMER:
            if (wparam != kReportTimer) {
                return std::nullopt;
            }
            OnSyncNotify();
            return 0;
        case WM_WINDOWPOSCHANGING:
            // The dialog manager may show even a dialog that has ended while it was initialised.
            if (stay_hidden_) {
                reinterpret_cast<WINDOWPOS*>(lparam)->flags &= ~static_cast<UINT>(SWP_SHOWWINDOW);
            }
            return std::nullopt;
        case WM_SYSCOMMAND:
            return RunHelpItem(static_cast<UINT>(wparam), Handle()) ? std::optional<LRESULT>(0)
                                                                    : std::nullopt;
        case WM_HELP:  // F1, here or in a dialog above this one.
            OpenGuide(Handle());
            return TRUE;
        case WM_PAINT:
            return OnPaint() ? std::optional<LRESULT>(0) : std::nullopt;
        case WM_QUERYDRAGICON:
            return reinterpret_cast<LRESULT>(icons_.Big());
        case WM_DPICHANGED:
            icons_.Set(Handle(), IDI_APPLICATION_ICON);
            return std::nullopt;
        case WM_CTLCOLORMSGBOX:
        case WM_CTLCOLOREDIT:
        case WM_CTLCOLORLISTBOX:
            return OnCtlColor(message, reinterpret_cast<HDC>(wparam));
        default:
            return std::nullopt;
    }
}

bool CWendlowDlg::OnPaint() {
    if (!IsIconic(Handle())) {
        return false;
    }
    PAINTSTRUCT paint{};
    HDC dc = BeginPaint(Handle(), &paint);
    SendMessageW(Handle(), WM_ICONERASEBKGND, reinterpret_cast<WPARAM>(dc), 0);
    RECT client{};
    GetClientRect(Handle(), &client);
    DrawIcon(dc, (client.right - GetSystemMetrics(SM_CXICON) + 1) / 2,
             (client.bottom - GetSystemMetrics(SM_CYICON) + 1) / 2, icons_.Big());
    EndPaint(Handle(), &paint);
    return true;
}

std::optional<LRESULT> CWendlowDlg::OnCtlColor(UINT message, HDC dc) {
    if (message == WM_CTLCOLORLISTBOX) {
        SetTextColor(dc, kBlack);
        SetBkColor(dc, kBackground);
        UpdateColors(dc);
    } else {
        SetTextColor(dc, kFieldText);
        SetBkColor(dc, kBlack);
    }
    return reinterpret_cast<LRESULT>(background_.Get());
}

void CWendlowDlg::OnSynchronize() {
    if (worker_) {
        MessageBeep(MB_OK);
        return;
    }
    ShowStatus(StatusText(RunState::kRunning));
    JobTable pc;
    JobTable device;
    reads_job_folders_ = true;
    const ui::Waited waited =
        ReadJobFolders(Handle(), settings_, device_tree_, XlateKey(L"failed to read from remote device."), pc,
                       device, [] {});
    reads_job_folders_ = false;
    if (waited != ui::Waited::kDone) {
        ShowStatus({});
        if (waited == ui::Waited::kClosed) {
            Dialog::OnCancel();
        }
        return;
    }
    FillTask(std::move(pc), std::move(device));
    ShowStart();
    StartWorker(SyncThreadDT2CE);
}

void CWendlowDlg::FillTask(JobTable pc, JobTable device) {
    task_.cancel.Reset();
    task_.pc = {std::move(pc), std::wstring(WithoutTrailingBackslashes(settings_.sync_path_dt))};
    task_.device = {std::move(device), std::wstring(WithoutTrailingBackslashes(settings_.sync_path_ce))};
    task_.types = SynchronizedTypes(settings_.types);
    task_.overwrite_old_files = settings_.overwrite_old_files;
    task_.overwrite_bkp = settings_.overwrite_bkp;
    task_.overwrite_warn = settings_.overwrite_warn;
}

void CWendlowDlg::ShowStart() {
    Enter(RunState::kRunning);
    HWND progress = Item(IDC_SYNC_PROGRESS);
    // The maximum is a 16-bit value; more rows than that wrap.
    SendMessageW(progress, PBM_SETRANGE, 0,
                 MAKELPARAM(0, LOWORD(task_.device.listing.rows + task_.pc.listing.rows)));
    SendMessageW(progress, PBM_SETPOS, 0, 0);
    ShowWindow(progress, SW_SHOW);
    AddLogLine(Xlate(L"Checking files..."));
    HWND log = Item(IDC_SYNC_LOG);
    const LRESULT lines = SendMessageW(log, LB_GETCOUNT, 0, 0);
    SendMessageW(log, LB_SETCARETINDEX, static_cast<WPARAM>(lines), FALSE);
}

void CWendlowDlg::StartWorker(LPTHREAD_START_ROUTINE procedure) {
    worker_.Reset(CreateThread(nullptr, kSyncThreadStack, procedure, &task_, 0, nullptr));
    if (!worker_) {
        Enter(RunState::kCancelled);  // The system has no thread left.
    }
}

void CWendlowDlg::OnCancelExit() {
    if (CanBeCancelled(state_)) {
        CancelRun();
        cancelled_at_ = GetTickCount64();
    } else if (state_ != RunState::kCancelled || GetTickCount64() - cancelled_at_ > GetDoubleClickTime()) {
        // Not the second click of a double click on "Cancel". A cancelled worker may still be copying; it is
        // not waited for.
        OnOK();
    }
}

void CWendlowDlg::OnSettings() {
    if (auto saved = RunOptions(Handle(), RefreshSettingsBlock(settings_))) {
        settings_ = std::move(*saved);
    }
}

void CWendlowDlg::OnFileView() {
    if (worker_) {
        MessageBeep(MB_OK);
        return;
    }
    CCeFileTransfDlg view(RefreshSettingsBlock(settings_), false, Handle());
    view.DoModal();
    settings_ = SettingsOf(view.Settings());
}

void CWendlowDlg::CancelRun() {
    task_.cancel.Signal();
    Enter(RunState::kCancelled);
}

// Reports wait in the queue, or what they changed waits to be shown.
void CWendlowDlg::OnSyncNotify() {
    // Armed first: should a report run out of memory, the timer brings the dialog back for the rest.
    SetTimer(Handle(), kReportTimer, kShowIntervalMs, nullptr);
    const bool all_handled =
        task_.reports.Drain(kReportBudgetMs, [this](SyncReport report) { HandleReport(std::move(report)); });
    if (GetTickCount64() - reports_shown_at_ >= kShowIntervalMs) {
        ShowReports();
        if (all_handled) {
            KillTimer(Handle(), kReportTimer);
        }
    }
}

void CWendlowDlg::HandleReport(SyncReport report) {
    if (report.command == kIncrementProgress) {
        ++unshown_steps_;
    } else if (report.command == kAddInfoDisplay) {
        ++unshown_steps_;
        unshown_lines_.push_back(std::move(report.info_text));
    } else if (report.command == kErrorInfoDisplay) {
        // Its text was to mark the failed file's line, as a child window of the log. A list box has none: the
        // text is dropped and the line stays as it was, which is meant.
        if (unshown_lines_.empty()) {
            SelectLastLogLine();  // Else it is selected when they are shown.
        }
    } else {
        OnWorkerEnded(report);
    }
}

void CWendlowDlg::OnWorkerEnded(const SyncReport& report) {
    // Ends because the report was the last thing that the worker did.
    SetThreadPriority(worker_.Get(), THREAD_PRIORITY_ABOVE_NORMAL);
    WaitForSingleObject(worker_.Get(), INFINITE);
    worker_.Reset();
    if (report.command == kTaskCompleteCe2Dt) {
        OnComplete();
    } else if (state_ == RunState::kCancelled) {
        return;
    } else if (report.command == kTaskCompleteDt2Ce) {
        StartWorker(SyncThreadCE2DT);
    } else {
        Enter(report.end == PassEnd::kDiskFull ? RunState::kDiskFull : RunState::kCancelled);
    }
}

void CWendlowDlg::OnComplete() {
    // Both with what is not shown yet: each step of the bar and the log is drawn at once.
    const LRESULT upper_end = SendMessageW(Item(IDC_SYNC_PROGRESS), PBM_GETRANGE, FALSE, 0);
    unshown_steps_ += upper_end;  // Beyond its end the bar is full.
    unshown_lines_.push_back(StatusText(RunState::kComplete));
    ShowReports();
    Enter(RunState::kComplete);
    UpdateWindow(Handle());
    Sleep(100);  // The full bar is seen for a moment.
    ShowWindow(Item(IDC_SYNC_PROGRESS), SW_HIDE);
}

void CWendlowDlg::Enter(RunState state) {
    state_ = state;
    const std::wstring caption = CanBeCancelled(state) ? Xlate(L"Cancel") : Xlate(L"Exit");
    SetDlgItemTextW(Handle(), IDC_SYNC_CANCEL_EXIT, caption.c_str());
    ShowStatus(StatusText(state));
}

void CWendlowDlg::ShowStatus(std::wstring text) {
    if (text == status_) {
        return;
    }
    status_ = std::move(text);
    SetDlgItemTextW(Handle(), IDC_SYNC_STATUS, status_.c_str());
    // A screen reader reads it out then.
    NotifyWinEvent(EVENT_OBJECT_NAMECHANGE, Item(IDC_SYNC_STATUS), OBJID_CLIENT, CHILDID_SELF);
}

void CWendlowDlg::AddLogLine(const std::wstring& text) {
    SendMessageW(Item(IDC_SYNC_LOG), LB_ADDSTRING, 0, reinterpret_cast<LPARAM>(text.c_str()));
}

void CWendlowDlg::SelectLastLogLine() {
    HWND log = Item(IDC_SYNC_LOG);
    const LRESULT lines = SendMessageW(log, LB_GETCOUNT, 0, 0);
    SendMessageW(log, LB_SETCURSEL, static_cast<WPARAM>(lines - 1), 0);
}

// Brings the bar and the log to where the reports handled so far have moved them.
void CWendlowDlg::ShowReports() {
    reports_shown_at_ = GetTickCount64();
    if (unshown_steps_ > 0) {
        HWND progress = Item(IDC_SYNC_PROGRESS);
        const LRESULT position = SendMessageW(progress, PBM_GETPOS, 0, 0);
        SendMessageW(progress, PBM_SETPOS, static_cast<WPARAM>(position + std::exchange(unshown_steps_, 0)),
                     0);
    }
    if (!unshown_lines_.empty()) {
        HWND log = Item(IDC_SYNC_LOG);
        SendMessageW(log, WM_SETREDRAW, FALSE, 0);
        for (const std::wstring& line : unshown_lines_) {
            AddLogLine(line);
        }
        unshown_lines_.clear();
        SelectLastLogLine();
        SendMessageW(log, WM_SETREDRAW, TRUE, 0);
        InvalidateRect(log, nullptr, TRUE);
    }
}

}  // namespace orvane
