#include "transfer/selected_copy.h"

#include <optional>

#include "copy/entry_copy.h"
#include "copy/target_folder.h"
#include "copy/target_path.h"
#include "device/connect.h"
#include "device/remote_api.h"
#include "platform/paths.h"
#include "selection/copy_rules.h"

namespace orvane {

namespace {

// The last-write time of a file that can be opened for reading; 0 if it cannot be told.
std::optional<FILETIME> WriteTimeOf(const Side& side, const std::wstring& path) {
    const SideFile file(side, side.OpenSource(path));
    if (!file) {
        return std::nullopt;
    }
    FileTimes times{};
    side.GetTimes(file.Get(), times);
    return times.last_write;
}

// One run, on the thread that holds the session.
class SelectedCopy {
  public:
    SelectedCopy(const TransferRequest& request, const CopyProgress& progress)
        : request_(request),
          progress_(progress),
          folders_{WithTrailingBackslash(request.folders.pc), WithTrailingBackslash(request.folders.device)},
          context_{request.direction, Purpose::kManualView, Session::kCallers, OldFile::kKept, request.stop} {
    }

    TransferOutcome Run() {
        const int count = static_cast<int>(request_.files.size());
        for (int index = 0; index < count && !HasEnded() && progress_.MayGoOn(); ++index) {
            const sFileDate& file = request_.files[static_cast<std::size_t>(index)];
            progress_.ShowFile(folders_.Source(request_.direction), folders_.Target(request_.direction),
                               file.first_text, index, count);
            CopyOne(file);
        }
        return std::move(outcome_);
    }

  private:
    // A file that the user keeps, or that fails, stays listed.
    void CopyOne(const sFileDate& entry) {
        const std::wstring& name = entry.first_text;
        const FileToCopy file = {folders_ + name, entry.write_time, entry.size, entry.target_time};
        if (!CanCopy(file.paths, name, request_.direction, entry.target_time.has_value())) {
            return;
        }
        EnsureTargetFolder(file.paths, context_);
        if (request_.warn_before_replacing && !MayReplace(file.paths)) {
            return;
        }
        const CopyOutcome copied = CopyEntry(file, name, context_, request_.companions);
        outcome_.disk_full = copied.result == DeviceResult::kDiskFull;
        outcome_.connection_lost = copied.result == DeviceResult::kFailed && !IsDeviceThere(request_.stop);
        // Meant: to the device, what could not even be begun counts as copied.
        const bool counts_as_copied = !copied.begun && context_.direction == Direction::kPcToDevice;
        if (copied.result == DeviceResult::kDone || (counts_as_copied && !HasEnded())) {
            outcome_.copied.push_back(name);
        }
    }

    bool HasEnded() const { return outcome_.disk_full || outcome_.connection_lost; }

    // Whether the target may be replaced; true when there is none. Asks the user about two versions. A source
    // that cannot be opened is left, so the side that cannot be opened decides.
    bool MayReplace(const EntryPaths& paths) {
        const bool to_device = request_.direction == Direction::kPcToDevice;
        const DeviceSession session(request_.stop);  // Within the caller's.
        outcome_.connection_lost = !session;
        const std::optional<FILETIME> pc_time = WriteTimeOf(Side::Pc(), paths.pc);
        if (!session || !pc_time) {
            return session && !to_device;
        }
        const std::optional<FILETIME> device_time = WriteTimeOf(Side::Device(), paths.device);
        if (!device_time) {
            return to_device;
        }
        if (IsSameVersion(*pc_time, *device_time, kSameVersionSecondsReplaceCheck)) {
            return true;
        }
        const std::wstring pc_text = paths.pc + L" [ PC ]";
        const std::wstring device_text = paths.device + L" [ DEVICE ]";
        return progress_.AskReplace(to_device ? ReplaceQuestion(device_text, pc_text)
                                              : ReplaceQuestion(pc_text, device_text));
    }

    const TransferRequest& request_;
    const CopyProgress& progress_;
    const EntryPaths folders_;
    const CopyContext context_;
    TransferOutcome outcome_;
};

}  // namespace

TransferOutcome CopySelectedFiles(const TransferRequest& request, const CopyProgress& progress) {
    return SelectedCopy(request, progress).Run();
}

}  // namespace orvane
