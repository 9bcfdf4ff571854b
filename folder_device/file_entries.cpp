// Files by handle: open, read, write, move, measure, time, close.
#include "folder_device/call.h"
#include "folder_device/device_path.h"

using namespace folder_device;

namespace {

struct FileObject : Object {
    FileObject(std::wstring opened_path, orvane::UniqueFile opened_file, DWORD granted_access)
        : Object(std::move(opened_path)), file(std::move(opened_file)), access(granted_access) {}

    const orvane::UniqueFile file;
    const DWORD access;
    // Set through this handle, and then kept against later writes through it.
    std::optional<FILETIME> explicit_last_write;
};

struct OpenRequest {
    const wchar_t* path;
    DWORD access;
    DWORD share_mode;
    DWORD creation;
    DWORD attributes;
};

// Attributes that a device keeps; the PC's flags (overlapped, delete on close, whole folders) are not its.
constexpr DWORD kKnownAttributes = FILE_ATTRIBUTE_READONLY | FILE_ATTRIBUTE_HIDDEN | FILE_ATTRIBUTE_SYSTEM |
                                   FILE_ATTRIBUTE_ARCHIVE | FILE_ATTRIBUTE_NORMAL | FILE_ATTRIBUTE_TEMPORARY;
constexpr DWORD kKnownAccess = GENERIC_READ | GENERIC_WRITE;
constexpr DWORD kKnownShare = FILE_SHARE_READ | FILE_SHARE_WRITE;

bool Truncates(DWORD creation) {
    return creation == CREATE_ALWAYS || creation == TRUNCATE_EXISTING;
}

// What the PC would refuse too, said here because not every file system under it does.
DWORD CheckOpen(const OpenRequest& request, const Location& file) {
    if ((request.access & ~kKnownAccess) != 0 || request.creation < CREATE_NEW ||
        request.creation > TRUNCATE_EXISTING) {
        return ERROR_INVALID_PARAMETER;
    }
    if (file.Exists() && request.creation == CREATE_NEW) {
        return ERROR_FILE_EXISTS;
    }
    const bool changes = Truncates(request.creation) || (request.access & GENERIC_WRITE) != 0;
    return file.IsFolder() || (file.IsReadOnly() && changes) ? ERROR_ACCESS_DENIED : ERROR_SUCCESS;
}

DWORD OpenDeviceFile(Call& call, const OpenRequest& request, HANDLE& result) {
    Location file;
    DWORD error = Locate(call.TheSettings().root, request.path, file);
    if (error == ERROR_SUCCESS) {
        error = CheckOpen(request, file);
    }
    if (error != ERROR_SUCCESS) {
        return error;
    }
    StorageChange change(call.TheDevice().storage);
    const std::uint64_t old_size =
        change.Limited() && Truncates(request.creation) ? FileSizeAt(file.pc_path) : 0;
    orvane::UniqueFile opened(CreateFileW(file.pc_path.c_str(), request.access,
                                          request.share_mode & kKnownShare, nullptr, request.creation,
                                          request.attributes & kKnownAttributes, nullptr));
    const DWORD note = GetLastError();
    if (!opened) {
        return note;
    }
    change.Book(old_size, 0);
    const bool existed = request.creation == OPEN_EXISTING || request.creation == TRUNCATE_EXISTING ||
                         note == ERROR_ALREADY_EXISTS;
    if (!existed || Truncates(request.creation)) {
        call.Times().StampNew(file.pc_path, true);
    }
    call.Note(existed && request.creation != OPEN_EXISTING && request.creation != TRUNCATE_EXISTING
                  ? ERROR_ALREADY_EXISTS
                  : ERROR_SUCCESS);
    result = call.TheDevice().handles.Add(
        std::make_shared<FileObject>(file.device_path, std::move(opened), request.access));
    return ERROR_SUCCESS;
}

// Where a write of `wanted` bytes at the file's position would bring its size.
DWORD SizesOfWrite(HANDLE file, DWORD wanted, std::uint64_t& old_size, std::uint64_t& new_size) {
    LARGE_INTEGER size;
    LARGE_INTEGER position;
    if (!GetFileSizeEx(file, &size) || !SetFilePointerEx(file, {}, &position, FILE_CURRENT)) {
        return GetLastError();
    }
    old_size = static_cast<std::uint64_t>(size.QuadPart);
    new_size = static_cast<std::uint64_t>(position.QuadPart) + wanted;
    new_size = wanted == 0 || new_size < old_size ? old_size : new_size;
    return ERROR_SUCCESS;
}

DWORD WriteDeviceFile(Call& call, FileObject& file, LPCVOID buffer, DWORD wanted, DWORD& written) {
    const std::scoped_lock one_write(file.mutex);
    StorageChange change(call.TheDevice().storage);
    std::uint64_t old_size = 0;
    std::uint64_t new_size = 0;
    if (change.Limited()) {
        if (const DWORD error = SizesOfWrite(file.file.Get(), wanted, old_size, new_size);
            error != ERROR_SUCCESS) {
            return error;
        }
        if ((file.access & GENERIC_WRITE) != 0 && !change.HasRoom(old_size, new_size)) {
            return ERROR_DISK_FULL;
        }
    }
    if (!WriteFile(file.file.Get(), buffer, wanted, &written, nullptr)) {
        return GetLastError();
    }
    change.Book(old_size, new_size);
    // A write gives the file the device's time, unless a time was set through this handle before.
    if (written != 0 && (file.explicit_last_write || call.Times().ClockIsWrong())) {
        const FILETIME time = file.explicit_last_write.value_or(call.Times().Now());
        SetFileTime(file.file.Get(), nullptr, nullptr, &time);
    }
    return ERROR_SUCCESS;
}

DWORD SetTimes(const Call& call, FileObject& file, const FILETIME* const (&times)[3]) {
    const std::scoped_lock one_change(file.mutex);
    if ((file.access & GENERIC_WRITE) == 0) {
        return ERROR_ACCESS_DENIED;
    }
    FILETIME for_pc[3] = {};
    for (std::size_t i = 0; i < 3; ++i) {
        for_pc[i] = times[i] != nullptr ? call.Times().ForPc(*times[i]) : FILETIME{};  // None stays as it is.
    }
    if (!SetFileTime(file.file.Get(), &for_pc[0], &for_pc[1], &for_pc[2])) {
        return GetLastError();
    }
    if (IsTime(for_pc[2])) {
        file.explicit_last_write = for_pc[2];
    }
    return ERROR_SUCCESS;
}

// Finds the open file and lets `work` do something with it; ERROR_INVALID_HANDLE when there is none.
template <class Work>
DWORD OnFile(Call& call, HANDLE handle, Work work) {
    const auto file = call.TheDevice().handles.Find<FileObject>(handle);
    return file != nullptr ? work(*file) : static_cast<DWORD>(ERROR_INVALID_HANDLE);
}

// A read or a write: `work` moves bytes and counts them. A call that fails tells of none.
template <class Work>
BOOL Transfer(Call& call, HANDLE handle, LPDWORD moved, LPOVERLAPPED overlapped, Work work) {
    DWORD count = 0;
    const BOOL done = call.RunBool([&]() -> DWORD {
        if (moved == nullptr || overlapped != nullptr) {
            return ERROR_INVALID_PARAMETER;
        }
        return OnFile(call, handle, [&](FileObject& open) { return work(open, count); });
    });
    if (moved != nullptr) {
        *moved = done ? count : 0;
    }
    return done;
}

// What `work` answers of the open file: the low half of a number of 64 bits. 0xFFFFFFFF may be one or tell of
// a failure, so that the device error is set in any case.
template <class Work>
DWORD LowHalf(Call& call, HANDLE handle, Work work) {
    static_assert(INVALID_SET_FILE_POINTER == INVALID_FILE_SIZE);
    return call.RunFor(INVALID_FILE_SIZE, [&](DWORD& low) {
        return OnFile(call, handle, [&](FileObject& open) -> DWORD {
            const std::scoped_lock one_move(open.mutex);
            SetLastError(ERROR_SUCCESS);
            low = work(open.file.Get());
            const DWORD error = low == INVALID_FILE_SIZE ? GetLastError() : ERROR_SUCCESS;
            call.Note(error);
            return error;
        });
    });
}

}  // namespace

// Dispositions, share modes and errors are CreateFileW's. Folders cannot be opened, access is GENERIC_READ,
// GENERIC_WRITE, both or none, deletion cannot be shared. Security and template are not looked at.
HANDLE WINAPI CeCreateFile(LPCWSTR path, DWORD access, DWORD share_mode, LPSECURITY_ATTRIBUTES /*security*/,
                           DWORD creation, DWORD attributes, HANDLE /*template_file*/) {
    Call call(__func__, path, access, share_mode, creation, attributes);
    return call.RunFor(INVALID_HANDLE_VALUE, [&](HANDLE& result) {
        return OpenDeviceFile(call, {path, access, share_mode, creation, attributes}, result);
    });
}

// Closes a file's handle; those of searches and registry keys have closers of their own.
BOOL WINAPI CeCloseHandle(HANDLE object) {
    Call call(__func__, object);
    return call.RunBool([&] { return call.TheDevice().handles.Close<FileObject>(object); });
}

BOOL WINAPI CeReadFile(HANDLE file, LPVOID buffer, DWORD wanted, LPDWORD read, LPOVERLAPPED overlapped) {
    Call call(__func__, file, wanted);
    return Transfer(call, file, read, overlapped, [&](FileObject& open, DWORD& count) {
        const std::scoped_lock one_read(open.mutex);
        return LastErrorUnless(ReadFile(open.file.Get(), buffer, call.BytesOf(wanted), &count, nullptr));
    });
}

// All of the bytes are written or, when the storage is full (ERROR_DISK_FULL), none.
BOOL WINAPI CeWriteFile(HANDLE file, LPCVOID buffer, DWORD wanted, LPDWORD written, LPOVERLAPPED overlapped) {
    Call call(__func__, file, wanted);
    return Transfer(call, file, written, overlapped, [&](FileObject& open, DWORD& count) {
        return WriteDeviceFile(call, open, buffer, call.BytesOf(wanted), count);
    });
}

// The new position's low half, or 0xFFFFFFFF with the device error not 0.
DWORD WINAPI CeSetFilePointer(HANDLE file, LONG distance, PLONG distance_high, DWORD method) {
    Call call(__func__, file, distance, method);
    return LowHalf(call, file,
                   [&](HANDLE open) { return SetFilePointer(open, distance, distance_high, method); });
}

// The size's low half, or 0xFFFFFFFF with the device error not 0.
DWORD WINAPI CeGetFileSize(HANDLE file, LPDWORD size_high) {
    Call call(__func__, file);
    return LowHalf(call, file, [&](HANDLE open) { return GetFileSize(open, size_high); });
}

BOOL WINAPI CeGetFileTime(HANDLE file, LPFILETIME creation, LPFILETIME last_access, LPFILETIME last_write) {
    Call call(__func__, file);
    return call.RunBool([&] {
        return OnFile(call, file, [&](FileObject& open) -> DWORD {
            if (!GetFileTime(open.file.Get(), creation, last_access, last_write)) {
                return GetLastError();
            }
            for (const LPFILETIME time : {creation, last_access, last_write}) {
                if (time != nullptr) {
                    *time = call.Times().FromPc(*time);
                }
            }
            return ERROR_SUCCESS;
        });
    });
}

// Needs a handle with GENERIC_WRITE. A last-write time set so outlives later writes through the handle.
BOOL WINAPI CeSetFileTime(HANDLE file, const FILETIME* creation, const FILETIME* last_access,
                          const FILETIME* last_write) {
    Call call(__func__, file);
    return call.RunBool([&] {
        return OnFile(call, file, [&](FileObject& open) {
            return SetTimes(call, open, {creation, last_access, last_write});
        });
    });
}
