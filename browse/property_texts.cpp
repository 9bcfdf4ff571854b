#include "browse/property_texts.h"

#include <oleauto.h>

#include <optional>

#include "platform/resources.h"
#include "qelutils/text_format.h"
#include "qelutils/xlate.h"
#include "res/ids.h"

namespace orvane {

namespace {

// The platform's OLE date of the time in local time. No value when the conversion does not hold: when the
// date, converted back, is another second.
std::optional<DATE> ToOleDate(const FILETIME& time) {
    FILETIME local{};
    SYSTEMTIME calendar{};
    SYSTEMTIME back{};
    DATE date = 0;
    if (!FileTimeToLocalFileTime(&time, &local) || !FileTimeToSystemTime(&local, &calendar) ||
        !SystemTimeToVariantTime(&calendar, &date) || !VariantTimeToSystemTime(date, &back)) {
        return std::nullopt;
    }
    const bool same = calendar.wYear == back.wYear && calendar.wMonth == back.wMonth &&
                      calendar.wDay == back.wDay && calendar.wHour == back.wHour &&
                      calendar.wMinute == back.wMinute && calendar.wSecond == back.wSecond;
    return same ? std::optional(date) : std::nullopt;
}

}  // namespace

std::wstring FileTypeText(const std::wstring& path) {
    const std::size_t dot = path.rfind(L'.');
    if (dot == std::wstring::npos || dot + 1 == path.size()) {
        return {};
    }
    std::wstring extension = path.substr(dot + 1);
    if (extension.find(L'\\') != std::wstring::npos) {
        extension.clear();
    }
    CharUpperBuffW(extension.data(), static_cast<DWORD>(extension.size()));
    // Translators: follows the extension in capitals, "JPG" for instance; stands alone where there is none.
    return extension + Xlate(L" File");
}

std::wstring DateText(const FILETIME& time) {
    BSTR text = nullptr;
    const auto date = ToOleDate(time);
    if (date && SUCCEEDED(VarBstrFromDate(*date, LOCALE_USER_DEFAULT, 0, &text))) {
        std::wstring result(text, SysStringLen(text));
        SysFreeString(text);
        return result;
    }
    const std::wstring invalid = ResourceString(IDS_INVALID_DATE);
    return invalid.empty() ? Xlate(L"Invalid DateTime") : invalid;
}

std::wstring SizeText(std::uint32_t size_low) {
    const std::wstring number = qel_formats::IntToString(static_cast<std::int32_t>(size_low));
    return qel_text::detail::qel_safefmt_impl(Xlate(L"{1} bytes"), {number});
}

}  // namespace orvane
