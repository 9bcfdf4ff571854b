// The wait dialog of the device folder tree.
#pragma once

#include <windows.h>

#include <string>

#include "platform/handles.h"
#include "ui/dialog.h"

namespace orvane {

// Modeless: a text beside a small animation. The user cannot close it; its owner does, by Destroy or with
// the object. The animation moves only while the thread handles messages, so not during a read.
class CLoadProgressDlg : public ui::Dialog {
  public:
    CLoadProgressDlg(std::wstring text, HWND parent);
    ~CLoadProgressDlg() override { Destroy(); }  // Before the icon that the window shows.

  protected:
    bool OnInitDialog() override;
    void OnOK() override {}
    void OnCancel() override {}
    std::optional<LRESULT> OnMessage(UINT message, WPARAM wparam, LPARAM lparam) override;

  private:
    void ShowFrame();

    std::size_t frame_ = 0;
    std::wstring text_;
    UniqueIcon icon_;
};

}  // namespace orvane
