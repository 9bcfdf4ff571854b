#include "device/backup_name.h"

#include <windows.h>

#include <climits>

#include "device/device_path.h"
#include "device/remote_api.h"

namespace orvane {

namespace {

// What numbering needs to know of the side that it works on.
struct Side {
    int end_number;  // One past the last number.
    EntryKind (*find)(const std::wstring& path);
    bool (*rename)(const std::wstring& from, const std::wstring& to);
};

constexpr Side kPc = {INT_MAX, PcEntry, [](const std::wstring& from, const std::wstring& to) {
                          return MoveFileW(from.c_str(), to.c_str()) != FALSE;
                      }};
// The device's backup names have exactly three digits.
constexpr Side kDevice = {1000, DeviceEntry, [](const std::wstring& from, const std::wstring& to) {
                              return CeMoveFile(PathBuffer(from).Get(), PathBuffer(to).Get()) != FALSE;
                          }};

// The path, "." and the number in at least three digits.
std::wstring BackupName(const std::wstring& path, int number) {
    const std::wstring digits = std::to_wstring(number);
    const std::size_t zeros = digits.size() < 3 ? 3 - digits.size() : 0;
    return path + L"." + std::wstring(zeros, L'0') + digits;
}

bool KeepOldFile(const Side& side, const std::wstring& path) {
    const EntryKind kind = side.find(path);
    if (kind != EntryKind::kFile) {
        return kind == EntryKind::kNone;  // A folder of that name is in the way; it is no old file.
    }
    for (int number = 1; number < side.end_number; ++number) {
        const std::wstring backup = BackupName(path, number);
        if (!FitsPathBuffer(backup.size())) {
            return false;
        }
        if (side.find(backup) == EntryKind::kNone) {
            return side.rename(path, backup);
        }
    }
    return false;
}

}  // namespace

bool KeepOldPcFile(const std::wstring& path) {
    return KeepOldFile(kPc, path);
}

bool KeepOldDeviceFile(const std::wstring& path) {
    return KeepOldFile(kDevice, path);
}

}  // namespace orvane
