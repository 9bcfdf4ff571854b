#include "ui/data_exchange.h"

namespace orvane::ui {

void DataExchange::Text(int id, std::wstring& value) const {
    if (save_) {
        value = WindowText(GetDlgItem(dialog_, id));
    } else {
        SetDlgItemTextW(dialog_, id, value.c_str());
    }
}

void DataExchange::Check(int id, int& value) const {
    if (save_) {
        value = IsDlgButtonChecked(dialog_, id) == BST_CHECKED ? 1 : 0;
    } else {
        CheckDlgButton(dialog_, id, value != 0 ? BST_CHECKED : BST_UNCHECKED);
    }
}

std::wstring WindowText(HWND window) {
    std::wstring text(static_cast<std::size_t>(GetWindowTextLengthW(window)), L'\0');
    if (!text.empty()) {
        // The length may shrink between the two calls.
        const int length = GetWindowTextW(window, text.data(), static_cast<int>(text.size()) + 1);
        text.resize(static_cast<std::size_t>(length));
    }
    return text;
}

}  // namespace orvane::ui
