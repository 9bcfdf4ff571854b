// Copies of single files between the PC and the device, in chunks of 8192 bytes.
//
// Paths are absolute. A device path must satisfy DevicePathFits (device/device_path.h): one that does not
// ends the process. The cancel event belongs to the caller and is polled before the first chunk and after
// every full one; a copy that opens its own session also stops connecting when the event is signalled. A
// nested copy works in the session that its caller holds on the same thread; any other opens one and closes
// it again before it returns. Any thread may copy, but no two to the same target at once. Nothing is ever
// shown.
//
// Results: kDone; kCancelled when the event was found signalled (but kFailed when that was already so while
// the copy connected); kDiskFull when a write failed with error 112 in one of the copies that tell it;
// kFailed for all else. After any result but kDone the partial target is gone, unless the device no longer
// answers. No old file is touched before the source is open: after a failure up to there the target is what
// it was. A backup (see device/backup_name.h) is made before the target is created and stays, whatever
// becomes of the copy; when it is asked for and cannot be made, the copy is not begun and the old file stays
// as it was. A target that is to be stamped is dated 1990-01-01 until it is complete: a partial file that a
// lost device keeps so counts as older than the whole one on the other side.
#pragma once

#include <windows.h>

#include <string>

#include "device/result_codes.h"

namespace orvane {

// Opens a file on the device; unless `nested` a session is opened for it, which stays open with the file and
// which the caller closes with CeRapiUninit after it has closed the file with CeCloseHandle (or with
// DeleteDeviceFileAfterClose, which does all that). INVALID_HANDLE_VALUE when there is no connection or the
// device refuses; no session is left open then. As CeCreateFile it gives null when that is missing.
HANDLE OpenDeviceFile(const std::wstring& device_path, DWORD access, DWORD share_mode, DWORD creation,
                      HANDLE cancel_event, bool nested);

// Closes the file, deletes it by its path and closes the session in every case, a caller's too. Returns what
// CeDeleteFile answered.
BOOL DeleteDeviceFileAfterClose(HANDLE file, const std::wstring& device_path);

// Plain copies: no backup, no time stamp, a full disk is kFailed.
DeviceResult CopyPcFileToDevice(const std::wstring& pc_path, const std::wstring& device_path,
                                HANDLE cancel_event);
DeviceResult CopyDeviceFileToPc(const std::wstring& device_path, const std::wstring& pc_path,
                                HANDLE cancel_event, bool nested);

// Copies of the synchronization: a backup if asked for; `last_write_time` is stamped on the target, whose
// other times are left to the system; they tell a full disk.
DeviceResult CopyPcFileToDeviceWithBackup(const FILETIME& last_write_time, const std::wstring& pc_path,
                                          const std::wstring& device_path, HANDLE cancel_event,
                                          bool make_backup);
DeviceResult CopyDeviceFileToPcWithBackup(const FILETIME& last_write_time, const std::wstring& device_path,
                                          const std::wstring& pc_path, HANDLE cancel_event, bool nested,
                                          bool make_backup);

// Copies of the manual view, always in the caller's session: every old file is kept as a backup; creation,
// last-access and last-write time are the source's; they tell a full disk. To the device, a source that
// cannot be opened and a target that cannot be created give kDone.
DeviceResult TransferPcFileToDevice(const std::wstring& pc_path, const std::wstring& device_path,
                                    HANDLE cancel_event);
DeviceResult TransferDeviceFileToPc(const std::wstring& device_path, const std::wstring& pc_path,
                                    HANDLE cancel_event);

}  // namespace orvane
