#include "browse/browse_dialog.h"

#include <utility>

#include "res/ids.h"

namespace orvane {

CCeBrowseDlg::CCeBrowseDlg(int file_name_mode, int /*second_flag*/, std::vector<std::wstring> filters,
                           std::wstring title, std::wstring initial_folder, HWND parent)
    : Dialog(IDD_BROWSE, parent),
      title_(std::move(title)),
      initial_folder_(std::move(initial_folder)),
      filters_(std::move(filters)),
      file_name_mode_(file_name_mode != 0) {}

void CCeBrowseDlg::DoDataExchange(ui::DataExchange& exchange) {
    exchange.Text(IDC_BROWSE_FOLDER, result_folder_);
}

bool CCeBrowseDlg::OnInitDialog() {
    if (!ReplacePlaceholder()) {
        End(IDCANCEL);
        return true;
    }
    for (const std::wstring& filter : filters_) {
        tree_.AddFilter(filter);
    }
    if (!title_.empty()) {
        SetWindowTextW(Handle(), title_.c_str());
    }
    // Now and not after this handler, because the read keeps the thread busy: the wait dialog, and the
    // message when there is no device, are to have the dialog behind them.
    ShowPainted();
    tree_.Reload();
    // In time: the tree is filled by a posted message.
    tree_.SetPathToSelect(initial_folder_);
    return true;
}

// The tree takes over what the template says about the placeholder: place, styles, font and place in the
// tab order.
bool CCeBrowseDlg::ReplacePlaceholder() {
    HWND placeholder = Item(IDC_BROWSE_TREE);
    RECT place{};
    GetWindowRect(placeholder, &place);
    MapWindowPoints(nullptr, Handle(), reinterpret_cast<POINT*>(&place), 2);
    const auto style = static_cast<DWORD>(GetWindowLongPtrW(placeholder, GWL_STYLE));
    const auto ex_style = static_cast<DWORD>(GetWindowLongPtrW(placeholder, GWL_EXSTYLE));
    HWND before = GetWindow(placeholder, GW_HWNDPREV);
    DestroyWindow(placeholder);
    if (!tree_.Create(style, ex_style, place, Handle(), IDC_BROWSE_TREE)) {
        return false;
    }
    SetWindowPos(tree_.Handle(), before != nullptr ? before : HWND_TOP, 0, 0, 0, 0,
                 SWP_NOMOVE | SWP_NOSIZE | SWP_NOACTIVATE);
    SendMessageW(tree_.Handle(), WM_SETFONT, static_cast<WPARAM>(SendMessageW(Handle(), WM_GETFONT, 0, 0)),
                 FALSE);
    return true;
}

std::optional<LRESULT> CCeBrowseDlg::OnMessage(UINT message, WPARAM /*wparam*/, LPARAM lparam) {
    if (message == WM_NOTIFY) {
        const auto& header = *reinterpret_cast<const NMHDR*>(lparam);
        if (header.idFrom == IDC_BROWSE_TREE && header.code == TVN_SELCHANGEDW) {
            OnSelectionChanged();
            return 0;
        }
    }
    return std::nullopt;
}

void CCeBrowseDlg::OnSelectionChanged() {
    const std::wstring path = tree_.SelectedPath().value_or(L"");
    const std::size_t name_begin = path.rfind(L'\\') + 1;  // 0 for the empty path.
    const std::wstring folder = path.substr(0, name_begin);
    const std::wstring name = path.substr(name_begin);
    if (path.empty() || !name.empty() || !file_name_mode_) {
        SetDlgItemTextW(Handle(), IDC_BROWSE_FILE_NAME, name.c_str());
    }
    SetDlgItemTextW(Handle(), IDC_BROWSE_FOLDER, folder.c_str());
    tree_.SetCurrentFolder(folder);
}

}  // namespace orvane
