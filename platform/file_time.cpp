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

using ZoneConversion = decltype(&SystemTimeToTzSpecificLocalTime);

// `convert` knows milliseconds only, so that its shift is found first.
FILETIME Shifted(const FILETIME& time, const TIME_ZONE_INFORMATION& rules, ZoneConversion convert) {
    SYSTEMTIME before{};
    SYSTEMTIME after{};
    FILETIME from{};
    FILETIME to{};
    if (!FileTimeToSystemTime(&time, &before) || !convert(&rules, &before, &after) ||
        !SystemTimeToFileTime(&before, &from) || !SystemTimeToFileTime(&after, &to)) {
        return time;
    }
    return LaterBy(time, FileTimeTicks(to) - FileTimeTicks(from));
}

}  // namespace

FILETIME ToLocalTime(const FILETIME& utc, const TIME_ZONE_INFORMATION& rules) {
    return Shifted(utc, rules, SystemTimeToTzSpecificLocalTime);
}

FILETIME FromLocalTime(const FILETIME& local, const TIME_ZONE_INFORMATION& rules) {
    return Shifted(local, rules, TzSpecificLocalTimeToSystemTime);
}

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
