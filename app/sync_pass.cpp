#include "app/sync_pass.h"

#include <functional>
#include <string>
#include <string_view>
#include <utility>

#include "app/sync_task.h"
#include "copy/entry_copy.h"
#include "copy/target_folder.h"
#include "copy/target_path.h"
#include "device/connect.h"
#include "qelutils/xlate.h"
#include "selection/copy_rules.h"
#include "ui/dialog.h"

namespace orvane {

namespace {

// What tells one pass from the other.
struct PassKind {
    SyncSide SyncTask::*source;
    SyncSide SyncTask::*target;
    Direction direction;
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
                                Direction::kPcToDevice,
                                L" [PC]",
                                L" [Device]",
                                [] { return std::wstring(L"[Desktop to Mobile Device] File copy: \""); },
                                XlateKey(L"[Desktop to Mobile Device] Error: DEVICE DISK FULL."),
                                XlateKey(L"Communication Error."),
                                kTaskCompleteDt2Ce};
constexpr PassKind kToPc = {&SyncTask::device,
                            &SyncTask::pc,
                            Direction::kDeviceToPc,
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
          folders_{task.pc.folder, task.device.folder},
          context_{kind.direction, Purpose::kPass, Session::kOwn,
                   task.overwrite_bkp ? OldFile::kKept : OldFile::kReplaced, task.cancel},
          companions_{task.overwrite_old_files, task.types},
          index_(target_.listing.table, target_.listing.rows) {
        if (task_.overwrite_warn) {
            // Asked is only about files that would be copied. (A folder has no time by which it could be
            // newer.) All others come to the gates behind the question, which pass over them.
            ask_replace_ = [this](std::wstring_view name) {
                return !WouldBeCopied(name) || AskReplace(name);
            };
        }
    }

    PassEnd Run() {
        for (std::int32_t row = 0; row < source_.listing.rows && !task_.cancel.WasSignalled(); ++row) {
            const PassEnd end = HandleRow(static_cast<std::size_t>(row));
            if (end != PassEnd::kComplete) {
                return end;
            }
        }
        return task_.cancel.WasSignalled() ? PassEnd::kCancelled : PassEnd::kComplete;
    }

  private:
    // kComplete when the pass goes on.
    PassEnd HandleRow(std::size_t row) {
        const FileTable& table = source_.listing.table;
        const std::wstring_view name = table.names[row];
        if (target_.listing.IsUnknown(name) ||
            ShouldSkipCopy(task_.overwrite_old_files, table.write_times[row], name, index_, ask_replace_)) {
            Report(kIncrementProgress);
            return PassEnd::kComplete;
        }
        if (table.kinds[row] != kKindFile || !PassesExtensionFilter(name, task_.types)) {
            return PassEnd::kComplete;
        }
        return CopyRow(row);
    }

    PassEnd CopyRow(std::size_t row) {
        const std::wstring_view name = source_.listing.table.names[row];
        const FileToCopy file = {folders_ + name, source_.listing.table.write_times[row],
                                 source_.listing.table.sizes[row], index_.WriteTimeOf(name)};
        const bool keeps_backup = file.target_time && context_.old_file == OldFile::kKept;
        // What fails here must not reach an operation on the device.
        const bool can_copy = CanCopy(file.paths, name, kind_.direction, keeps_backup);
        const bool has_folder = can_copy && EnsureTargetFolder(file.paths, context_);
        Report(kAddInfoDisplay, kind_.copy_line() + std::wstring(name) + L'"');
        const DeviceResult result =
            has_folder ? CopyEntry(file, name, context_, companions_).result : DeviceResult::kFailed;
        if (result == DeviceResult::kDiskFull) {
            Report(kAddInfoDisplay, Xlate(kind_.disk_full));
            return PassEnd::kDiskFull;
        }
        if (result != DeviceResult::kDone) {
            Report(kErrorInfoDisplay, Xlate(kind_.failure));
            // A cancelled run opens no session, which tells nothing of the connection.
            if (can_copy && !IsDeviceThere(task_.cancel) && !task_.cancel.WasSignalled()) {
                Report(kAddInfoDisplay, Xlate(L"Communication Error."));
                return PassEnd::kConnectionLost;
            }
        }
        return PassEnd::kComplete;
    }

    // Of a row whose target may be replaced.
    bool WouldBeCopied(std::wstring_view name) const {
        const std::int32_t row = index_.Find(name);
        return PassesExtensionFilter(name, task_.types) && row >= 0 &&
               target_.listing.table.kinds[static_cast<std::size_t>(row)] == kKindFile &&
               CanCopy(folders_ + name, name, kind_.direction, context_.old_file == OldFile::kKept);
    }

    // The question has no owner window: it stands above all windows, whatever the dialog does meanwhile.
    bool AskReplace(std::wstring_view name) const {
        const std::wstring text = ReplaceQuestion(target_.folder + std::wstring(name) + kind_.target_label,
                                                  source_.folder + std::wstring(name) + kind_.source_label);
        return ui::ShowMessageBox(nullptr, text,
                                  MB_OKCANCEL | MB_ICONQUESTION | MB_DEFBUTTON2 | MB_SYSTEMMODAL,
                                  Xlate(L"Synchronization - Warning")) == IDOK;
    }

    void Report(std::wstring_view command, std::wstring info_text = {}) {
        task_.reports.Push({.command = command, .info_text = std::move(info_text)});
    }

    SyncTask& task_;
    const PassKind& kind_;
    const SyncSide& source_;
    const SyncSide& target_;
    const EntryPaths folders_;
    const CopyContext context_;
    const CompanionRules companions_;
    const FileIndex index_;
    std::function<bool(std::wstring_view)> ask_replace_;  // Empty when the user wants no warning.
};

void RunPass(void* task, const PassKind& kind) noexcept {
    auto& sync_task = *static_cast<SyncTask*>(task);
    PassEnd end = PassEnd::kOutOfMemory;
    try {
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
