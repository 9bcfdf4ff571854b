#include "device/clock_check.h"

#include <cstdlib>
#include <optional>

#include "device/connect.h"
#include "device/remote_api.h"
#include "qelutils/text_format.h"
#include "qelutils/xlate.h"

namespace orvane {

namespace {

constexpr wchar_t kClockFile[] = L"\\CompareDateTime.txt";
constexpr int kMaxDifferenceSeconds = 10;
constexpr int kGoOn = 1;
constexpr int kDeclined = 0;
constexpr UINT kQuestionStyle = MB_OKCANCEL | MB_ICONINFORMATION | MB_DEFBUTTON2;
static_assert(kQuestionStyle == 0x141);

enum class ClockSource { kCreationTime, kLastWriteTime };

// The device's clock; nothing when it does not let a file be made or tell its times.
std::optional<FILETIME> ReadDeviceClock(ClockSource source) {
    // Without a library the handle is null and the next call fails.
    const HANDLE file = CeCreateFile(kClockFile, GENERIC_READ | GENERIC_WRITE, FILE_SHARE_READ, nullptr,
                                     CREATE_ALWAYS, FILE_ATTRIBUTE_NORMAL, nullptr);
    if (file == INVALID_HANDLE_VALUE) {
        return std::nullopt;
    }
    FILETIME creation{};
    FILETIME last_access{};
    FILETIME last_write{};
    const BOOL has_times = CeGetFileTime(file, &creation, &last_access, &last_write);
    CeCloseHandle(file);
    CeDeleteFile(kClockFile);
    if (!has_times) {
        return std::nullopt;
    }
    return source == ClockSource::kCreationTime ? creation : last_write;
}

// A clock's reading in local calendar fields. One outside the years that the calendar functions of the C
// runtime know has the time of day -1:-1:-1 on the date 0/0/0.
CalendarTime ReadingOf(const FILETIME& time) {
    constexpr int kFirstYear = 1969;  // 1970-01-01 00:00:00 UTC, west of Greenwich.
    constexpr int kLastYear = 3000;
    const CalendarTime reading = ToLocalCalendar(time);
    if (reading.year < kFirstYear || reading.year > kLastYear) {
        return {0, 0, 0, -1, -1, -1};
    }
    return reading;
}

// Midnight between two readings makes them differ, however close they are: this is meant.
bool ClocksAgree(const CalendarTime& pc, const CalendarTime& device) {
    return pc.SameDate(device) && std::abs(pc.SecondOfDay() - device.SecondOfDay()) <= kMaxDifferenceSeconds;
}

// Whether work goes on: the clocks agree or the user accepts that they do not.
bool AcceptsDeviceClock(HWND owner, const FILETIME& device_time) {
    FILETIME pc_time{};
    GetSystemTimeAsFileTime(&pc_time);
    const CalendarTime pc = ReadingOf(pc_time);
    const CalendarTime device = ReadingOf(device_time);
    return ClocksAgree(pc, device) ||
           MessageBoxW(owner, FormatDateDifferenceMessage(pc, device).c_str(),
                       Xlate(L"Syncronization").c_str(), kQuestionStyle) != IDCANCEL;
}

}  // namespace

int CheckDeviceDateTime(HWND owner, HANDLE cancel_event, bool& accepted) {
    // Not tested: without a session the file cannot be made, which passes the check.
    DeviceSession session(cancel_event);
    const std::optional<FILETIME> device_time = ReadDeviceClock(ClockSource::kCreationTime);
    if (!device_time) {
        session.Release();  // It stays open: this is meant.
        return kGoOn;
    }
    if (!AcceptsDeviceClock(owner, *device_time)) {
        return kDeclined;
    }
    accepted = true;
    return kGoOn;
}

int CheckDeviceDateTimeForFileView(HWND owner, HANDLE cancel_event) {
    const DeviceSession session(cancel_event);
    if (!session) {
        return kGoOn;
    }
    const std::optional<FILETIME> device_time = ReadDeviceClock(ClockSource::kLastWriteTime);
    return !device_time || AcceptsDeviceClock(owner, *device_time) ? kGoOn : kDeclined;
}

std::wstring FormatDateDifferenceMessage(const CalendarTime& pc, const CalendarTime& device) {
    return qel_text::detail::qel_safefmt_impl(
        L"{1}\n\n{2}       :{3}\n{4} :{5}",
        {Xlate(L"PC Date is different from DEVICE!"), Xlate(L"PC"), FormatClockReading(pc), Xlate(L"Device"),
         FormatClockReading(device)});
}

std::wstring FormatClockReading(const CalendarTime& reading) {
    return qel_text::Format(L"%02d/%02d/%02d  %02d:%02d:%02d", reading.day, reading.month, reading.year,
                            reading.hour, reading.minute, reading.second);
}

}  // namespace orvane
