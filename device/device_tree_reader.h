// Reading the device's job folder tree, one read at a time.
#pragma once

#include <windows.h>

#include <span>
#include <string>

#include "device/file_node.h"
#include "device/load_worker.h"
#include "device/result_codes.h"
#include "platform/handles.h"

namespace orvane {

// Owns a stop event and the request that a read works on. A read may run on a worker, while which the object
// is left alone but for its stop event.
class DeviceTreeReader {
  public:
    DeviceTreeReader() : stop_event_(NewManualResetEvent()) {}
    DeviceTreeReader(const DeviceTreeReader&) = delete;
    DeviceTreeReader& operator=(const DeviceTreeReader&) = delete;

    // Reads `folder` with all that lies below into `root`, in a session of its own on the calling thread.
    // `extensions`: as for ListDeviceFolder. `notify_window` (null for none) is told by
    // kDeviceTreeLoadedMessage. False when the tree was not read: no device, a refused folder, a path of 260
    // characters or more. A read that was stopped counts as read; Result tells.
    bool ReadDeviceTree(const std::wstring& folder, std::span<const std::wstring> extensions, FileNode& root,
                        HWND notify_window);

    // What a worker that reads is to be started with, in bytes: committed at its start, so that a deep tree
    // cannot run out of it half-way.
    static constexpr SIZE_T kStackBytes = 0x20000;

    // The stop event (manual reset): signalling it ends a read at the next folder, and the reads after it
    // until it is reset. It is the reader's; device operations of the same dialog may take it as their cancel
    // event.
    HANDLE StopEvent() const { return stop_event_.Get(); }
    // Of the last read; kFailed before the first.
    DeviceResult Result() const { return request_.result; }
    // The product folders that the last read found on the device; empty if absent.
    const wchar_t* DataDirectory() const { return request_.data_directory; }
    const wchar_t* LibraryDirectory() const { return request_.library_directory; }

  private:
    UniqueEvent stop_event_;
    DeviceTreeRequest request_;
};

}  // namespace orvane
