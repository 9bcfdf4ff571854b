#include "selection/entry_copy.h"

#include "device/device_path.h"
#include "device/ensure_folder.h"
#include "device/folder_copy.h"
#include "platform/paths.h"
#include "selection/copy_rules.h"
#include "selection/job_table.h"

namespace orvane {

bool CanCopyEntry(const EntryCopy& entry, bool with_device_backup) {
    return IsPcFolderNamed(entry.pc_folder) && PcPathFits(entry.PcPath().size()) &&
           DevicePathFits(entry.DevicePath().size(), with_device_backup) &&
           (entry.to_device || IsSafePcRelativePath(entry.name));
}

void EnsureTargetFolder(const EntryCopy& entry, HANDLE cancel_event, bool nested) {
    if (!entry.to_device) {
        EnsurePcFolder(std::wstring(ParentPath(entry.PcPath())));
    } else if (nested) {
        EnsureDeviceFolderInSession(ParentPath(entry.DevicePath()));
    } else {
        EnsureDeviceFolder(ParentPath(entry.DevicePath()), cancel_event);
    }
}

void CopyCompanionFolder(const EntryCopy& entry, HANDLE cancel_event, bool nested) {
    if (!HasCompanionFolder(entry.name)) {
        return;
    }
    EntryCopy companion = entry;
    companion.name = CompanionFolder(entry.name);
    if (!IsSafePcRelativePath(companion.name) || !CanCopyEntry(companion, /*with_device_backup=*/false)) {
        return;
    }
    if (!entry.to_device) {
        CopyDeviceFolderToPc(companion.DevicePath(), companion.PcPath(), cancel_event, nested);
    } else if (PcEntry(companion.PcPath()) == EntryKind::kFolder) {
        CopyPcFolderToDevice(companion.PcPath(), companion.DevicePath(), cancel_event);
    }
}

}  // namespace orvane
