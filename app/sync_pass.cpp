#include "app/sync_pass.h"

#include <functional>
#include <string>
#include <string_view>
#include <utility>

#include "app/sync_task.h"
#include "device/file_copy.h"
#include "platform/handles.h"
#include "qelutils/xlate.h"
#include "selection/copy_rules.h"
#include "selection/entry_copy.h"
#include "ui/dialog.h"

namespace orvane {

namespace {

// What tells one pass from the other.
struct PassKind {
    SyncSide SyncTask::*source;
    SyncSide SyncTask::*target;
    bool to_device;
    const wchar_t* source_label;
    const wchar_t* target_label;
    std::wstring (*copy_line)();  // The log line of a copy, up to the name; ends with the opening quote.
    qel_text::TextKey disk_full;
    qel_text::TextKey failure;
    std::wstring_view completion;
};

// That only one of the copy lines is translated and that the failure texts differ by a full stop is how the
// program's texts are.
constexpr PassKind kToDevice = {&SyncTask::pc,
                                &SyncTask::device,
                                true,
                                L" [PC]",
                                L" [Device]",
                                [] { return std::wstring(L"[Desktop to Mobile Device] File copy: \""); },
                                XlateKey(L"[Desktop to Mobile Device] Error: DEVICE DISK FULL."),
                                XlateKey(L"Communication Error."),
                                kTaskCompleteDt2Ce};
constexpr PassKind kToPc = {&SyncTask::device,
                            &SyncTask::pc,
                            false,
                            L" [Device]",
                            L" [PC]",
                            [] { return Xlate(L"[Mobile Device to Desktop] File copy: \""); },
                            XlateKey(L"[Mobile Device to Desktop] Error: PC DISK FULL."),
                            XlateKey(L"Communication Error"),
                            kTaskCompleteCe2Dt};

// One run of a pass, on the worker's thread.
class SyncPass {
  public:
    SyncPass(SyncTask& task, const PassKind& kind)
        : task_(task),
          kind_(kind),
          source_(task.*kind.source),
          target_(task.*kind.target),
          index_(target_.listing.table, target_.listing.rows),
          // A PC listing that broke off lacks files that are there: none of them is replaced without a
          // backup.
          make_backup_(task.overwrite_bkp || (!kind.to_device && !target_.listing.complete)) {
        if (task_.overwrite_warn) {
            ask_replace_ = [this](std::wstring_view name) { return AskReplace(name); };
        }
    }

    PassEnd Run() {
        for (std::int32_t row = 0; row < source_.listing.rows && !task_.cancelled; ++row) {
            const PassEnd end = HandleRow(static_cast<std::size_t>(row));
            if (end != PassEnd::kComplete) {
                return end;
            }
        }
        return task_.cancelled ? PassEnd::kCancelled : PassEnd::kComplete;
    }

  private:
    // kComplete when the pass goes on.
    PassEnd HandleRow(std::size_t row) {
        const std::wstring_view name = source_.listing.table.names[row];
        const FILETIME& write_time = source_.listing.table.write_times[row];
        if (ShouldSkipCopy(task_.overwrite_old_files, write_time, name, index_, ask_replace_)) {
            Report(kIncrementProgress);
            return PassEnd::kComplete;
        }
        if (source_.listing.table.kinds[row] != kKindFile || !PassesExtensionFilter(name, task_.types)) {
            return PassEnd::kComplete;
        }
        return CopyRow(name, write_time);
    }

    PassEnd CopyRow(std::wstring_view name, const FILETIME& write_time) {
        const EntryCopy entry = {task_.pc.folder, task_.device.folder, name, kind_.to_device};
        const HANDLE cancel = task_.copy_cancel_event;
        const bool can_copy = CanCopyEntry(entry, kind_.to_device && make_backup_);
        if (can_copy) {
            EnsureTargetFolder(entry, cancel, /*nested=*/false);
        }
        Report(kAddInfoDisplay, CopyLine(name));
        const DeviceResult result = can_copy ? CopyFile(entry, write_time, cancel) : DeviceResult::kFailed;
        if (result == DeviceResult::kDiskFull) {
            Report(kAddInfoDisplay, Xlate(kind_.disk_full));
            return PassEnd::kDiskFull;
        }
        if (result != DeviceResult::kDone) {
            Report(kErrorInfoDisplay, Xlate(kind_.failure));
        }
        CopyCompanionFolder(entry, cancel, /*nested=*/false);
        return PassEnd::kComplete;
    }

    DeviceResult CopyFile(const EntryCopy& entry, const FILETIME& write_time, HANDLE cancel) const {
        return kind_.to_device ? CopyPcFileToDeviceWithBackup(write_time, entry.PcPath(), entry.DevicePath(),
                                                              cancel, make_backup_)
                               : CopyDeviceFileToPcWithBackup(write_time, entry.DevicePath(), entry.PcPath(),
                                                              cancel, false, make_backup_);
    }

    // The question has no owner window: it stands above all windows, whatever the dialog does meanwhile.
    bool AskReplace(std::wstring_view name) const {
        const std::wstring text = ReplaceQuestion(target_.folder + std::wstring(name) + kind_.target_label,
                                                  source_.folder + std::wstring(name) + kind_.source_label);
        return ui::ShowMessageBox(nullptr, text,
                                  MB_OKCANCEL | MB_ICONQUESTION | MB_DEFBUTTON2 | MB_SYSTEMMODAL,
                                  Xlate(L"Synchronization - Warning")) == IDOK;
    }

    std::wstring CopyLine(std::wstring_view name) const {
        return kind_.copy_line() + std::wstring(name) + L'"';
    }

    void Report(std::wstring_view command, std::wstring info_text = {}) {
        task_.reports.Push({.command = command, .info_text = std::move(info_text)});
    }

    SyncTask& task_;
    const PassKind& kind_;
    const SyncSide& source_;
    const SyncSide& target_;
    FileIndex index_;
    const bool make_backup_;
    std::function<bool(std::wstring_view)> ask_replace_;  // Empty when the user wants no warning.
};

void RunPass(void* task, const PassKind& kind) noexcept {
    auto& sync_task = *static_cast<SyncTask*>(task);
    PassEnd end = PassEnd::kOutOfMemory;
    try {
        sync_task.copy_cancel_event = NewManualResetEvent().Release();
        end = SyncPass(sync_task, kind).Run();
    } catch (...) {
        // Out of memory: what was copied stays.
    }
    const std::wstring_view command = end == PassEnd::kComplete ? kind.completion : kTaskEnded;
    sync_task.reports.PushLast({.command = command, .end = end});
}

}  // namespace

DWORD WINAPI SyncThreadDT2CE(void* task) noexcept {
    RunPass(task, kToDevice);
    return 0;
}

DWORD WINAPI SyncThreadCE2DT(void* task) noexcept {
    RunPass(task, kToPc);
    return 0;
}

}  // namespace orvane
