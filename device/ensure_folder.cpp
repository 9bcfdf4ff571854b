#include "device/ensure_folder.h"

#include "device/connect.h"
#include "device/device_path.h"
#include "device/remote_api.h"

namespace orvane {

namespace {

void CreateDeviceLevels(std::wstring_view path, bool look_up_first) {
    const std::wstring levels = WithTrailingBackslash(WithoutTrailingBackslashes(path));
    // From the second character on: what stands before the first "\" is the root.
    for (std::size_t end = levels.find(L'\\', 1); end != std::wstring::npos;
         end = levels.find(L'\\', end + 1)) {
        const std::wstring level = levels.substr(0, end);
        if (!look_up_first || DeviceEntry(level) == EntryKind::kNone) {
            CeCreateDirectory(PathBuffer(level).Get(), nullptr);
        }
    }
}

}  // namespace

void EnsureDeviceFolder(std::wstring_view path, HANDLE cancel_event) {
    const DeviceSession session(cancel_event);
    if (session) {
        CreateDeviceLevels(path, /*look_up_first=*/false);
    }
}

void EnsureDeviceFolderInSession(std::wstring_view path) {
    CreateDeviceLevels(path, /*look_up_first=*/true);
}

void EnsurePcFolder(const std::wstring& path) {
    if (!PcPathFits(path.size())) {
        return;
    }
    // Ends because each parent is shorter; a path without a parent gives an empty one.
    const std::wstring parent(ParentPath(path));
    if (!parent.empty() && PcEntry(parent) == EntryKind::kNone) {
        EnsurePcFolder(parent);
    }
    CreateDirectoryW(path.c_str(), nullptr);
}

}  // namespace orvane
