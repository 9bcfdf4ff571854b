// The dialog that picks a folder on the device.
#pragma once

#include <windows.h>

#include <string>
#include <vector>

#include "browse/dir_tree.h"
#include "ui/dialog.h"

namespace orvane {

// Shows the device's folder tree and the selected folder's path. When DoModal answers IDOK, ResultFolder is
// a device path that begins and ends with "\" (the folder that holds it where a file was selected), or empty
// when nothing was selected.
class CCeBrowseDlg : public ui::Dialog {
  public:
    // `file_name_mode` not 0: selecting a folder leaves the file-name field as it is; 0: it empties it. The
    // second flag has no meaning. `filters`: what files show, see UCeDirTree::AddFilter, which drops what is
    // too long. An empty title leaves the template's caption. `initial_folder` is selected as far down as it
    // exists on the device.
    CCeBrowseDlg(int file_name_mode, int second_flag, std::vector<std::wstring> filters, std::wstring title,
                 std::wstring initial_folder, HWND parent);

    const std::wstring& ResultFolder() const { return result_folder_; }

  protected:
    bool OnInitDialog() override;
    std::optional<LRESULT> OnMessage(UINT message, WPARAM wparam, LPARAM lparam) override;
    void DoDataExchange(ui::DataExchange& exchange) override;

  private:
    bool ReplacePlaceholder();
    void OnSelectionChanged();

    std::wstring result_folder_;
    UCeDirTree tree_;
    std::wstring title_;
    std::wstring initial_folder_;
    std::vector<std::wstring> filters_;
    bool file_name_mode_;
};

}  // namespace orvane
