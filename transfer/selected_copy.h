// Copying the files that the user picked in the manual view.
#pragma once

#include <windows.h>

#include <string>
#include <vector>

#include "copy/companion.h"
#include "copy/copy_context.h"
#include "transfer/candidates.h"
#include "transfer/copy_progress.h"

namespace orvane {

// What to copy.
struct TransferRequest {
    Direction direction;
    // Job folders; an empty PC folder is none. Of an empty device folder nothing is ever listed.
    EntryPaths folders;
    std::vector<sFileDate> files;  // Copied in this order.
    bool warn_before_replacing;
    CompanionRules companions;
    const CancelEvent& stop;  // For all operations on the device.
};

// What came of it.
struct TransferOutcome {
    std::vector<std::wstring> copied;  // Names, in the order of the request.
    // What ended the copy ahead of its end, if anything but the user did.
    bool disk_full = false;        // The target's disk is full.
    bool connection_lost = false;  // The device no longer answers; the file under way counts as not copied.
};

// Copies one file after the other and shows each in `progress`; the caller holds a device session on this
// thread. A file that fails, or that the user wants to keep, does not stop the others; a full disk, a lost
// connection and the user's stop do. Every old file is kept under a backup name; one that is not what was
// listed is left alone. A ".wkf" job file takes the folder of its name along. A file on the PC that has
// disappeared counts as copied, and so does one that the device will not create. A name that one side cannot
// hold as a path, or the PC as names of ordinary files, is a failure, so that nothing is written outside the
// job folders.
TransferOutcome CopySelectedFiles(const TransferRequest& request, const CopyProgress& progress);

}  // namespace orvane
