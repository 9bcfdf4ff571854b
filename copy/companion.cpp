#include "copy/companion.h"

#include <algorithm>
#include <string_view>

#include "copy/file_copy.h"
#include "copy/target_path.h"
#include "device/device_listing.h"
#include "device/remote_api.h"
#include "selection/copy_rules.h"
#include "selection/job_table.h"

namespace orvane {

namespace {

// Results after which there is no use in going on with the next file.
bool EndsWalk(DeviceResult result, const CancelEvent& cancel) {
    return (result != DeviceResult::kDone && result != DeviceResult::kFailed) ||
           (result == DeviceResult::kFailed && !IsDeviceThere(cancel));
}

// One walk, in the session that the caller of it holds.
class CompanionCopy {
  public:
    CompanionCopy(const EntryPaths& folder, const CopyContext& context, const CompanionRules& rules,
                  const FileNode& source, const FileNode& target)
        : folder_(folder),
          context_(context),
          rules_(rules),
          source_(source),
          target_(target),
          index_(target_.table, target_.rows),
          is_whole_(!source.unread && !target.unread && source_.IsComplete()) {}

    DeviceResult Run() {
        if (to_device_ || source_.rows > 0) {
            CreateFolder(folder_);
        }
        DeviceResult first = is_whole_ ? DeviceResult::kDone : DeviceResult::kFailed;
        for (std::int32_t row = 0; row < source_.rows; ++row) {
            if (target_.IsUnknown(source_.table.names[static_cast<std::size_t>(row)])) {
                first = DeviceResult::kFailed;  // Nothing is known of what stands there.
                continue;
            }
            const DeviceResult result = CopyRow(static_cast<std::size_t>(row));
            first = first == DeviceResult::kDone ? result : first;
            if (EndsWalk(result, context_.cancel)) {
                break;
            }
        }
        return first;
    }

  private:
    DeviceResult CopyRow(std::size_t row) {
        const std::wstring_view name = source_.table.names[row];
        const bool is_folder = source_.table.kinds[row] == kKindFolder;
        const std::int32_t target_row = index_.Find(name);
        const bool is_below_a_file = !blocked_.empty() && name.starts_with(blocked_);
        if (is_below_a_file) {
            return DeviceResult::kDone;
        }
        if (target_row >= 0 &&
            target_.table.kinds[static_cast<std::size_t>(target_row)] != source_.table.kinds[row]) {
            if (is_folder) {
                blocked_.assign(name).append(1, L'\\');
            }
            return DeviceResult::kDone;
        }
        const bool with_backup = target_row >= 0 && !is_folder && context_.old_file == OldFile::kKept;
        const EntryPaths paths = folder_ + name;
        if (!CanCopy(paths, name, context_.direction, with_backup)) {
            return DeviceResult::kDone;
        }
        if (is_folder) {
            if (to_device_ || HasEntries(row)) {
                CreateFolder(paths);
            }
            return DeviceResult::kDone;
        }
        const FileToCopy file = {paths, source_.table.write_times[row], source_.table.sizes[row],
                                 index_.WriteTimeOf(name)};
        return IsDue(name, file) ? CopyFile(file) : DeviceResult::kDone;
    }

    bool IsDue(std::wstring_view name, const FileToCopy& file) const {
        return !IsAside(name) && !PassesExtensionFilter(name, rules_.own_rows) &&
               (!file.target_time ||
                Replaces(rules_.overwrite_old_files, file.write_time, *file.target_time));
    }

    DeviceResult CopyFile(const FileToCopy& file) const {
        return to_device_ ? CopyPcFileToDevice(file, context_).result
                          : CopyDeviceFileToPc(file, context_).result;
    }

    // Rows are in depth-first order: what lies in a folder comes right behind it.
    bool HasEntries(std::size_t folder_row) const {
        const std::wstring_view folder = source_.table.names[folder_row];
        return folder_row + 1 < source_.table.names.size() &&
               source_.table.names[folder_row + 1].size() > folder.size() &&
               source_.table.names[folder_row + 1].starts_with(folder) &&
               source_.table.names[folder_row + 1][folder.size()] == L'\\';
    }

    // An existing folder is fine.
    void CreateFolder(const EntryPaths& paths) const {
        if (to_device_) {
            CeCreateDirectory(PathBuffer(paths.device).Get(), nullptr);
        } else {
            CreateDirectoryW(paths.pc.c_str(), nullptr);
        }
    }

    const EntryPaths& folder_;
    const CopyContext& context_;
    const CompanionRules& rules_;
    const JobTable source_;
    const JobTable target_;
    const FileIndex index_;
    const bool is_whole_;  // Whether all of it, and of where it goes, could be listed.
    const bool to_device_ = context_.direction == Direction::kPcToDevice;
    std::wstring blocked_;  // The folder last met that is a file on the other side, with a "\" at its end.
};

DeviceResult ListDeviceTree(const std::wstring& folder, const CancelEvent& cancel, FileNode& root) {
    return ListDeviceFolder(folder, {}, true, root, cancel);
}

}  // namespace

DeviceResult CopyPcFolderToDevice(const EntryPaths& folder, const CopyContext& context,
                                  const CompanionRules& rules) {
    const FileNode source = ListPcTree(folder.pc, context.cancel);
    if (context.cancel.IsSignalled()) {
        return DeviceResult::kListingCancelled;
    }
    // A target that cannot be listed counts as empty: no copy replaces what no listing has shown.
    FileNode target;
    if (ListDeviceTree(folder.device, context.cancel, target) == DeviceResult::kListingCancelled) {
        return DeviceResult::kListingCancelled;
    }
    return CompanionCopy(folder, context, rules, source, target).Run();
}

DeviceResult CopyDeviceFolderToPc(const EntryPaths& folder, const CopyContext& context,
                                  const CompanionRules& rules) {
    const DeviceSession session(context.cancel, context.session);
    const FileNode target = ListPcTree(folder.pc, context.cancel);
    if (!session) {
        return DeviceResult::kFailed;
    }
    FileNode source;
    const DeviceResult listed = ListDeviceTree(folder.device, context.cancel, source);
    if (listed != DeviceResult::kDone) {
        const FoundEntry found = Side::Device().Find(folder.device);
        const bool is_absent = found.kind == EntryKind::kNone && Side::Device().SaysNothingIsThere();
        return listed == DeviceResult::kFailed && is_absent ? DeviceResult::kDone : listed;
    }
    CopyContext in_session = {context.direction, context.purpose, Session::kCallers, context.old_file,
                              context.cancel};
    return CompanionCopy(folder, in_session, rules, source, target).Run();
}

}  // namespace orvane
