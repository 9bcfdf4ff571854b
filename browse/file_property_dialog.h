// The properties of one file or folder on the device.
#pragma once

#include <windows.h>

#include <cstdint>
#include <optional>
#include <string>

#include "device/file_node.h"
#include "platform/handles.h"
#include "ui/dialog.h"

namespace orvane {

// Its texts.

// What a file's extension makes of it: "JOB File" for \Jobs\site1.job. Empty for a path without a dot or
// with a dot at its end; the bare " File" when the last dot belongs to a folder.
std::wstring FileTypeText(const std::wstring& path);

// The local date and time in the user's format; "Invalid DateTime" for a time that cannot be converted.
std::wstring DateText(const FILETIME& time);

// "{1} bytes". The low word of the size is taken as a signed number and the high word left out, so that a
// file of 2 GiB shows a negative number: it is meant.
std::wstring SizeText(std::uint32_t size_low);

// Shows what a listing has found out already; it asks the device nothing and changes nothing. DoModal's
// result has no meaning.
class UCeFilePropertyDlg : public ui::Dialog {
  public:
    // `path`: the entry's device path, without "\" at its end. `node` is not owned and has to live until
    // the dialog has ended.
    UCeFilePropertyDlg(std::wstring path, const FileNode& node, HWND parent);

  protected:
    bool OnInitDialog() override;
    std::optional<LRESULT> OnMessage(UINT message, WPARAM wparam, LPARAM lparam) override;

  private:
    void ShowIcon();
    void ShowKind(bool is_folder);
    void ShowAttribute(int id, std::uint32_t attribute);

    UniqueIcon icon_;
    std::wstring path_;
    const FileNode& node_;
};

}  // namespace orvane
