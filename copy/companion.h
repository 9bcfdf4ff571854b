// The companion folders of ".wkf" job files: a job's files of any type, which go where the job goes.
//
// A file of a companion is copied when the other side lacks it or, where replacing is allowed, when it is
// newer by the rule for all files (selection/copy_rules.h); it keeps its write time, so that a second run
// finds nothing to do. Compared is with the other side as it is at that moment. What file_copy.h promises
// holds for each of them. Files whose own type takes part are left to their own row of the listing.
//
// The results are those of the file copies, and kListingCancelled: kDone when the companion is whole on the
// other side, else the first one that is not. One file that fails does not end the walk; the cancel event, a
// full disk and a lost connection do. What can never be copied does not count: a path that does not fit, a
// name that the PC cannot hold, a file where the other side has a folder of its name or the other way round.
// A folder that cannot be read, on either side, does: what it holds may be readable the next time. Any thread
// may call.
#pragma once

#include <string>

#include "copy/copy_context.h"
#include "device/result_codes.h"
#include "jobs/file_types.h"

namespace orvane {

// What a companion's copy needs to know beside the context of its files.
struct CompanionRules {
    bool overwrite_old_files;  // Whether an older file may be replaced.
    FileTypes own_rows;        // The types that take part in the run.
};

// Copies the folder tree, empty folders too, in the session that the caller holds. A PC folder that is not
// there is an empty one.
DeviceResult CopyPcFolderToDevice(const EntryPaths& folder, const CopyContext& context,
                                  const CompanionRules& rules);

// Copies the folder tree in one session, the caller's or its own as the context says. A device folder that is
// not there is an empty one; a folder without entries is not created on the PC.
DeviceResult CopyDeviceFolderToPc(const EntryPaths& folder, const CopyContext& context,
                                  const CompanionRules& rules);

}  // namespace orvane
