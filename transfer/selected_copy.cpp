#include "transfer/selected_copy.h"

#include <optional>

#include "device/connect.h"
#include "device/file_copy.h"
#include "device/remote_api.h"
#include "platform/handles.h"
#include "platform/paths.h"
#include "selection/copy_rules.h"
#include "selection/entry_copy.h"

namespace orvane {

namespace {

// The last-write time of a file that can be opened for reading; 0 if it cannot be told.
std::optional<FILETIME> PcWriteTime(const std::wstring& path) {
    const UniqueFile file(
        CreateFileW(path.c_str(), GENERIC_READ, 0, nullptr, OPEN_EXISTING, FILE_ATTRIBUTE_NORMAL, nullptr));
    if (!file) {
        return std::nullopt;
    }
    FILETIME write_time{};
    GetFileTime(file.Get(), nullptr, nullptr, &write_time);
    return write_time;
}

std::optional<FILETIME> DeviceWriteTime(const std::wstring& path, HANDLE stop_event) {
    const HANDLE file = OpenDeviceFile(path, GENERIC_READ, FILE_SHARE_READ, OPEN_EXISTING, stop_event,
                                       /*nested=*/true);
    if (file == INVALID_HANDLE_VALUE || file == nullptr) {
        return std::nullopt;
    }
    FILETIME creation{};
    FILETIME last_access{};
    FILETIME last_write{};
    CeGetFileTime(file, &creation, &last_access, &last_write);
    CeCloseHandle(file);
    return last_write;
}

// One run, on the thread that holds the session.
class SelectedCopy {
  public:
    SelectedCopy(const TransferRequest& request, const CopyProgress& progress)
        : request_(request),
          progress_(progress),
          to_device_(request.direction == CopyDirection::kPcToDevice),
          pc_folder_(WithTrailingBackslash(request.pc_folder)),
          device_folder_(WithTrailingBackslash(request.device_folder)) {}

    TransferOutcome Run() {
        TransferOutcome outcome;
        const int count = static_cast<int>(request_.names.size());
        for (int index = 0; index < count && !outcome.disk_full && progress_.MayGoOn(); ++index) {
            const std::wstring& name = request_.names[static_cast<std::size_t>(index)];
            progress_.ShowFile(to_device_ ? pc_folder_ : device_folder_,
                               to_device_ ? device_folder_ : pc_folder_, name, index, count);
            const DeviceResult result = CopyOne(name);
            if (result == DeviceResult::kDone) {
                outcome.copied.push_back(name);
            }
            outcome.disk_full = result == DeviceResult::kDiskFull;
        }
        return outcome;
    }

  private:
    // A file that the user keeps counts as one that failed: it stays listed.
    DeviceResult CopyOne(const std::wstring& name) const {
        const EntryCopy entry = {pc_folder_, device_folder_, name, to_device_};
        if (!CanCopyEntry(entry, /*with_device_backup=*/to_device_)) {
            return DeviceResult::kFailed;
        }
        const HANDLE stop = request_.stop_event;
        const std::wstring pc_path = entry.PcPath();
        const std::wstring device_path = entry.DevicePath();
        EnsureTargetFolder(entry, stop, /*nested=*/true);
        if (request_.warn_before_replacing && !MayReplace(pc_path, device_path)) {
            return DeviceResult::kFailed;
        }
        const DeviceResult result = to_device_ ? TransferPcFileToDevice(pc_path, device_path, stop)
                                               : TransferDeviceFileToPc(device_path, pc_path, stop);
        if (result == DeviceResult::kDone) {
            CopyCompanionFolder(entry, stop, /*nested=*/true);
        }
        return result;
    }

    // Whether the target may be replaced; true when there is none. Asks the user about two versions. A source
    // that cannot be opened is left, so the side that cannot be opened decides.
    bool MayReplace(const std::wstring& pc_path, const std::wstring& device_path) const {
        // A session within the caller's. That it may fail is not looked at: the caller's still stands.
        const DeviceSession session(request_.stop_event);
        const std::optional<FILETIME> pc_time = PcWriteTime(pc_path);
        if (!pc_time) {
            return !to_device_;
        }
        const std::optional<FILETIME> device_time = DeviceWriteTime(device_path, request_.stop_event);
        if (!device_time) {
            return to_device_;
        }
        if (IsSameVersion(*pc_time, *device_time, kSameVersionSecondsReplaceCheck)) {
            return true;
        }
        const std::wstring pc_text = pc_path + L" [ PC ]";
        const std::wstring device_text = device_path + L" [ DEVICE ]";
        return progress_.AskReplace(to_device_ ? ReplaceQuestion(device_text, pc_text)
                                               : ReplaceQuestion(pc_text, device_text));
    }

    const TransferRequest& request_;
    const CopyProgress& progress_;
    const bool to_device_;
    const std::wstring pc_folder_;
    const std::wstring device_folder_;
};

}  // namespace

TransferOutcome CopySelectedFiles(const TransferRequest& request, const CopyProgress& progress) {
    return SelectedCopy(request, progress).Run();
}

}  // namespace orvane
