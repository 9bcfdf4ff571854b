#include "selection/copy_rules.h"

#include <cstdlib>

#include "platform/file_time.h"
#include "qelutils/text_format.h"
#include "qelutils/xlate.h"

namespace orvane {

bool IsSameVersion(const FILETIME& a, const FILETIME& b, int bound_seconds) {
    const CalendarTime first = ToLocalCalendar(a);
    const CalendarTime second = ToLocalCalendar(b);
    return first.SameDate(second) && std::abs(first.SecondOfDay() - second.SecondOfDay()) < bound_seconds;
}

bool Replaces(bool overwrite, const FILETIME& source_write_time, const FILETIME& target_write_time) {
    return overwrite && CompareFileTime(&source_write_time, &target_write_time) > 0 &&
           !IsSameVersion(source_write_time, target_write_time, kSameVersionSeconds);
}

bool ShouldSkipCopy(bool overwrite, const FILETIME& source_write_time, std::wstring_view name,
                    const FileIndex& target, const std::function<bool(std::wstring_view)>& ask_replace) {
    const std::int32_t row = target.Find(name);
    if (row < 0) {
        return false;
    }
    const FILETIME& target_write_time = target.Table().write_times[static_cast<std::size_t>(row)];
    if (!Replaces(overwrite, source_write_time, target_write_time)) {
        return true;
    }
    return ask_replace && !ask_replace(name);
}

std::wstring ReplaceQuestion(std::wstring_view target_display, std::wstring_view source_display) {
    return qel_text::detail::qel_safefmt_impl(Xlate(L"The file:\n{1} \n\nWill be replaced by the file:\n{2}"),
                                              {target_display, source_display});
}

}  // namespace orvane
