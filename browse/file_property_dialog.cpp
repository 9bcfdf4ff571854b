#include "browse/file_property_dialog.h"

#include <utility>

#include "browse/icons.h"
#include "browse/property_texts.h"
#include "qelutils/xlate.h"
#include "res/ids.h"

namespace orvane {

UCeFilePropertyDlg::UCeFilePropertyDlg(std::wstring path, const FileNode& node, HWND parent)
    : Dialog(IDD_FILE_PROPERTY, parent),
      file_icon_(LoadOwnedIcon(IDI_PROPERTY_FILE)),
      folder_icon_(LoadOwnedIcon(IDI_PROPERTY_FOLDER)),
      path_(std::move(path)),
      node_(node) {}

bool UCeFilePropertyDlg::OnInitDialog() {
    const bool is_folder = node_.is_folder != 0;
    SetDlgItemTextW(Handle(), IDC_PROPERTY_PATH, path_.c_str());
    ShowKind(is_folder);
    const FILETIME& time = is_folder ? node_.creation_time : node_.last_write_time;
    SetDlgItemTextW(Handle(), IDC_PROPERTY_DATE, DateText(time).c_str());
    SetDlgItemTextW(Handle(), IDC_PROPERTY_SIZE, SizeText(node_.size_low).c_str());
    ShowAttribute(IDC_PROPERTY_READ_ONLY, FILE_ATTRIBUTE_READONLY);
    ShowAttribute(IDC_PROPERTY_HIDDEN, FILE_ATTRIBUTE_HIDDEN);
    ShowAttribute(IDC_PROPERTY_ARCHIVE, FILE_ATTRIBUTE_ARCHIVE);
    return true;
}

void UCeFilePropertyDlg::ShowKind(bool is_folder) {
    HICON icon = is_folder ? folder_icon_.Get() : file_icon_.Get();
    SendDlgItemMessageW(Handle(), IDC_PROPERTY_ICON, STM_SETICON, reinterpret_cast<WPARAM>(icon), 0);
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
