#include "copy/target_folder.h"

#include "device/connect.h"
#include "device/remote_api.h"

namespace orvane {

namespace {

void CreateDeviceLevels(std::wstring_view path, bool look_up_first) {
    const std::wstring levels = WithTrailingBackslash(WithoutTrailingBackslashes(path));
    // From the second character on: what stands before the first "\" is the root.
    for (std::size_t end = levels.find(L'\\', 1); end != std::wstring::npos;
         end = levels.find(L'\\', end + 1)) {
        const std::wstring level = levels.substr(0, end);
        if (!look_up_first || Side::Device().Find(level).kind == EntryKind::kNone) {
            CeCreateDirectory(PathBuffer(level).Get(), nullptr);
        }
    }
}

}  // namespace

bool EnsureDeviceFolder(std::wstring_view path, const CancelEvent& cancel) {
    const DeviceSession session(cancel);
    if (session) {
        CreateDeviceLevels(path, /*look_up_first=*/false);
    }
    return static_cast<bool>(session);
}

void EnsurePcFolder(const std::wstring& path) {
    if (!PathFits(path.size()) || IsUncRoot(path)) {
        return;
    }
    // Ends because each parent is shorter; a path without a parent gives an empty one.
    const std::wstring parent(ParentPath(path));
    if (!parent.empty() && GetFileAttributesW(parent.c_str()) == INVALID_FILE_ATTRIBUTES) {
        EnsurePcFolder(parent);
    }
    CreateDirectoryW(path.c_str(), nullptr);
}

bool EnsureTargetFolder(const EntryPaths& paths, const CopyContext& context) {
    const std::wstring_view folder = ParentPath(paths.Target(context.direction));
    if (context.direction == Direction::kDeviceToPc) {
        EnsurePcFolder(std::wstring(folder));
    } else if (context.session == Session::kOwn) {
        return EnsureDeviceFolder(folder, context.cancel);
    } else {
        CreateDeviceLevels(folder, /*look_up_first=*/true);
    }
    return true;
}

}  // namespace orvane
