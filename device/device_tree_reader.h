// Reading the device's job folder tree, one read at a time.
#pragma once

#include <windows.h>

#include <span>
#include <string>
#include <vector>

#include "device/file_node.h"
#include "device/load_worker.h"
#include "device/result_codes.h"
#include "platform/handles.h"

namespace orvane {

// Owns a stop event, the thread of a read and the request that it works on; used by one thread, the one
// whose dialog shows the tree. The `root` of a read belongs to the caller and holds the tree when the
// read returns. Each read first ends what the previous one left.
class DeviceTreeReader {
  public:
    DeviceTreeReader() : stop_event_(NewManualResetEvent()) {}
    DeviceTreeReader(const DeviceTreeReader&) = delete;
    DeviceTreeReader& operator=(const DeviceTreeReader&) = delete;
    ~DeviceTreeReader() { StopThread(); }

    // Reads `folder` with all that lies below on a thread of its own and waits for it; the calling thread
    // handles no messages meanwhile. `notify_window` (null for none) is told by kDeviceTreeLoadedMessage.
    // False when the tree was not read: no device, a refused folder, a path of 260 characters or more, no
    // thread to be had. A read that was stopped counts as read; Result tells.
    bool ReadOnThread(const std::wstring& folder, std::span<const std::wstring> extensions, FileNode& root,
                      HWND notify_window);

    // The same on the calling thread.
    bool ReadDirectly(const std::wstring& folder, std::span<const std::wstring> extensions, FileNode& root,
                      HWND notify_window);

    // The stop event (manual reset): signalling it ends a read at the next folder. The next read resets it.
    // It is the reader's; device operations of the same dialog may take it as their cancel event.
    HANDLE StopEvent() const { return stop_event_.Get(); }
    // Of the last read; kFailed before the first.
    DeviceResult Result() const { return request_.result; }
    // The product folders that the last read found on the device; empty if absent.
    const wchar_t* DataDirectory() const { return request_.data_directory; }
    const wchar_t* LibraryDirectory() const { return request_.library_directory; }

  private:
    void StopThread();
    void Prepare(const std::wstring& folder, std::span<const std::wstring> extensions, FileNode& root,
                 HWND notify_window);

    UniqueEvent stop_event_;
    std::vector<std::wstring> extensions_;
    DeviceTreeRequest request_;
    UniqueThread thread_;
};

}  // namespace orvane
