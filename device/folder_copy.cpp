#include "device/folder_copy.h"

#include <memory>
#include <string_view>

#include "device/connect.h"
#include "device/device_listing.h"
#include "device/device_path.h"
#include "device/file_copy.h"
#include "device/file_node.h"
#include "device/remote_api.h"
#include "platform/handles.h"

namespace orvane {

namespace {

// The walks run on workers with small stacks and go as deep as a path can, about 130 folders: what is large
// is kept off the stack.

// The "\*" that a folder is searched with.
constexpr std::size_t kSearchPatternChars = 2;

DeviceResult CopyEntryToPc(const FileNode& entry, const std::wstring& device_folder,
                           const std::wstring& pc_folder, HANDLE cancel_event) {
    if (!IsSafePcRelativePath(entry.name)) {
        return DeviceResult::kFailed;
    }
    const std::wstring device_path = JoinPath(device_folder, entry.name);
    const std::wstring pc_path = JoinPath(pc_folder, entry.name);
    if (!DevicePathFits(device_path.size()) || !PcPathFits(pc_path.size()) || IsShortNameOfAnother(pc_path)) {
        return DeviceResult::kFailed;
    }
    return entry.is_folder ? CopyDeviceFolderToPc(device_path, pc_path, cancel_event, /*nested=*/true)
                           : CopyDeviceFileToPc(device_path, pc_path, cancel_event, /*nested=*/true);
}

DeviceResult CopyEntryToDevice(const WIN32_FIND_DATAW& entry, const std::wstring& pc_folder,
                               const std::wstring& device_folder, HANDLE cancel_event) {
    const std::wstring pc_path = JoinPath(pc_folder, entry.cFileName);
    const std::wstring device_path = JoinPath(device_folder, entry.cFileName);
    if (!DevicePathFits(device_path.size()) || !PcPathFits(pc_path.size())) {
        return DeviceResult::kFailed;
    }
    return (entry.dwFileAttributes & FILE_ATTRIBUTE_DIRECTORY) != 0
               ? CopyPcFolderToDevice(pc_path, device_path, cancel_event)
               : CopyPcFileToDevice(pc_path, device_path, cancel_event);
}

bool IsDotFolder(std::wstring_view name) {
    return name == L"." || name == L"..";
}

}  // namespace

DeviceResult CopyDeviceFolderToPc(const std::wstring& device_folder, const std::wstring& pc_folder,
                                  HANDLE cancel_event, bool nested) {
    const DeviceSession session(cancel_event, nested);
    // A folder that cannot be searched would pass for an empty one.
    if (!session || !DevicePathFits(device_folder.size() + kSearchPatternChars)) {
        return DeviceResult::kFailed;
    }
    if (IsSignalled(cancel_event)) {
        return DeviceResult::kListingCancelled;
    }
    const auto listing = std::make_unique<FileNode>();
    const DeviceResult listed = ListDeviceFolderFlat(device_folder, *listing);
    if (listed != DeviceResult::kDone) {
        return listed;
    }
    if (listing->child_count > 0) {
        CreateDirectoryW(pc_folder.c_str(), nullptr);  // An existing folder is fine.
    }
    for (const FileNode& entry : listing->Children()) {
        const DeviceResult result = CopyEntryToPc(entry, device_folder, pc_folder, cancel_event);
        if (result != DeviceResult::kDone) {
            return result;
        }
    }
    return DeviceResult::kDone;
}

DeviceResult CopyPcFolderToDevice(const std::wstring& pc_folder, const std::wstring& device_folder,
                                  HANDLE cancel_event) {
    if (const DeviceSession session(cancel_event); session) {
        CeCreateDirectory(PathBuffer(device_folder).Get(), nullptr);  // An existing folder is fine.
    }
    if (!PcPathFits(pc_folder.size() + kSearchPatternChars)) {
        return DeviceResult::kFailed;
    }
    const auto entry = std::make_unique<WIN32_FIND_DATAW>();
    const UniqueFind search(FindFirstFileW(JoinPath(pc_folder, L"*").c_str(), entry.get()));
    if (!search) {
        const DWORD error = GetLastError();
        const bool nothing_there = error == ERROR_FILE_NOT_FOUND || error == ERROR_PATH_NOT_FOUND;
        return nothing_there ? DeviceResult::kDone : DeviceResult::kFailed;
    }
    do {
        if (IsDotFolder(entry->cFileName)) {
            continue;
        }
        const DeviceResult result = CopyEntryToDevice(*entry, pc_folder, device_folder, cancel_event);
        if (result != DeviceResult::kDone) {
            return result;
        }
    } while (FindNextFileW(search.Get(), entry.get()));
    return GetLastError() == ERROR_NO_MORE_FILES ? DeviceResult::kDone : DeviceResult::kFailed;
}

}  // namespace orvane
