#include "device/device_tree_reader.h"

namespace orvane {

namespace {

// Committed when the thread starts, so that a deep tree cannot run out of it half-way. The address space
// that is reserved stays the program's default: what the Remote API library itself needs is not known.
constexpr SIZE_T kReaderStackBytes = 0x20000;

}  // namespace

void DeviceTreeReader::StopThread() {
    if (!thread_) {
        return;
    }
    SetEvent(stop_event_.Get());
    SetThreadPriority(thread_.Get(), THREAD_PRIORITY_ABOVE_NORMAL);
    // Ends because the thread, if it has not ended yet, looks at the stop event before every folder and
    // while it connects, and a single call to the device returns when the connection is lost.
    WaitForSingleObject(thread_.Get(), INFINITE);
    thread_.Reset();
}

void DeviceTreeReader::Prepare(const std::wstring& folder, std::span<const std::wstring> extensions,
                               FileNode& root, HWND notify_window) {
    StopThread();
    ResetEvent(stop_event_.Get());
    request_ = {};
    extensions_.assign(extensions.begin(), extensions.end());
    request_.extensions = extensions_;
    request_.root = &root;
    request_.cancel_event = stop_event_.Get();
    request_.notify_window = notify_window;
    // A path that is too long fills the buffer without a terminator, and the load refuses it.
    folder.copy(request_.folder_path, kPathBufferChars);
}

bool DeviceTreeReader::ReadOnThread(const std::wstring& folder, std::span<const std::wstring> extensions,
                                    FileNode& root, HWND notify_window) {
    Prepare(folder, extensions, root, notify_window);
    thread_.Reset(CreateThread(nullptr, kReaderStackBytes, LoadDeviceFolderThread, &request_, 0, nullptr));
    if (!thread_) {
        return false;
    }
    // Ends because the listing goes no deeper than a path can be long, every folder is listed once, and a
    // single call to the device returns when the connection is lost. The thread sends no messages to this
    // one: it only posts.
    WaitForSingleObject(thread_.Get(), INFINITE);
    return request_.result != DeviceResult::kFailed;
}

bool DeviceTreeReader::ReadDirectly(const std::wstring& folder, std::span<const std::wstring> extensions,
                                    FileNode& root, HWND notify_window) {
    Prepare(folder, extensions, root, notify_window);
    LoadDeviceFolderThread(&request_);
    return request_.result != DeviceResult::kFailed;
}

}  // namespace orvane
