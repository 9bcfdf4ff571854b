#include "transfer/job_folders.h"

#include <optional>
#include <utility>

#include "device/file_node.h"
#include "platform/handles.h"
#include "platform/paths.h"
#include "ui/dialog.h"

namespace orvane {

ui::Waited ReadJobFolders(HWND dialog, SyncSettings& settings, DeviceTreeReader& reader,
                          qel_text::TextKey device_unread, JobTable& pc, JobTable& device,
                          const std::function<void()>& build) {
    bool device_read = false;
    bool pc_read = false;
    const auto read = [&] {
        std::wstring& folder = settings.sync_path_ce;
        if (folder.empty()) {
            folder = FindDeviceJobFolder(reader.StopEvent());
        }
        FileNode root;
        device_read =
            !folder.empty() && reader.ReadDeviceTree(WithTrailingBackslash(folder), {}, root, dialog);
        if (!device_read || IsSignalled(reader.StopEvent())) {
            return;
        }
        device = JobTable(root);
        std::optional<JobTable> listed = ListPcJobFolder(settings.sync_path_dt, reader.StopEvent());
        pc_read = listed.has_value();
        if (pc_read) {
            pc = std::move(*listed);
            build();
        }
    };
    ui::Waited waited = ui::Waited::kFailed;
    {
        const ui::WaitCursor wait;
        waited = ui::RunAndPaint(read, reader.StopEvent(), DeviceTreeReader::kStackBytes);
    }
    if (waited == ui::Waited::kClosed || (waited == ui::Waited::kDone && pc_read)) {
        return waited;
    }
    ui::ShowMessageBox(dialog,
                       device_read ? UnreadableFolderText(settings.sync_path_dt) : Xlate(device_unread));
    return ui::Waited::kFailed;
}

}  // namespace orvane
