#include "selection/copy_rules.h"

#include <algorithm>
#include <array>
#include <cstdlib>

#include "platform/file_time.h"
#include "platform/text_case.h"
#include "qelutils/text_format.h"
#include "qelutils/xlate.h"

namespace orvane {

namespace {

constexpr std::size_t kExtensionChars = 4;  // The dot and three letters.
constexpr std::wstring_view kCompanionExtension = L".wkf";

struct TypeRow {
    std::wstring_view extension;
    bool FileTypes::*flag;
};

constexpr std::array<TypeRow, 12> kTypes = {{
    {L".qvj", &FileTypes::qvj},
    {L".tn3", &FileTypes::tn3},
    {L".rd3", &FileTypes::rd3},
    {L".pt3", &FileTypes::pt3},
    {L".ln3", &FileTypes::ln3},
    {L".jpg", &FileTypes::jpg},
    {L".bmp", &FileTypes::bmp},
    {L".img", &FileTypes::img},
    {L".xml", &FileTypes::xml},
    {L".tp3", &FileTypes::tp3},
    {kCompanionExtension, &FileTypes::wkf},
    {L".txt", &FileTypes::txt},
}};

std::wstring_view ExtensionOf(std::wstring_view name) {
    return name.size() > kExtensionChars ? name.substr(name.size() - kExtensionChars) : name;
}

}  // namespace

bool IsSameVersion(const FILETIME& a, const FILETIME& b, int bound_seconds) {
    const CalendarTime first = ToLocalCalendar(a);
    const CalendarTime second = ToLocalCalendar(b);
    return first.SameDate(second) && std::abs(first.SecondOfDay() - second.SecondOfDay()) < bound_seconds;
}

bool ShouldSkipCopy(bool overwrite, const FILETIME& source_write_time, std::wstring_view name,
                    const FileIndex& target, const std::function<bool(std::wstring_view)>& ask_replace) {
    const std::int32_t row = target.Find(name);
    if (row < 0) {
        return false;
    }
    const FILETIME& target_write_time = target.Table().write_times[static_cast<std::size_t>(row)];
    if (!overwrite || SameFileTime(source_write_time, target_write_time)) {
        return true;
    }
    const bool source_is_newer = CompareFileTime(&source_write_time, &target_write_time) > 0;
    if (!source_is_newer || IsSameVersion(source_write_time, target_write_time, kSameVersionSeconds)) {
        return true;
    }
    return ask_replace && !ask_replace(name);
}

std::wstring ReplaceQuestion(std::wstring_view target_display, std::wstring_view source_display) {
    return qel_text::detail::qel_safefmt_impl(Xlate(L"The file:\n{1} \n\nWill be replaced by the file:\n{2}"),
                                              {target_display, source_display});
}

bool PassesExtensionFilter(std::wstring_view name, const FileTypes& types) {
    const std::wstring_view extension = ExtensionOf(name);
    return std::any_of(kTypes.begin(), kTypes.end(), [&](const TypeRow& type) {
        return types.*type.flag && EqualIgnoringCase(extension, type.extension);
    });
}

bool HasCompanionFolder(std::wstring_view name) {
    return name.size() > kExtensionChars && EqualIgnoringCase(ExtensionOf(name), kCompanionExtension);
}

std::wstring_view CompanionFolder(std::wstring_view name) {
    return name.substr(0, name.size() - kExtensionChars);
}

}  // namespace orvane
