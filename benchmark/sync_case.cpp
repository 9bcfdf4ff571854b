#include <windows.h>

#include <psapi.h>

#include <algorithm>
#include <cstdio>
#include <string_view>

#include "app/application.h"
#include "app/sync_dialog.h"
#include "benchmark/cases.h"
#include "benchmark/dialog_thread.h"
#include "benchmark/json_line.h"
#include "benchmark/stopwatch.h"
#include "res/ids.h"

namespace orvane::bench {

namespace {

class MeasuredDialog : public CWendlowDlg {
  public:
    bool IsReady() const { return ready_; }

  protected:
    bool OnInitDialog() override {
        const bool set_focus = CWendlowDlg::OnInitDialog();
        ready_ = true;
        return set_focus;
    }

  private:
    std::atomic<bool> ready_{false};
};
using SyncThread = DialogThread<MeasuredDialog>;

// Whether a window shows the text, read without sending it a message.
bool Shows(HWND window, std::wstring_view text) {
    wchar_t shown[100];
    const int length = InternalGetWindowText(window, shown, static_cast<int>(std::size(shown)));
    return text == std::wstring_view(shown, static_cast<std::size_t>(length));
}

PROCESS_MEMORY_COUNTERS Memory() {
    PROCESS_MEMORY_COUNTERS counters{};
    GetProcessMemoryInfo(GetCurrentProcess(), &counters, sizeof counters);
    return counters;
}

// Watches a synchronization from outside: made right before another thread presses the button.
class Watcher {
  public:
    explicit Watcher(const SyncThread& dialog)
        : dialog_(dialog), state_([this] { WatchState(); }), answers_([this] { ProbeAnswers(); }) {}
    ~Watcher() {
        state_.join();
        answers_.join();
    }
    Watcher(const Watcher&) = delete;
    Watcher& operator=(const Watcher&) = delete;

    LONGLONG WorkStart() const { return work_start_; }
    // 0 as long as the synchronization is not complete.
    LONGLONG Complete() const { return complete_; }
    bool HasGivenUp() const { return given_up_; }
    LONGLONG LongestWait() const { return longest_wait_; }
    const CallCounts& Counts() const { return counts_; }

  private:
    void WatchState() {
        HWND button = dialog_.Item(IDC_SYNC_CANCEL_EXIT);
        HWND status = dialog_.Item(IDC_SYNC_STATUS);
        const bool completed = WaitUntil([&] {
            if (work_start_ == 0 && Shows(button, L"Cancel")) {
                work_start_ = Now();
            }
            return Shows(status, L"Synchronization complete.");
        });
        if (completed) {
            const LONGLONG end = Now();
            counts_ = TakeCallCounts();
            complete_ = end;
        } else {
            given_up_ = true;
        }
    }

    // A message that is still unanswered at the end has waited until the end: what follows is a sleep by
    // design.
    void ProbeAnswers() {
        while (complete_ == 0 && !given_up_) {
            const LONGLONG sent = Now();
            DWORD_PTR result = 0;
            SendMessageTimeoutW(dialog_.Window(), WM_NULL, 0, 0, SMTO_NORMAL, 60'000, &result);
            const LONGLONG end = complete_;
            const LONGLONG answered = end != 0 ? std::min<LONGLONG>(end, Now()) : Now();
            longest_wait_ = std::max<LONGLONG>(longest_wait_, answered - sent);
            Sleep(5);
        }
    }

    const SyncThread& dialog_;
    std::atomic<LONGLONG> work_start_{0};
    std::atomic<LONGLONG> complete_{0};
    std::atomic<LONGLONG> longest_wait_{0};
    std::atomic<bool> given_up_{false};
    CallCounts counts_;
    std::thread state_;
    std::thread answers_;
};

void AddCounts(JsonLine& line, const CallCounts& counts) {
    line.Add("remote_ms", Milliseconds(SumOf(counts, CallKind::kRemoteApi).ticks));
    line.Add("pc_file_ms", Milliseconds(SumOf(counts, CallKind::kPcFile).ticks));
    line.Add("wait_ms", Milliseconds(SumOf(counts, CallKind::kWait).ticks));
    line.Add("remote_calls", static_cast<double>(SumOf(counts, CallKind::kRemoteApi).calls));
    for (const auto& [name, count] : counts) {
        line.Add("calls_" + name, static_cast<double>(count.calls));
        line.Add("ms_" + name, Milliseconds(count.ticks));
    }
}

}  // namespace

bool RunSync(const std::wstring& pc_folder, bool with_backup) {
    InstallCallTimer();
    UseBenchSettings(pc_folder, with_backup);
    RegisterDialogClass();
    SyncThread dialog;
    if (dialog.HasEnded()) {
        std::fputs("the dialog did not come up\n", stderr);
        return false;
    }
    const SIZE_T before = Memory().WorkingSetSize;
    ResetCallCounts();
    LONGLONG start = 0;
    LONGLONG complete = 0;
    LONGLONG work_start = 0;
    LONGLONG longest_wait = 0;
    CallCounts counts;
    {
        const Watcher watcher(dialog);
        start = Now();
        SendMessageW(dialog.Item(IDC_SYNC_START), BM_CLICK, 0, 0);
        WaitUntil([&] { return watcher.Complete() != 0 || watcher.HasGivenUp(); });
        complete = watcher.Complete();
        work_start = watcher.WorkStart();
        longest_wait = watcher.LongestWait();
        counts = watcher.Counts();
    }
    if (complete == 0) {
        std::fputs("the synchronization did not complete\n", stderr);
        ExitProcess(1);  // The dialog may be beyond answering.
    }
    WaitUntil([&] { return !IsWindowVisible(dialog.Item(IDC_SYNC_PROGRESS)); });
    JsonLine line;
    line.Add("ms", Milliseconds(complete - start));
    line.Add("listing_ms", Milliseconds(work_start - start));
    line.Add("passes_ms", Milliseconds(complete - work_start));
    line.Add("end_sleep_ms", Milliseconds(Now() - complete));
    line.Add("no_answer_ms", Milliseconds(longest_wait));
    line.Add("peak_bytes", static_cast<double>(Memory().PeakWorkingSetSize - before));
    AddCounts(line, counts);
    line.Print();
    return true;
}

}  // namespace orvane::bench
