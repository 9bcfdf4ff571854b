// The about box.
#pragma once

#include "ui/dialog.h"

namespace orvane {

class CAboutDlg : public ui::Dialog {
  public:
    explicit CAboutDlg(HWND parent);

  protected:
    bool OnInitDialog() override;
};

}  // namespace orvane
