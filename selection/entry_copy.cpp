#include "selection/entry_copy.h"

#include "device/device_path.h"
#include "device/ensure_folder.h"
#include "device/folder_copy.h"
#include "jobs/file_types.h"
#include "platform/paths.h"
#include "selection/job_table.h"

namespace orvane {

namespace {

// Whether the entry, or a folder on the way to it from the PC folder, goes by the short name that the PC has
// given to another one.
bool LeadsThroughShortName(const EntryCopy& entry) {
    if (entry.name.find(L'~') == std::wstring_view::npos) {
        return false;
    }
    const std::wstring path = entry.PcPath();
    for (std::size_t end = entry.pc_folder.size(); end != std::wstring::npos;) {
        end = path.find(L'\\', end + 1);
        if (IsShortNameOfAnother(path.substr(0, end))) {
            return true;
        }
    }
    return false;
}

}  // namespace

bool CanCopyEntry(const EntryCopy& entry, bool with_device_backup) {
    return IsPcFolderNamed(entry.pc_folder) && PcPathFits(entry.PcPath().size()) &&
           DevicePathFits(entry.DevicePath().size(), with_device_backup) &&
           (entry.to_device || (IsSafePcRelativePath(entry.name) && !LeadsThroughShortName(entry)));
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
