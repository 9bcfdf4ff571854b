// Loading a device folder tree: the routine that a thread of its own can run. DeviceTreeReader calls it.
#pragma once

#include <windows.h>

#include <span>
#include <string>

#include "device/file_node.h"
#include "device/result_codes.h"
#include "platform/paths.h"

namespace orvane {

// Posted, with wParam and lParam 0, to the window of a request when the load is over, unless it was
// cancelled.
inline constexpr UINT kDeviceTreeLoadedMessage = WM_USER + 100;

// What to load, and what came of it. Its owner fills it before the load, keeps it alive and leaves it alone
// until the load is over.
struct DeviceTreeRequest {
    wchar_t folder_path[kPathBufferChars] = {};  // A path without a terminator is too long: the load fails.
    wchar_t data_directory[kPathBufferChars] = {};     // Out, see ReadDeviceProductFolders.
    wchar_t library_directory[kPathBufferChars] = {};  // Out, likewise.
    std::span<const std::wstring> extensions;          // As for ListDeviceFolder; owned by others.
    FileNode* root = nullptr;                          // Out: the tree. Never null when the load begins.
    HANDLE cancel_event = nullptr;                     // Not owned.
    HWND notify_window = nullptr;                      // Null: nobody is told.
    DeviceResult result = DeviceResult::kFailed;       // Out: what ListDeviceFolder answered.
};

// A thread routine; `parameter` is the DeviceTreeRequest to carry out. It opens a session of its own on the
// thread that it runs on (result kFailed if there is none), lists the folder with all that lies below into
// the emptied root, reads the two product folders whatever the listing gave, closes the session and tells
// the window. Returns 0.
DWORD WINAPI LoadDeviceFolderThread(void* parameter);

// Reads the folders that the maker's civil-survey product keeps in the device's registry. A folder that is
// not there stays empty. Answers true only if both were read. The caller holds a session on this thread.
bool ReadDeviceProductFolders(std::span<wchar_t, kPathBufferChars> data_directory,
                              std::span<wchar_t, kPathBufferChars> library_directory);

}  // namespace orvane
