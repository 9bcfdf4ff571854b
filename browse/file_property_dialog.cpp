#include "browse/file_property_dialog.h"

#include <oleauto.h>

#include <utility>

#include "platform/resources.h"
#include "qelutils/text_format.h"
#include "qelutils/xlate.h"
#include "res/ids.h"
#include "ui/screen.h"

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

UCeFilePropertyDlg::UCeFilePropertyDlg(std::wstring path, const FileNode& node, HWND parent)
    : Dialog(IDD_FILE_PROPERTY, parent), path_(std::move(path)), node_(node) {}

bool UCeFilePropertyDlg::OnInitDialog() {
    const bool is_folder = node_.is_folder != 0;
    SetDlgItemTextW(Handle(), IDC_PROPERTY_PATH, path_.c_str());
    ShowIcon();
    ShowKind(is_folder);
    const FILETIME& time = is_folder ? node_.creation_time : node_.last_write_time;
    SetDlgItemTextW(Handle(), IDC_PROPERTY_DATE, DateText(time).c_str());
    SetDlgItemTextW(Handle(), IDC_PROPERTY_SIZE, SizeText(node_.size_low).c_str());
    ShowAttribute(IDC_PROPERTY_READ_ONLY, FILE_ATTRIBUTE_READONLY);
    ShowAttribute(IDC_PROPERTY_HIDDEN, FILE_ATTRIBUTE_HIDDEN);
    ShowAttribute(IDC_PROPERTY_ARCHIVE, FILE_ATTRIBUTE_ARCHIVE);
    return true;
}

std::optional<LRESULT> UCeFilePropertyDlg::OnMessage(UINT message, WPARAM /*wparam*/, LPARAM /*lparam*/) {
    if (message == WM_DPICHANGED) {
        ShowIcon();
    }
    return std::nullopt;
}

void UCeFilePropertyDlg::ShowIcon() {
    icon_ =
        ui::ShowIcon(Item(IDC_PROPERTY_ICON), node_.is_folder != 0 ? IDI_PROPERTY_FOLDER : IDI_PROPERTY_FILE);
}

void UCeFilePropertyDlg::ShowKind(bool is_folder) {
    const std::wstring type = is_folder ? Xlate(L"Folder") : FileTypeText(path_);
    SetDlgItemTextW(Handle(), IDC_PROPERTY_TYPE, type.c_str());
    const std::wstring date_label = is_folder ? Xlate(L"Created:") : Xlate(L"Modified:");
    SetDlgItemTextW(Handle(), IDC_PROPERTY_DATE_LABEL, date_label.c_str());
    if (is_folder) {
        ShowWindow(Item(IDC_PROPERTY_SIZE_LABEL), SW_HIDE);
        ShowWindow(Item(IDC_PROPERTY_SIZE), SW_HIDE);
    }
}

void UCeFilePropertyDlg::ShowAttribute(int id, std::uint32_t attribute) {
    CheckDlgButton(Handle(), id, (node_.attributes & attribute) != 0 ? BST_CHECKED : BST_UNCHECKED);
}

}  // namespace orvane
