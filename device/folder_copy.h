// Copies of whole folder trees between the PC and the device, with the plain copies of device/file_copy.h: no
// backup, no time stamp. A walk goes through each folder in the order in which it is listed, sub-folders
// where they stand, and ends with the first entry that fails: what was copied before stays. An entry whose
// path on the device or on the PC would not fit (see device/device_path.h), or a folder whose path leaves no
// room to search it, fails with kFailed. Any thread may call; the cancel event is the caller's. Results are
// those of the file copies.
#pragma once

#include <windows.h>

#include <string>

#include "device/result_codes.h"

namespace orvane {

// Copies the tree in one session, the caller's if `nested`. A folder without entries is not created on the
// PC; a folder whose name the PC cannot hold as such, or a file, fails like one that cannot be copied. The
// result of a refused listing is kFailed; kListingCancelled when the event was found signalled ahead of one.
DeviceResult CopyDeviceFolderToPc(const std::wstring& device_folder, const std::wstring& pc_folder,
                                  HANDLE cancel_event, bool nested);

// Copies the tree, empty folders too, in a session for each folder and for each file. A PC folder that is not
// there is an empty one.
DeviceResult CopyPcFolderToDevice(const std::wstring& pc_folder, const std::wstring& device_folder,
                                  HANDLE cancel_event);

}  // namespace orvane
