// Files and folders by name: make, remove, delete, rename, copy, and the space that is left.
#include "folder_device/call.h"
#include "folder_device/device_path.h"
#include "platform/text_case.h"

using namespace folder_device;

namespace {

DWORD RemoveFolder(const Location& folder) {
    if (folder.IsRoot()) {
        return ERROR_ACCESS_DENIED;
    }
    if (!folder.Exists()) {
        return ERROR_FILE_NOT_FOUND;
    }
    if (!folder.IsFolder()) {
        return ERROR_DIRECTORY;
    }
    return LastErrorUnless(RemoveDirectoryW(folder.pc_path.c_str()));
}

DWORD DeleteDeviceFile(Call& call, const Location& file) {
    if (!file.Exists()) {
        return ERROR_FILE_NOT_FOUND;
    }
    if (file.IsFolder() || file.IsReadOnly()) {
        return ERROR_ACCESS_DENIED;
    }
    StorageChange change(call.TheDevice().storage);
    const std::uint64_t size = change.Limited() ? FileSizeAt(file.pc_path) : 0;
    const DWORD error = LastErrorUnless(DeleteFileW(file.pc_path.c_str()));
    if (error == ERROR_SUCCESS) {
        change.Book(size, 0);
    }
    return error;
}

DWORD Rename(const Location& from, const Location& to) {
    if (from.IsRoot() || to.IsRoot()) {
        return ERROR_ACCESS_DENIED;
    }
    if (!from.Exists()) {
        return ERROR_FILE_NOT_FOUND;
    }
    // The same name in other letters is a rename like any other.
    if (to.Exists() && !orvane::EqualIgnoringCase(from.device_path, to.device_path)) {
        return ERROR_ALREADY_EXISTS;
    }
    return LastErrorUnless(MoveFileExW(from.pc_path.c_str(), to.pc_path.c_str(), 0));
}

DWORD CheckCopy(const Location& from, const Location& to, bool fail_if_exists) {
    if (!from.Exists()) {
        return ERROR_FILE_NOT_FOUND;
    }
    if (from.IsFolder() || to.IsFolder()) {
        return ERROR_ACCESS_DENIED;
    }
    if (to.Exists() && fail_if_exists) {
        return ERROR_FILE_EXISTS;
    }
    if (to.IsReadOnly()) {
        return ERROR_ACCESS_DENIED;
    }
    return orvane::EqualIgnoringCase(from.device_path, to.device_path) ? ERROR_SHARING_VIOLATION
                                                                       : ERROR_SUCCESS;
}

DWORD CopyDeviceFile(Call& call, const Location& from, const Location& to, bool fail_if_exists) {
    if (const DWORD error = CheckCopy(from, to, fail_if_exists); error != ERROR_SUCCESS) {
        return error;
    }
    StorageChange change(call.TheDevice().storage);
    const std::uint64_t old_size = change.Limited() ? FileSizeAt(to.pc_path) : 0;
    if (change.Limited() && !change.HasRoom(old_size, FileSizeAt(from.pc_path))) {
        return ERROR_DISK_FULL;
    }
    const DWORD error =
        LastErrorUnless(CopyFileW(from.pc_path.c_str(), to.pc_path.c_str(), fail_if_exists ? TRUE : FALSE));
    if (change.Limited()) {
        change.Book(old_size, FileSizeAt(to.pc_path));  // A copy that broke off may have cut the old file.
    }
    if (error == ERROR_SUCCESS) {
        call.Times().StampNew(to.pc_path, false);
    }
    return error;
}

DWORD FreeSpace(Call& call, const Location& folder, ULARGE_INTEGER (&space)[3]) {
    if (!folder.IsFolder()) {
        return ERROR_PATH_NOT_FOUND;
    }
    StorageAccount& storage = call.TheDevice().storage;
    if (!storage.Limited()) {
        return LastErrorUnless(GetDiskFreeSpaceExW((folder.pc_path + (folder.IsRoot() ? L"" : L"\\")).c_str(),
                                                   &space[0], &space[1], &space[2]));
    }
    space[0].QuadPart = storage.Free();
    space[1].QuadPart = storage.Capacity();
    space[2] = space[0];
    return ERROR_SUCCESS;
}

// Finds the places of one or two paths and lets `work` do something with them.
template <class Work>
DWORD OnPath(const Call& call, LPCWSTR path, Work work) {
    Location location;
    const DWORD error = Locate(call.TheSettings().root, path, location);
    return error != ERROR_SUCCESS ? error : work(location);
}
template <class Work>
DWORD OnPaths(const Call& call, LPCWSTR from, LPCWSTR to, Work work) {
    return OnPath(call, from, [&](const Location& source) {
        return OnPath(call, to, [&](const Location& target) { return work(source, target); });
    });
}

}  // namespace

// The folder above must exist. ERROR_ALREADY_EXISTS where a folder or a file stands. Security is not
// looked at.
BOOL WINAPI CeCreateDirectory(LPCWSTR path, LPSECURITY_ATTRIBUTES /*security*/) {
    Call call(__func__, path);
    return call.RunBool([&] {
        return OnPath(call, path, [&](const Location& folder) -> DWORD {
            if (folder.Exists()) {
                return ERROR_ALREADY_EXISTS;
            }
            const DWORD error = LastErrorUnless(CreateDirectoryW(folder.pc_path.c_str(), nullptr));
            if (error == ERROR_SUCCESS) {
                call.Times().StampNew(folder.pc_path, true);
            }
            return error;
        });
    });
}

// Only an empty folder goes.
BOOL WINAPI CeRemoveDirectory(LPCWSTR path) {
    Call call(__func__, path);
    return call.RunBool([&] { return OnPath(call, path, &RemoveFolder); });
}

// Not a folder, not a read-only file, not an open one.
BOOL WINAPI CeDeleteFile(LPCWSTR path) {
    Call call(__func__, path);
    return call.RunBool([&] {
        return OnPath(call, path, [&](const Location& file) { return DeleteDeviceFile(call, file); });
    });
}

// Renames or moves a file or a folder with all it holds; nothing is overwritten.
BOOL WINAPI CeMoveFile(LPCWSTR existing_path, LPCWSTR new_path) {
    Call call(__func__, existing_path, new_path);
    return call.RunBool([&] { return OnPaths(call, existing_path, new_path, &Rename); });
}

// Copies a file with its last-write time and attributes.
BOOL WINAPI CeCopyFile(LPCWSTR existing_file, LPCWSTR new_file, BOOL fail_if_exists) {
    Call call(__func__, existing_file, new_file, static_cast<DWORD>(fail_if_exists));
    return call.RunBool([&] {
        return OnPaths(call, existing_file, new_file, [&](const Location& from, const Location& to) {
            return CopyDeviceFile(call, from, to, fail_if_exists != FALSE);
        });
    });
}

// Bytes, of the capacity that is set or else of the PC's disk. Null is the root folder; each result may be
// null.
BOOL WINAPI CeGetDiskFreeSpaceEx(LPCWSTR folder, PULARGE_INTEGER free_to_caller, PULARGE_INTEGER total,
                                 PULARGE_INTEGER free) {
    Call call(__func__, folder);
    return call.RunBool([&] {
        return OnPath(call, folder != nullptr ? folder : L"\\", [&](const Location& location) {
            ULARGE_INTEGER space[3] = {};
            const DWORD error = FreeSpace(call, location, space);
            PULARGE_INTEGER const places[3] = {free_to_caller, total, free};
            for (std::size_t i = 0; i < 3 && error == ERROR_SUCCESS; ++i) {
                if (places[i] != nullptr) {
                    *places[i] = space[i];
                }
            }
            return error;
        });
    });
}
