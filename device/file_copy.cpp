#include "device/file_copy.h"

#include "device/backup_name.h"
#include "device/connect.h"
#include "device/device_path.h"
#include "device/remote_api.h"
#include "platform/handles.h"

namespace orvane {

namespace {

constexpr DWORD kChunkBytes = 8192;

// 1990-01-01 UTC, what a target is dated as long as it is not complete. A device that vanishes, or a process
// that ends, in the middle of a copy leaves a partial file behind: it must count as older than the whole one
// on the other side, so that the next synchronization repairs it and never copies it back. (A device that is
// lost between the calls that create and date the file still leaves an empty one behind.)
constexpr FILETIME kUnfinished = {0x18D64000, 0x1B41E2A};

struct DeviceFileTraits {
    using Type = HANDLE;
    static Type Invalid() noexcept { return INVALID_HANDLE_VALUE; }
    static void Close(Type handle) noexcept { CeCloseHandle(handle); }
};
using UniqueDeviceFile = UniqueHandle<DeviceFileTraits>;

// The calls that the chunk loop makes on one side.
struct Side {
    BOOL (*read)(HANDLE file, void* buffer, DWORD wanted, DWORD* read);
    BOOL (*write)(HANDLE file, const void* buffer, DWORD wanted, DWORD* written);
    DWORD (*last_error)();
};

constexpr Side kPc = {
    [](HANDLE file, void* buffer, DWORD wanted, DWORD* read) {
        return ReadFile(file, buffer, wanted, read, nullptr);
    },
    [](HANDLE file, const void* buffer, DWORD wanted, DWORD* written) {
        return WriteFile(file, buffer, wanted, written, nullptr);
    },
    [] { return GetLastError(); },
};
constexpr Side kDevice = {
    [](HANDLE file, void* buffer, DWORD wanted, DWORD* read) {
        return CeReadFile(file, buffer, wanted, read, nullptr);
    },
    [](HANDLE file, const void* buffer, DWORD wanted, DWORD* written) {
        return CeWriteFile(file, buffer, wanted, written, nullptr);
    },
    [] { return CeGetLastError(); },
};

// Where the copies differ.
struct CopyPlan {
    enum class Stamp { kNone, kLastWrite, kAllThree };

    bool nested = false;  // In the caller's session.
    bool make_backup = false;
    Stamp stamp = Stamp::kNone;
    FILETIME last_write = {};  // With kLastWrite; kAllThree takes the times from the source's handle.
    bool tells_full_disk = false;
    // What a copy to the device gives when the source cannot be opened or the target not created.
    DeviceResult not_begun = DeviceResult::kFailed;

    // With a backup the name is free by now. Should the search have missed a file, because the device
    // refused it, that file is not overwritten.
    DWORD TargetCreation() const { return make_backup ? CREATE_NEW : CREATE_ALWAYS; }
};

// The times of a copy's source; the present time where they cannot be read. (A complete target must not go on
// with the date of an incomplete one.)
struct FileTimes {
    FILETIME creation;
    FILETIME last_access;
    FILETIME last_write;
};

FileTimes TimesOf(HANDLE source, BOOL (*get_times)(HANDLE, FILETIME*, FILETIME*, FILETIME*)) {
    FileTimes times;
    if (!get_times(source, &times.creation, &times.last_access, &times.last_write)) {
        GetSystemTimeAsFileTime(&times.last_write);
        times.creation = times.last_access = times.last_write;
    }
    return times;
}

// Copies from where the source's handle stands to its end. Neither handle is closed. A chunk that is shorter
// than asked for is the last; so a source of full chunks only ends with a chunk of 0 bytes.
DeviceResult CopyChunks(const Side& from, HANDLE source, const Side& to, HANDLE target, HANDLE cancel_event) {
    BYTE chunk[kChunkBytes];
    for (;;) {
        if (IsSignalled(cancel_event)) {
            return DeviceResult::kCancelled;
        }
        DWORD read = 0;
        // A count beyond the buffer is no count: the device's answers are not trusted.
        if (!from.read(source, chunk, kChunkBytes, &read) || read > kChunkBytes) {
            return DeviceResult::kFailed;
        }
        DWORD written = 0;
        if (!to.write(target, chunk, read, &written)) {
            return to.last_error() == ERROR_DISK_FULL ? DeviceResult::kDiskFull : DeviceResult::kFailed;
        }
        if (written != read) {
            return DeviceResult::kFailed;
        }
        if (read < kChunkBytes) {
            return DeviceResult::kDone;
        }
    }
}

UniqueFile OpenPcSource(const std::wstring& path) {
    return UniqueFile(
        CreateFileW(path.c_str(), GENERIC_READ, 0, nullptr, OPEN_EXISTING, FILE_ATTRIBUTE_NORMAL, nullptr));
}

// Makes the backup of a device file ahead of the copy's session, in one of its own. No connection, no backup.
bool KeepOldDeviceFileInSession(const std::wstring& path, HANDLE cancel_event, bool nested) {
    const DeviceSession session(cancel_event, nested);
    return session && KeepOldDeviceFile(path);
}

BOOL CloseAndDeleteDeviceFile(HANDLE file, const std::wstring& device_path) {
    CeCloseHandle(file);
    return CeDeleteFile(PathBuffer(device_path).Get());
}

void StampDeviceFile(const CopyPlan& plan, HANDLE source, const FileTimes& times, HANDLE target) {
    if (plan.stamp == CopyPlan::Stamp::kLastWrite) {
        // Meant: a call on the device with the PC's handle and nothing to fill, its result is not looked at.
        CeGetFileTime(source, nullptr, nullptr, nullptr);
        CeSetFileTime(target, nullptr, nullptr, &plan.last_write);
    } else if (plan.stamp == CopyPlan::Stamp::kAllThree) {
        CeSetFileTime(target, &times.creation, &times.last_access, &times.last_write);
    }
}

void StampPcFile(const CopyPlan& plan, const FileTimes& times, HANDLE target) {
    if (plan.stamp == CopyPlan::Stamp::kLastWrite) {
        GetFileTime(target, nullptr, nullptr, nullptr);  // Meant: its result is not looked at.
        SetFileTime(target, nullptr, nullptr, &plan.last_write);
    } else if (plan.stamp == CopyPlan::Stamp::kAllThree) {
        SetFileTime(target, &times.creation, &times.last_access, &times.last_write);
    }
}

// Ends a copy to the device that failed: closes and deletes the target and closes the session if it is the
// copy's own.
void AbandonDeviceTarget(DeviceResult result, HANDLE target, const std::wstring& device_path,
                         DeviceSession& session, bool nested) {
    if (nested) {
        CloseAndDeleteDeviceFile(target, device_path);
        return;
    }
    DeleteDeviceFileAfterClose(target, device_path);
    session.Release();
    if (result == DeviceResult::kDiskFull) {
        // Meant: after a full disk the handle and the session are closed a second time.
        CeCloseHandle(target);
        CeRapiUninit();
    }
}

DeviceResult CopyToDevice(const std::wstring& pc_path, const std::wstring& device_path, HANDLE cancel_event,
                          const CopyPlan& plan) {
    const UniqueFile source = OpenPcSource(pc_path);
    if (!source) {
        return plan.not_begun;
    }
    const FileTimes times =
        TimesOf(source.Get(), [](auto... arguments) { return GetFileTime(arguments...); });
    if (plan.make_backup && !KeepOldDeviceFileInSession(device_path, cancel_event, plan.nested)) {
        return DeviceResult::kFailed;
    }
    DeviceSession session(cancel_event, plan.nested);
    if (!session) {
        return DeviceResult::kFailed;
    }
    // Polled ahead of the chunk loop, so that a cancelled copy does not destroy an old file.
    if (IsSignalled(cancel_event)) {
        return DeviceResult::kCancelled;
    }
    UniqueDeviceFile target(CeCreateFile(PathBuffer(device_path).Get(), GENERIC_WRITE, FILE_SHARE_READ,
                                         nullptr, plan.TargetCreation(), FILE_ATTRIBUTE_NORMAL, nullptr));
    if (!target) {
        return plan.not_begun;
    }
    // The null of a missing entry point is no refusal, but nothing was created that could be cleaned up.
    if (target.Get() == nullptr) {
        return DeviceResult::kFailed;
    }
    if (plan.stamp != CopyPlan::Stamp::kNone) {
        CeSetFileTime(target.Get(), nullptr, nullptr, &kUnfinished);
    }
    DeviceResult result = CopyChunks(kPc, source.Get(), kDevice, target.Get(), cancel_event);
    if (result == DeviceResult::kDone) {
        StampDeviceFile(plan, source.Get(), times, target.Get());
        if (CeCloseHandle(target.Get())) {
            static_cast<void>(target.Release());
            return DeviceResult::kDone;
        }
        result = DeviceResult::kFailed;
    } else if (result == DeviceResult::kDiskFull && !plan.tells_full_disk) {
        result = DeviceResult::kFailed;
    }
    AbandonDeviceTarget(result, target.Release(), device_path, session, plan.nested);
    return result;
}

DeviceResult CopyToPc(const std::wstring& device_path, const std::wstring& pc_path, HANDLE cancel_event,
                      const CopyPlan& plan) {
    DeviceSession session(cancel_event, plan.nested);
    if (!session) {
        return DeviceResult::kFailed;
    }
    UniqueDeviceFile source(OpenDeviceFile(device_path, GENERIC_READ, FILE_SHARE_READ, OPEN_EXISTING,
                                           cancel_event, /*nested=*/true));
    // The null of a missing entry point could never be read: no old file is given up for it.
    if (!source || source.Get() == nullptr || IsShortNameOfAnother(pc_path)) {
        return DeviceResult::kFailed;
    }
    if (plan.make_backup && !KeepOldPcFile(pc_path)) {
        return DeviceResult::kFailed;
    }
    // Polled ahead of the chunk loop, so that a cancelled copy does not destroy an old file.
    if (IsSignalled(cancel_event)) {
        return DeviceResult::kCancelled;
    }
    UniqueFile target(CreateFileW(pc_path.c_str(), GENERIC_WRITE, 0, nullptr, plan.TargetCreation(),
                                  FILE_ATTRIBUTE_NORMAL, nullptr));
    if (!target) {
        return DeviceResult::kFailed;
    }
    if (plan.stamp != CopyPlan::Stamp::kNone) {
        SetFileTime(target.Get(), nullptr, nullptr, &kUnfinished);
    }
    FileTimes times{};
    if (plan.stamp == CopyPlan::Stamp::kAllThree) {
        times = TimesOf(source.Get(), CeGetFileTime);
    }
    DeviceResult result = CopyChunks(kDevice, source.Get(), kPc, target.Get(), cancel_event);
    bool deleted = false;
    if (result == DeviceResult::kDone) {
        StampPcFile(plan, times, target.Get());
    } else if (result == DeviceResult::kDiskFull && plan.tells_full_disk) {
        // Meant: at once, while the file is still open. Where the system refuses that because the file is
        // not shared, it is deleted below like any other partial target.
        deleted = DeleteFileW(pc_path.c_str()) != FALSE;
    } else if (result == DeviceResult::kDiskFull) {
        result = DeviceResult::kFailed;
    }
    source.Reset();
    session.Close();
    if (!CloseHandle(target.Release()) && result == DeviceResult::kDone) {
        result = DeviceResult::kFailed;
    }
    if (result != DeviceResult::kDone && !deleted) {
        DeleteFileW(pc_path.c_str());
    }
    return result;
}

CopyPlan SynchronizationPlan(const FILETIME& last_write, bool nested, bool make_backup) {
    return {.nested = nested,
            .make_backup = make_backup,
            .stamp = CopyPlan::Stamp::kLastWrite,
            .last_write = last_write,
            .tells_full_disk = true};
}

CopyPlan TransferPlan(DeviceResult not_begun) {
    return {.nested = true,
            .make_backup = true,
            .stamp = CopyPlan::Stamp::kAllThree,
            .tells_full_disk = true,
            .not_begun = not_begun};
}

}  // namespace

HANDLE OpenDeviceFile(const std::wstring& device_path, DWORD access, DWORD share_mode, DWORD creation,
                      HANDLE cancel_event, bool nested) {
    DeviceSession session(cancel_event, nested);
    if (!session) {
        return INVALID_HANDLE_VALUE;
    }
    const HANDLE file = CeCreateFile(PathBuffer(device_path).Get(), access, share_mode, nullptr, creation,
                                     FILE_ATTRIBUTE_NORMAL, nullptr);
    if (file != INVALID_HANDLE_VALUE) {
        session.Release();  // The caller's, with the file.
    }
    return file;
}

BOOL DeleteDeviceFileAfterClose(HANDLE file, const std::wstring& device_path) {
    const BOOL deleted = CloseAndDeleteDeviceFile(file, device_path);
    CeRapiUninit();  // Meant: also when the session is a caller's.
    return deleted;
}

DeviceResult CopyPcFileToDevice(const std::wstring& pc_path, const std::wstring& device_path,
                                HANDLE cancel_event) {
    return CopyToDevice(pc_path, device_path, cancel_event, {});
}

DeviceResult CopyDeviceFileToPc(const std::wstring& device_path, const std::wstring& pc_path,
                                HANDLE cancel_event, bool nested) {
    return CopyToPc(device_path, pc_path, cancel_event, {.nested = nested});
}

DeviceResult CopyPcFileToDeviceWithBackup(const FILETIME& last_write_time, const std::wstring& pc_path,
                                          const std::wstring& device_path, HANDLE cancel_event,
                                          bool make_backup) {
    return CopyToDevice(pc_path, device_path, cancel_event,
                        SynchronizationPlan(last_write_time, /*nested=*/false, make_backup));
}

DeviceResult CopyDeviceFileToPcWithBackup(const FILETIME& last_write_time, const std::wstring& device_path,
                                          const std::wstring& pc_path, HANDLE cancel_event, bool nested,
                                          bool make_backup) {
    return CopyToPc(device_path, pc_path, cancel_event,
                    SynchronizationPlan(last_write_time, nested, make_backup));
}

// Meant: a file that has disappeared, or that the device will not create, counts as copied.
DeviceResult TransferPcFileToDevice(const std::wstring& pc_path, const std::wstring& device_path,
                                    HANDLE cancel_event) {
    return CopyToDevice(pc_path, device_path, cancel_event, TransferPlan(DeviceResult::kDone));
}

DeviceResult TransferDeviceFileToPc(const std::wstring& device_path, const std::wstring& pc_path,
                                    HANDLE cancel_event) {
    return CopyToPc(device_path, pc_path, cancel_event, TransferPlan(DeviceResult::kFailed));
}

}  // namespace orvane
