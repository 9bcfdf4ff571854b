// Whether the clocks of the PC and the device agree. Which copy of a file is newer is decided by times
// taken on both sides, so the user is asked before work goes on with clocks that are more than 10 whole
// seconds apart or stand on different dates.
#pragma once

#include <windows.h>

#include <string>

#include "platform/file_time.h"

namespace orvane {

// The check when the synchronization dialog opens; `owner` is that dialog, on whose thread it runs. The
// device's clock is the creation time of a file "\CompareDateTime.txt" that is made and deleted at once. If
// the clocks disagree, a message box asks whether to go on. `cancel_event` ends the attempt to connect.
//
// Returns 0 when the user chose Cancel, otherwise 1, and then `accepted` is set to true, unless the device's
// clock could not be read: a device without a usable clock does not stop the work, `accepted` stays as it is
// and the session stays open.
int CheckDeviceDateTime(HWND owner, HANDLE cancel_event, bool& accepted);

// The check when the manual file view opens. It takes the file's last-write time for the device's clock and
// always closes its session; the returned value means the same.
int CheckDeviceDateTimeForFileView(HWND owner, HANDLE cancel_event);

// What the message box asks.
std::wstring FormatDateDifferenceMessage(const CalendarTime& pc, const CalendarTime& device);

// "05/03/2024  09:07:02": day, month, year, two blanks and the time of day.
std::wstring FormatClockReading(const CalendarTime& reading);

}  // namespace orvane
