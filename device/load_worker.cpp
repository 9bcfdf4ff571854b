#include "device/load_worker.h"

#include <algorithm>
#include <array>
#include <cwchar>
#include <exception>

#include "device/connect.h"
#include "device/device_listing.h"
#include "device/remote_api.h"

namespace orvane {

namespace {

constexpr DWORD kValueBytes = 260;
static_assert(kValueBytes / sizeof(wchar_t) < kPathBufferChars);

// Reads a text of the device's registry into `text`, which is empty before. The device need not terminate
// what it keeps, and what it says about the size is believed only up to the size of the buffer.
bool ReadText(HKEY key, const wchar_t* value_name, std::span<wchar_t, kPathBufferChars> text) {
    std::array<wchar_t, kValueBytes / sizeof(wchar_t)> value{};
    DWORD bytes = kValueBytes;
    if (CeRegQueryValueEx(key, value_name, nullptr, nullptr, reinterpret_cast<BYTE*>(value.data()), &bytes) !=
        ERROR_SUCCESS) {
        return false;
    }
    const std::size_t received = std::min<std::size_t>(bytes / sizeof(wchar_t), value.size());
    std::copy_n(value.begin(), wcsnlen(value.data(), received), text.begin());
    return true;
}

DeviceResult List(const DeviceTreeRequest& request) {
    if (wcsnlen(request.folder_path, kPathBufferChars) == kPathBufferChars) {
        return DeviceResult::kFailed;
    }
    try {
        return ListDeviceFolder(request.folder_path, request.extensions, true, *request.root,
                                request.cancel_event);
    } catch (const std::exception&) {
        return DeviceResult::kFailed;  // The memory is used up.
    }
}

}  // namespace

DWORD WINAPI LoadDeviceFolderThread(void* parameter) {
    DeviceTreeRequest& request = *static_cast<DeviceTreeRequest*>(parameter);
    request.result = DeviceResult::kFailed;
    *request.root = {};
    if (const DeviceSession session(request.cancel_event); session) {
        request.result = List(request);
        if (request.result != DeviceResult::kListingCancelled) {  // Else somebody wants to leave.
            ReadDeviceProductFolders(request.data_directory, request.library_directory);
        }
    }
    // Nobody waits for a load that was cancelled.
    if (request.result != DeviceResult::kListingCancelled && request.notify_window != nullptr) {
        PostMessageW(request.notify_window, kDeviceTreeLoadedMessage, 0, 0);
    }
    return 0;
}

bool ReadDeviceProductFolders(std::span<wchar_t, kPathBufferChars> data_directory,
                              std::span<wchar_t, kPathBufferChars> library_directory) {
    std::fill(data_directory.begin(), data_directory.end(), L'\0');
    std::fill(library_directory.begin(), library_directory.end(), L'\0');
    HKEY key = nullptr;
    if (CeRegOpenKeyEx(HKEY_CURRENT_USER, L"Software\\Veltrano\\Dunhallow", 0, 0, &key) != ERROR_SUCCESS) {
        return false;
    }
    const bool has_data = ReadText(key, L"DataDirectory", data_directory);
    const bool has_library = ReadText(key, L"LibraryDirectory", library_directory);
    CeRegCloseKey(key);
    return has_data && has_library;
}

}  // namespace orvane
