#include "transfer/job_folders.h"

#include "device/file_node.h"
#include "platform/paths.h"
#include "ui/dialog.h"

namespace orvane {

ui::Waited ReadJobFolders(HWND dialog, SyncSettings& settings, DeviceTreeReader& reader,
                          qel_text::TextKey device_unread, JobTable& pc, JobTable& device,
                          const std::function<void()>& build) {
    bool device_read = false;
    const auto read = [&] {
        std::wstring& folder = settings.sync_path_ce;
        if (folder.empty()) {
            folder = FindDeviceJobFolder();
        }
        FileNode root;
        device_read =
            !folder.empty() && reader.ReadDeviceTree(WithTrailingBackslash(folder), {}, root, dialog);
        if (!device_read || WaitForSingleObject(reader.StopEvent(), 0) == WAIT_OBJECT_0) {
            return;
        }
        device = JobTable(root);
        pc = ListPcJobFolder(settings.sync_path_dt);
        build();
    };
    const ui::Waited waited = ui::RunAndPaint(read, reader.StopEvent(), DeviceTreeReader::kStackBytes);
    if (waited != ui::Waited::kClosed && !device_read) {
        ui::ShowMessageBox(dialog, Xlate(device_unread));
        return ui::Waited::kFailed;
    }
    return waited;
}

}  // namespace orvane
