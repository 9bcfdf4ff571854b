#include "folder_device/device_times.h"

#include "platform/file_time.h"
#include "platform/handles.h"

namespace folder_device {

void DeviceTimes::LookAtVolume() {
    if (volume_stays_) {
        return;
    }
    const orvane::UniqueFile root(CreateFileW((root_ + L"\\").c_str(), 0,
                                              FILE_SHARE_READ | FILE_SHARE_WRITE | FILE_SHARE_DELETE, nullptr,
                                              OPEN_EXISTING, FILE_FLAG_BACKUP_SEMANTICS, nullptr));
    wchar_t kind[MAX_PATH + 1] = L"";
    if (root) {
        GetVolumeInformationByHandleW(root.Get(), nullptr, 0, nullptr, nullptr, nullptr, kind, MAX_PATH + 1);
    }
    const std::size_t colon = root_.find(L':');  // None in a network path.
    volume_stays_ = kind[0] != L'\0' && colon != std::wstring::npos && colon > 0 &&
                    GetDriveTypeW((root_.substr(colon - 1, 2) + L"\\").c_str()) == DRIVE_FIXED;
    DYNAMIC_TIME_ZONE_INFORMATION zone{};
    GetDynamicTimeZoneInformation(&zone);
    const std::wstring_view name = kind;
    keeps_local_time_ = (name == L"FAT" || name == L"FAT32") && !zone.DynamicDaylightTimeDisabled;
    const std::scoped_lock lock(mutex_);
    rules_.clear();
}

TIME_ZONE_INFORMATION DeviceTimes::RulesAt(const FILETIME& time) const {
    SYSTEMTIME fields{};
    FileTimeToSystemTime(&time, &fields);
    const std::scoped_lock lock(mutex_);
    const auto [rules, is_new] = rules_.try_emplace(fields.wYear);
    if (is_new && !GetTimeZoneInformationForYear(fields.wYear, nullptr, &rules->second)) {
        GetTimeZoneInformation(&rules->second);
    }
    return rules->second;
}

FILETIME DeviceTimes::ForPc(const FILETIME& time) const {
    FILETIME shown = time;
    if (keeps_local_time_ && IsTime(time)) {
        const FILETIME local = orvane::ToLocalTime(time, RulesAt(time));
        LocalFileTimeToFileTime(&local, &shown);  // The system will undo just this, by the present offset.
    }
    return shown;
}

FILETIME DeviceTimes::FromPc(const FILETIME& shown) const {
    FILETIME local{};
    return keeps_local_time_ && IsTime(shown) && FileTimeToLocalFileTime(&shown, &local)
               ? orvane::FromLocalTime(local, RulesAt(local))
               : shown;
}

FILETIME DeviceTimes::Now() const {
    FILETIME now;
    GetSystemTimeAsFileTime(&now);
    return ForPc(orvane::LaterBy(now, offset_));
}

void DeviceTimes::StampNew(const std::wstring& pc_path, bool written) const {
    const orvane::UniqueFile file(CreateFileW(pc_path.c_str(), FILE_WRITE_ATTRIBUTES,
                                              FILE_SHARE_READ | FILE_SHARE_WRITE | FILE_SHARE_DELETE, nullptr,
                                              OPEN_EXISTING, FILE_FLAG_BACKUP_SEMANTICS, nullptr));
    if (file) {
        const FILETIME now = Now();
        SetFileTime(file.Get(), &now, &now, written && ClockIsWrong() ? &now : nullptr);
    }
}

}  // namespace folder_device
