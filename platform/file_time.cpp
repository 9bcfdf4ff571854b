#include "platform/file_time.h"

#include <optional>

namespace orvane {

namespace {

// 1970-01-01 00:00:00 UTC, 0x019DB1DED53E8000 in 100-ns units.
constexpr FILETIME kUnixEpoch = {0xD53E8000, 0x019DB1DE};

std::optional<SYSTEMTIME> LocalFields(const FILETIME& time) {
    FILETIME local{};
    SYSTEMTIME fields{};
    if (!FileTimeToLocalFileTime(&time, &local) || !FileTimeToSystemTime(&local, &fields)) {
        return std::nullopt;
    }
    return fields;
}

}  // namespace

CalendarTime ToLocalCalendar(const FILETIME& time) {
    std::optional<SYSTEMTIME> fields = LocalFields(time);
    if (!fields || fields->wYear < 1900) {
        fields = LocalFields(kUnixEpoch);
    }
    if (!fields) {
        return {};
    }
    return {fields->wDay, fields->wMonth, fields->wYear, fields->wHour, fields->wMinute, fields->wSecond};
}

}  // namespace orvane
