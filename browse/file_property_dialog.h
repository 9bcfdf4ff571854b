// The properties of one file or folder on the device.
#pragma once

#include <windows.h>

#include <string>

#include "device/file_node.h"
#include "platform/handles.h"
#include "ui/dialog.h"

namespace orvane {

// Shows what a listing has found out already; it asks the device nothing and changes nothing. DoModal's
// result has no meaning.
class UCeFilePropertyDlg : public ui::Dialog {
  public:
    // `path`: the entry's device path, without "\" at its end. `node` is not owned and has to live until
    // the dialog has ended.
    UCeFilePropertyDlg(std::wstring path, const FileNode& node, HWND parent);

  protected:
    bool OnInitDialog() override;

  private:
    void ShowKind(bool is_folder);
    void ShowAttribute(int id, std::uint32_t attribute);

    UniqueIcon file_icon_;
    UniqueIcon folder_icon_;
    std::wstring path_;
    const FileNode& node_;
};

}  // namespace orvane
