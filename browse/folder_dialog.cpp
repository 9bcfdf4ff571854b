#include "browse/folder_dialog.h"

#include <algorithm>
#include <array>
#include <utility>

#include "platform/resources.h"
#include "platform/text_case.h"
#include "qelutils/xlate.h"
#include "res/ids.h"
#include "ui/dialog.h"

namespace orvane {

namespace {

// The window property that leads from the system's dialog to the object.
constexpr const wchar_t* kObjectProperty = L"OrvaneFolderDialog";

// Puts the process's current directory back: the old-style dialog changes it while the user browses, and
// does not put it back on every path.
class CurrentDirectoryKeeper {
  public:
    CurrentDirectoryKeeper() {
        const DWORD length = GetCurrentDirectoryW(static_cast<DWORD>(directory_.size()), directory_.data());
        if (length >= directory_.size()) {
            directory_[0] = L'\0';
        }
    }
    ~CurrentDirectoryKeeper() {
        if (directory_[0] != L'\0') {
            SetCurrentDirectoryW(directory_.data());
        }
    }
    CurrentDirectoryKeeper(const CurrentDirectoryKeeper&) = delete;
    CurrentDirectoryKeeper& operator=(const CurrentDirectoryKeeper&) = delete;

  private:
    std::array<wchar_t, kPathBufferChars> directory_{};
};

bool IsFolder(const std::wstring& path) {
    const DWORD attributes = GetFileAttributesW(path.c_str());
    return attributes != INVALID_FILE_ATTRIBUTES && (attributes & FILE_ATTRIBUTE_DIRECTORY) != 0;
}

const wchar_t* NullIfEmpty(const std::wstring& text) {
    return text.empty() ? nullptr : text.c_str();
}

// From the last "\" on; the whole path when there is none.
std::wstring_view LastComponent(std::wstring_view path) {
    const std::size_t cut = path.rfind(L'\\');
    return cut == std::wstring_view::npos ? path : path.substr(cut);
}

std::wstring ExpandAbbreviation(std::wstring_view field, std::wstring_view directory) {
    const std::size_t cut = directory.rfind(L'\\');
    if (cut == std::wstring_view::npos || EqualIgnoringCase(LastComponent(field), LastComponent(directory))) {
        return std::wstring(directory);
    }
    return std::wstring(directory).append(field.substr(std::min(cut, field.size())));
}

}  // namespace

ChosenFolder ChosenFolderOf(std::wstring_view field, std::wstring_view file_path, std::size_t name_offset) {
    const std::wstring_view directory = file_path.substr(0, name_offset > 0 ? name_offset - 1 : 0);
    const bool is_abbreviated = field.find(L"...") != std::wstring_view::npos;
    return {is_abbreviated ? ExpandAbbreviation(field, directory)
                           : std::wstring(WithoutTrailingBackslashes(field)),
            std::wstring(directory)};
}

CFolderDialog::CFolderDialog(std::wstring initial_text, std::wstring initial_directory, int /*unused*/,
                             std::wstring title, HWND parent)
    : initial_text_(std::move(initial_text)),
      initial_directory_(std::move(initial_directory)),
      title_(std::move(title)),
      parent_(parent) {
    record_.lStructSize = sizeof(record_);
    record_.Flags = OFN_HIDEREADONLY | OFN_NOCHANGEDIR | OFN_ENABLETEMPLATE | OFN_ENABLEHOOK | OFN_LONGNAMES;
}

INT_PTR CFolderDialog::DoModal() {
    const CurrentDirectoryKeeper keeper;
    file_path_[0] = L'\0';
    record_.hwndOwner = parent_ != nullptr ? parent_ : GetActiveWindow();
    record_.lpstrFile = file_path_;
    record_.nMaxFile = static_cast<DWORD>(kPathBufferChars);
    record_.lpstrInitialDir = NullIfEmpty(initial_directory_);
    record_.lpstrTitle = NullIfEmpty(title_);
    record_.hInstance = ResourceModule();
    record_.lpTemplateName = MAKEINTRESOURCEW(IDD_FOLDER);
    record_.lpfnHook = Hook;
    record_.lCustData = reinterpret_cast<LPARAM>(this);
    return GetSaveFileNameW(&record_) ? IDOK : IDCANCEL;
}

ChosenFolder CFolderDialog::Chosen() const {
    return ChosenFolderOf(chosen_directory_, file_path_, record_.nFileOffset);
}

UINT_PTR CALLBACK CFolderDialog::Hook(HWND window, UINT message, WPARAM wparam, LPARAM lparam) noexcept {
    if (message == WM_INITDIALOG) {
        const auto& record = *reinterpret_cast<const OPENFILENAMEW*>(lparam);
        SetPropW(window, kObjectProperty, reinterpret_cast<HANDLE>(record.lCustData));
    }
    auto* dialog = static_cast<CFolderDialog*>(GetPropW(window, kObjectProperty));
    if (dialog == nullptr) {
        return 0;
    }
    if (message == WM_DESTROY) {
        RemovePropW(window, kObjectProperty);
    }
    try {
        return dialog->OnMessage(window, message, wparam);
    } catch (...) {
        // An exception must not unwind through the system's code. Memory is all that can have failed here.
        return 0;
    }
}

// 0 lets the system's dialog handle the message too; for WM_INITDIALOG it says that the focus is set.
UINT_PTR CFolderDialog::OnMessage(HWND window, UINT message, WPARAM wparam) {
    if (message == WM_INITDIALOG) {
        OnInitDialog(window);
    } else if (message == WM_PAINT && select_first_entry_) {
        OnFirstPaint(window);
    } else if (message == WM_COMMAND && LOWORD(wparam) == IDOK) {
        OnOk(window);
    }
    return 0;
}

void CFolderDialog::OnInitDialog(HWND window) {
    if (title_.empty()) {
        // Not every system leaves the template's caption when it is given none.
        SetWindowTextW(window, L"Select Directory");
    }
    XlateWnd(window);
    // OK accepts only a dialog with a file name; what folder that file would be in is what counts.
    // Translators: a file name that nobody sees; leave it as it is.
    SetDlgItemTextW(window, IDC_FOLDER_FILE_NAME, Xlate(L"Dummy").c_str());
    SetDlgItemTextW(window, IDC_FOLDER_DIRECTORY, initial_text_.c_str());
    ui::DataExchange(window, true).Text(IDC_FOLDER_DIRECTORY, chosen_directory_);
    SetFocus(GetDlgItem(window, IDC_FOLDER_DIRECTORY_LIST));
    select_first_entry_ = true;
}

// Only now, because the system's dialog selects an entry of its own after it was initialised.
void CFolderDialog::OnFirstPaint(HWND window) {
    select_first_entry_ = false;
    SendDlgItemMessageW(window, IDC_FOLDER_DIRECTORY_LIST, LB_SETCURSEL, 0, 0);
}

void CFolderDialog::OnOk(HWND window) {
    ui::DataExchange(window, true).Text(IDC_FOLDER_DIRECTORY, chosen_directory_);
    // The dialog would open a folder of the file's name in place of accepting the name. The current directory
    // is the folder that it shows.
    std::wstring file_name = ui::WindowText(GetDlgItem(window, IDC_FOLDER_FILE_NAME));
    while (IsFolder(file_name)) {
        file_name += L'_';
    }
    SetDlgItemTextW(window, IDC_FOLDER_FILE_NAME, file_name.c_str());
}

}  // namespace orvane
