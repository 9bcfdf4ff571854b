// Copies of single files between the PC and the device.
//
// The promise, in both directions: a name never stands for part of a file, and nothing is replaced unseen.
// - A copy is written beside its target under a name of its own (AsidePath), dated and closed there, and only
//   then takes the target's name. Until that moment an old file is untouched under its own name. A copy that
//   fails or is cancelled removes what it has written; one whose process or device is gone leaves at most
//   that file, which the next copy to the same target replaces and nothing else ever reads.
// - Right before the target is replaced its write time is looked at again. If that is not the listed one, or
//   there is a target where none was listed, the target is left alone and the copy fails.
// - A backup is made when the new file is whole. If the last step then fails, the old file gets its name
// back.
//   Where no backup is asked for, the PC replaces in one step; on the device, whose move does not replace,
//   the old file is deleted first, and what may be left then is a whole copy beside the name.
// - A source that ends before its size was reached is a failure. One that has grown is copied as far as it
//   goes and has the listed time, so that it is found newer the next time.
// - Nothing is flushed to the disk ahead of its time: to wait for that costs a file of 20 KB more than twice
//   the time of its writing. What a power cut leaves is the file system's affair.
// - A target that cannot be dated is not put in place: it would pass for a newer one.
//
// Paths are absolute; the device's must satisfy PathFits (copy/side.h), else the process ends. Any thread may
// copy; of two that copy to one target at the same time the later one fails. Nothing is ever shown.
//
// Results: kDone; kCancelled when the event was found signalled (but kFailed when that was already so while
// the copy connected); kDiskFull when a write failed with error 112; kFailed for all else.
#pragma once

#include <windows.h>

#include <functional>
#include <string>

#include "copy/copy_context.h"
#include "device/result_codes.h"

namespace orvane {

// What has to be done while a whole copy lies beside its target and before it takes the name: any result but
// kDone gives the copy up with that result.
using BeforePlacing = std::function<DeviceResult()>;

struct CopyOutcome {
    DeviceResult result;
    // False when the source could not be opened or nothing created on the target's side.
    bool begun = true;
};

// Copies of a listed file, for a pass or the manual view. The direction is the context's as much as the
// name's.
CopyOutcome CopyPcFileToDeviceWithBackup(const FileToCopy& file, const CopyContext& context,
                                         const BeforePlacing& before_placing = {});
CopyOutcome CopyDeviceFileToPcWithBackup(const FileToCopy& file, const CopyContext& context,
                                         const BeforePlacing& before_placing = {});
// Copies of the files of a companion folder.
CopyOutcome CopyPcFileToDevice(const FileToCopy& file, const CopyContext& context);
CopyOutcome CopyDeviceFileToPc(const FileToCopy& file, const CopyContext& context);

// Opens a file on the device; with Session::kOwn a session is opened for it, which stays open with the file
// and which the caller closes with CeRapiUninit after it has closed the file with CeCloseHandle (or with
// DeleteDeviceFileAfterClose, which does all that). INVALID_HANDLE_VALUE when there is no connection or the
// device refuses; no session is left open then. As CeCreateFile it gives null when that is missing.
HANDLE OpenDeviceFile(const std::wstring& device_path, DWORD access, DWORD share_mode, DWORD creation,
                      const CancelEvent& cancel, Session session);

// Closes the file, deletes it by its path and closes the session in every case, a caller's too. Returns what
// CeDeleteFile answered.
BOOL DeleteDeviceFileAfterClose(HANDLE file, const std::wstring& device_path);

}  // namespace orvane
