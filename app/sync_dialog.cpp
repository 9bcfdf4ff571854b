#include "app/sync_dialog.h"

#include <commctrl.h>

#include <utility>

#include "app/sync_pass.h"
#include "device/clock_check.h"
#include "platform/paths.h"
#include "platform/resources.h"
#include "qelutils/xlate.h"
#include "res/ids.h"
#include "selection/job_table.h"
#include "settings/options_dialog.h"
#include "transfer/transfer_dialog.h"
#include "ui/waiting.h"

namespace orvane {

namespace {

constexpr COLORREF kBackground = RGB(0xEC, 0xE9, 0xD8);
constexpr COLORREF kFieldText = RGB(0x00, 0xFF, 0x00);
constexpr COLORREF kBlack = RGB(0x00, 0x00, 0x00);

// How long a cancelled worker is waited for. It ends at its next 8192-byte chunk or row, unless a question
// to the user holds it up.
constexpr DWORD kCancelledWorkerWaitMs = 2000;

// Reports are handled for so long at a time, then the user's clicks and the painting have their turn: the
// timer that resumes is served after both.
constexpr DWORD kReportBudgetMs = 30;
constexpr UINT_PTR kReportTimer = 1;

// Painting a step of the bar or a line of the log takes longer than most files take to be copied: what the
// reports change is shown in one go, this often at most.
constexpr DWORD kShowIntervalMs = 50;

// The about box.
class CAboutDlg : public ui::Dialog {
  public:
    explicit CAboutDlg(HWND parent) : Dialog(IDD_ABOUT, parent) {}
};

}  // namespace

CWendlowDlg::CWendlowDlg()
    : Dialog(IDD_SYNC),
      background_(CreateSolidBrush(kBackground)),
      icon_(LoadIconW(ResourceModule(), MAKEINTRESOURCEW(IDI_APPLICATION_ICON))),
      settings_(LoadSettings()) {
    settings_block_ = RefreshSettingsBlock(settings_);
}

bool CWendlowDlg::HasRunningWorker() const {
    const auto runs = [](const UniqueThread& worker) {
        return worker && WaitForSingleObject(worker.Get(), 0) == WAIT_TIMEOUT;
    };
    return runs(first_worker_) || runs(second_worker_);
}

bool CWendlowDlg::OnInitDialog() {
    SendMessageW(Handle(), WM_SETICON, ICON_BIG, reinterpret_cast<LPARAM>(icon_));
    SendMessageW(Handle(), WM_SETICON, ICON_SMALL, reinterpret_cast<LPARAM>(icon_));
    SetWindowTextW(Handle(), Xlate(L"Desktop-Mobile Device Synchronization").c_str());
    SetDlgItemTextW(Handle(), IDC_SYNC_CANCEL_EXIT, Xlate(L"Exit").c_str());

    HMENU system_menu = GetSystemMenu(Handle(), FALSE);
    AppendMenuW(system_menu, MF_SEPARATOR, 0, nullptr);
    AppendMenuW(system_menu, MF_STRING, IDM_ABOUT, Xlate(L"About Orvanelink...").c_str());

    task_.reports.SetTarget(Handle(), WM_SYNC_NOTIFY);

    if (settings_.start_file_view) {
        // The program is a file viewer then; this dialog never comes into view.
        stay_hidden_ = true;
        OnFileView();
        End(0);
        return true;
    }
    UpdateWindow(Handle());
    ShowWindow(Handle(), SW_SHOW);
    const ui::WaitCursor wait;
    bool accepted = false;
    if (CheckDeviceDateTime(Handle(), device_tree_.StopEvent(), accepted) == 0) {
        End(0);
        return false;
    }
    return true;
}

// Escape and the close box. The user wants to leave: a worker is cancelled first and given the time to
// remove a file that it has copied in part.
void CWendlowDlg::OnCancel() {
    if (HasRunningWorker()) {
        CancelWorker();
        for (const UniqueThread* worker : {&first_worker_, &second_worker_}) {
            if (*worker) {
                WaitForSingleObject(worker->Get(), kCancelledWorkerWaitMs);
            }
        }
    }
    Dialog::OnCancel();
}

bool CWendlowDlg::OnClicked(int id) {
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
            KillTimer(Handle(), kReportTimer);
            OnSyncNotify();
            return 0;
        case WM_WINDOWPOSCHANGING:
            // The dialog manager may show even a dialog that has ended while it was initialised.
            if (stay_hidden_) {
                reinterpret_cast<WINDOWPOS*>(lparam)->flags &= ~static_cast<UINT>(SWP_SHOWWINDOW);
            }
            return std::nullopt;
        case WM_SYSCOMMAND:
            return OnSysCommand(static_cast<UINT>(wparam)) ? std::optional<LRESULT>(0) : std::nullopt;
        case WM_PAINT:
            return OnPaint() ? std::optional<LRESULT>(0) : std::nullopt;
        case WM_QUERYDRAGICON:
            return reinterpret_cast<LRESULT>(icon_);
        case WM_CTLCOLORMSGBOX:
        case WM_CTLCOLOREDIT:
        case WM_CTLCOLORLISTBOX:
            return OnCtlColor(message, reinterpret_cast<HDC>(wparam));
        default:
            return std::nullopt;
    }
}

bool CWendlowDlg::OnSysCommand(UINT command) {
    // The system uses the low four bits of a command itself.
    if ((command & 0xFFF0U) != IDM_ABOUT) {
        return false;
    }
    CAboutDlg(Handle()).DoModal();
    return true;
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
             (client.bottom - GetSystemMetrics(SM_CYICON) + 1) / 2, icon_);
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
    if (!SettleEarlierRun()) {
        return;
    }
    const ui::WaitCursor wait;
    SetDlgItemTextW(Handle(), IDC_SYNC_STATUS, Xlate(L"Synchronization in progress...").c_str());
    FileNode device_root;
    if (!device_tree_.ReadOnThread(settings_.sync_path_ce, {}, device_root, Handle())) {
        ui::ShowMessageBox(Handle(), Xlate(L"failed to read from remote device."));
        SetDlgItemTextW(Handle(), IDC_SYNC_STATUS, L"");
        return;
    }
    FillTask(ListPcJobFolder(settings_.sync_path_dt), JobTable(device_root));
    ShowStart();
    StartWorker(first_worker_, SyncThreadDT2CE);
}

// True when no worker runs any more and everything that the last ones reported has been handled. A worker
// that was not cancelled is not waited for.
bool CWendlowDlg::SettleEarlierRun() {
    for (;;) {
        UniqueThread& worker = second_worker_ ? second_worker_ : first_worker_;
        const HANDLE thread = worker.Get();
        if (worker &&
            WaitForSingleObject(thread, task_.cancelled ? kCancelledWorkerWaitMs : 0) != WAIT_OBJECT_0) {
            return false;
        }
        // Its last report may be its completion, which forgets the worker and starts the next one.
        task_.reports.Drain(INFINITE, [this](SyncReport report) { HandleReport(std::move(report)); });
        if (worker.Get() == thread) {
            worker.Reset();
        }
        if (!first_worker_ && !second_worker_) {
            ShowReports();
            return true;
        }
    }
}

void CWendlowDlg::FillTask(JobTable pc, JobTable device) {
    task_.cancelled = false;
    task_.info_text.clear();
    task_.pc = {std::move(pc), std::wstring(WithoutTrailingBackslashes(settings_.sync_path_dt))};
    task_.device = {std::move(device), std::wstring(WithoutTrailingBackslashes(settings_.sync_path_ce))};
    task_.types = SynchronizedTypes(settings_.types);
    task_.overwrite_old_files = settings_.overwrite_old_files;
    task_.overwrite_bkp = settings_.overwrite_bkp;
    task_.overwrite_warn = settings_.overwrite_warn;
}

void CWendlowDlg::ShowStart() {
    SetDlgItemTextW(Handle(), IDC_SYNC_CANCEL_EXIT, Xlate(L"Cancel").c_str());
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

void CWendlowDlg::StartWorker(UniqueThread& worker, LPTHREAD_START_ROUTINE procedure) {
    worker.Reset(CreateThread(nullptr, kSyncThreadStack, procedure, &task_, 0, nullptr));
    if (!worker) {
        // The system has no thread left: the dialog is as after a cancellation.
        CancelWorker();
    }
}

void CWendlowDlg::OnCancelExit() {
    const std::wstring text = ui::WindowText(Item(IDC_SYNC_CANCEL_EXIT));
    if (text == Xlate(L"Exit")) {
        // A cancelled worker may still be copying; it is not waited for.
        OnOK();
    } else if (text == Xlate(L"Cancel")) {
        CancelWorker();
    }
}

void CWendlowDlg::OnSettings() {
    if (auto saved = RunOptions(Handle(), settings_block_)) {
        settings_ = std::move(*saved);
    }
    settings_block_ = RefreshSettingsBlock(settings_);
}

// The view's settings come back in the block alone: what it stored in the registry reaches this dialog's own
// settings at the next start.
void CWendlowDlg::OnFileView() {
    CCeFileTransfDlg view(settings_block_, false, Handle());
    view.DoModal();
    settings_block_ = view.Settings();
}

void CWendlowDlg::CancelWorker() {
    task_.cancelled = true;
    if (const HANDLE event = task_.copy_cancel_event) {
        SetEvent(event);
    }
    SetDlgItemTextW(Handle(), IDC_SYNC_STATUS, Xlate(L"Sychronization cancelled").c_str());
    SetDlgItemTextW(Handle(), IDC_SYNC_CANCEL_EXIT, Xlate(L"Exit").c_str());
}

void CWendlowDlg::OnSyncNotify() {
    // Armed first: should a report run out of memory, the timer brings the dialog back for the rest.
    SetTimer(Handle(), kReportTimer, kShowIntervalMs, nullptr);
    const bool all_handled =
        task_.reports.Drain(kReportBudgetMs, [this](SyncReport report) { HandleReport(std::move(report)); });
    if (!all_handled) {
        SetTimer(Handle(), kReportTimer, USER_TIMER_MINIMUM, nullptr);
    }
    if (GetTickCount64() - reports_shown_at_ >= kShowIntervalMs) {
        ShowReports();
        if (all_handled) {
            KillTimer(Handle(), kReportTimer);
        }
    }
}

void CWendlowDlg::HandleReport(SyncReport report) {
    task_.command = report.command;
    if (report.info_text) {
        task_.info_text = std::move(*report.info_text);
    }
    if (task_.command == kIncrementProgress) {
        ++unshown_steps_;
    } else if (task_.command == kAddInfoDisplay) {
        OnAddInfo();
    } else if (task_.command == kErrorInfoDisplay) {
        OnErrorInfo();
    } else if (task_.command == kTaskCompleteDt2Ce) {
        OnFirstPassComplete();
    } else if (task_.command == kTaskCompleteCe2Dt) {
        OnSecondPassComplete();
    }
}

void CWendlowDlg::OnAddInfo() {
    if (!task_.info_text.empty()) {
        ++unshown_steps_;
        unshown_lines_.push_back(std::move(task_.info_text));
        task_.info_text.clear();
    }
}

// Marks the line of the failed file in the log, if the log's lines were windows. They are not, and so an
// error only discards its text: the file's line stays as it was. That is meant.
void CWendlowDlg::OnErrorInfo() {
    if (!task_.info_text.empty()) {
        const LRESULT position = SendMessageW(Item(IDC_SYNC_PROGRESS), PBM_GETPOS, 0, 0) + unshown_steps_;
        if (HWND line = GetDlgItem(Item(IDC_SYNC_LOG), static_cast<int>(position))) {
            SetWindowTextW(line, (ui::WindowText(line) + L"- FAILED").c_str());
        }
        task_.info_text.clear();
    }
    if (unshown_lines_.empty()) {
        SelectLastLogLine();  // Else it is selected when they are shown.
    }
}

void CWendlowDlg::OnFirstPassComplete() {
    if (first_worker_) {
        AwaitAndForget(first_worker_);
        if (!task_.cancelled) {
            StartWorker(second_worker_, SyncThreadCE2DT);
        }
    }
}

void CWendlowDlg::OnSecondPassComplete() {
    if (!second_worker_) {
        return;
    }
    AwaitAndForget(second_worker_);
    ShowReports();
    HWND progress = Item(IDC_SYNC_PROGRESS);
    const LRESULT upper_end = SendMessageW(progress, PBM_GETRANGE, FALSE, 0);
    SendMessageW(progress, PBM_SETPOS, static_cast<WPARAM>(upper_end), 0);
    if (!task_.info_text.empty()) {
        AddLogLine(task_.info_text);
    }
    const std::wstring complete = Xlate(L"Synchronization complete.");
    AddLogLine(complete);
    SelectLastLogLine();
    SetDlgItemTextW(Handle(), IDC_SYNC_STATUS, complete.c_str());
    SetDlgItemTextW(Handle(), IDC_SYNC_CANCEL_EXIT, Xlate(L"Exit").c_str());
    UpdateWindow(Handle());
    Sleep(100);  // The full bar is seen for a moment.
    ShowWindow(progress, SW_HIDE);
}

// A worker's completion is the last thing that it does, so the wait is short.
void CWendlowDlg::AwaitAndForget(UniqueThread& worker) {
    SetThreadPriority(worker.Get(), THREAD_PRIORITY_ABOVE_NORMAL);
    WaitForSingleObject(worker.Get(), INFINITE);
    worker.Reset();
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
