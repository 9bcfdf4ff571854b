#include "copy/entry_copy.h"

#include "copy/target_path.h"
#include "platform/paths.h"

namespace orvane {

namespace {

// The paths of the companion; nothing when it can never be copied.
std::optional<EntryPaths> CompanionOf(const EntryPaths& file, std::wstring_view name, Direction direction) {
    const std::wstring_view folder = CompanionFolder(name);
    const EntryPaths paths = {std::wstring(CompanionFolder(file.pc)),
                              std::wstring(CompanionFolder(file.device))};
    return IsSafePcRelativePath(folder) && CanCopy(paths, folder, direction, /*with_backup=*/false)
               ? std::optional(paths)
               : std::nullopt;
}

DeviceResult CopyCompanion(const EntryPaths& folder, const CopyContext& context,
                           const CompanionRules& rules) {
    // To the device it is copied in the session of its job file; to the PC that is closed by now, unless it
    // is a caller's.
    const bool to_device = context.direction == Direction::kPcToDevice;
    if (to_device) {
        const EntryKind kind = Side::Pc().Find(folder.pc).kind;
        if (kind != EntryKind::kFolder) {
            const bool has_none = kind == EntryKind::kFile || Side::Pc().SaysNothingIsThere();
            return has_none ? DeviceResult::kDone : DeviceResult::kFailed;
        }
    }
    const CopyContext companion = {context.direction, Purpose::kCompanion,
                                   to_device ? Session::kCallers : context.session, context.old_file,
                                   context.cancel};
    return to_device ? CopyPcFolderToDevice(folder, companion, rules)
                     : CopyDeviceFolderToPc(folder, companion, rules);
}

}  // namespace

CopyOutcome CopyEntry(const FileToCopy& file, std::wstring_view name, const CopyContext& context,
                      const CompanionRules& rules) {
    BeforePlacing copy_companion;
    if (HasCompanionFolder(name)) {
        copy_companion = [&] {
            const auto companion = CompanionOf(file.paths, name, context.direction);
            return companion ? CopyCompanion(*companion, context, rules) : DeviceResult::kDone;
        };
    }
    return context.direction == Direction::kPcToDevice
               ? CopyPcFileToDeviceWithBackup(file, context, copy_companion)
               : CopyDeviceFileToPcWithBackup(file, context, copy_companion);
}

}  // namespace orvane
