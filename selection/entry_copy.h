// What surrounds the copy of one listed entry, in the passes and in the manual view alike. A path is a side's
// folder followed by the entry's name, so that exactly one of the two brings the "\" between them.
#pragma once

#include <windows.h>

#include <string>
#include <string_view>

namespace orvane {

// An entry that is to be copied.
struct EntryCopy {
    const std::wstring& pc_folder;
    const std::wstring& device_folder;
    std::wstring_view name;
    bool to_device;  // Else to the PC.

    std::wstring PcPath() const { return pc_folder + std::wstring(name); }
    std::wstring DevicePath() const { return device_folder + std::wstring(name); }
};

// Whether there is a PC folder at all, both sides can hold the entry's paths, with the name of its backup on
// the device if there is to be one, and the PC its name, which must not lead into a file or folder of another
// name. (The device judges names of its own accord.) What fails here must not reach a device operation: a
// path that does not fit would end the process.
bool CanCopyEntry(const EntryCopy& entry, bool with_device_backup);

// Creates the folder on the target side that holds the entry, in a device session of its own or (`nested`)
// within the caller's, which then has each level looked up first. Failures are not looked at.
void EnsureTargetFolder(const EntryCopy& entry, HANDLE cancel_event, bool nested);

// Copies the companion folder of a ".wkf" job file; does nothing for any other entry, and for a job file
// whose name without extension is not that of a folder ("..wkf", "...wkf"). What becomes of the copy is not
// told.
void CopyCompanionFolder(const EntryCopy& entry, HANDLE cancel_event, bool nested);

}  // namespace orvane
