// File times: 64-bit counts of 100 ns since 1601 in UTC, and their local calendar fields.
#pragma once

#include <windows.h>

#include <cstdint>

namespace orvane {

// Local calendar time to the second. Months and days count from 1.
struct CalendarTime {
    int day = 0;
    int month = 0;
    int year = 0;
    int hour = 0;
    int minute = 0;
    int second = 0;

    bool SameDate(const CalendarTime& other) const {
        return day == other.day && month == other.month && year == other.year;
    }
    int SecondOfDay() const { return (hour * 60 + minute) * 60 + second; }
};

inline std::int64_t FileTimeTicks(const FILETIME& time) {
    return static_cast<std::int64_t>(time.dwHighDateTime) << 32 | time.dwLowDateTime;
}

// The time that lies `ticks` of 100 ns later, or earlier if negative.
inline FILETIME LaterBy(const FILETIME& time, std::int64_t ticks) {
    const std::int64_t sum = FileTimeTicks(time) + ticks;
    return {static_cast<DWORD>(sum & MAXDWORD), static_cast<DWORD>(sum >> 32)};
}

// UTC as local time and back by the offset that `rules`, those of the time's year, have for its date, not by
// the one that is in force now. Of the hour that the end of summer time repeats one half is taken for the
// other. A time that cannot be converted stays what it is.
FILETIME ToLocalTime(const FILETIME& utc, const TIME_ZONE_INFORMATION& rules);
FILETIME FromLocalTime(const FILETIME& local, const TIME_ZONE_INFORMATION& rules);

inline bool SameFileTime(const FILETIME& a, const FILETIME& b) {
    return CompareFileTime(&a, &b) == 0;
}

// The file time in local calendar fields, by the offset from UTC that is in force now (as the platform's
// local file times are made). A time that cannot be converted or lies before 1900 counts as 1970-01-01
// 00:00:00 UTC.
CalendarTime ToLocalCalendar(const FILETIME& time);

}  // namespace orvane
