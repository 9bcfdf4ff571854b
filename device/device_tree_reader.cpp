#include "device/device_tree_reader.h"

namespace orvane {

bool DeviceTreeReader::ReadDeviceTree(const std::wstring& folder, std::span<const std::wstring> extensions,
                                      FileNode& root, HWND notify_window) {
    request_ = {};
    request_.extensions = extensions;
    request_.root = &root;
    request_.cancel_event = stop_event_.Get();
    request_.notify_window = notify_window;
    // A path that is too long fills the buffer without a terminator, and the load refuses it.
    folder.copy(request_.folder_path, kPathBufferChars);
    LoadDeviceFolderThread(&request_);
    request_.extensions = {};
    return request_.result != DeviceResult::kFailed;
}

}  // namespace orvane
