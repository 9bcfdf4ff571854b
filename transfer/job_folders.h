// Reading both job folders for a dialog.
#pragma once

#include <windows.h>

#include <functional>

#include "device/device_tree_reader.h"
#include "qelutils/xlate.h"
#include "selection/job_table.h"
#include "settings/settings_store.h"
#include "ui/waiting.h"

namespace orvane {

// Reads the device's job folder and then the PC's on a worker, after which `build` runs there, too. Meanwhile
// the dialog paints, and its close box and Escape end the reading (see ui::RunAndPaint). When no device
// folder is in memory the store is asked again, and what it knows is left in `settings`: an empty folder
// would come to mean the device's whole storage.
//
// kFailed has been told to the user in a box, with `device_unread` for the device's folder; `build` has not
// run then.
ui::Waited ReadJobFolders(HWND dialog, SyncSettings& settings, DeviceTreeReader& reader,
                          qel_text::TextKey device_unread, JobTable& pc, JobTable& device,
                          const std::function<void()>& build);

}  // namespace orvane
