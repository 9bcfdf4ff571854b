// Copying the files that the user picked in the manual view.
#pragma once

#include <windows.h>

#include <string>
#include <vector>

#include "transfer/copy_progress.h"

namespace orvane {

// What to copy.
struct TransferRequest {
    CopyDirection direction;
    std::wstring pc_folder;  // Job folders; an empty PC folder is none, an empty device folder is the root.
    std::wstring device_folder;
    std::vector<std::wstring> names;  // Below the job folder, without "\" in front; copied in this order.
    bool warn_before_replacing;
    HANDLE stop_event;  // For all operations on the device; not owned.
};

// What came of it.
struct TransferOutcome {
    std::vector<std::wstring> copied;  // In the order of the request.
    bool disk_full = false;            // The target's disk is full, which ended the copy.
};

// Copies one file after the other and shows each in `progress`; the caller holds a device session on this
// thread. A file that fails or that the user wants to keep does not stop the others; a full disk and the
// user's stop do. Every old file is kept under a backup name. A ".wkf" job file takes the folder of its name
// along. A name that one side cannot hold as a path, or the PC as names of ordinary files, is a failure, so
// that nothing is written outside the job folders.
TransferOutcome CopySelectedFiles(const TransferRequest& request, const CopyProgress& progress);

}  // namespace orvane
