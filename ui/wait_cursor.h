// The wait cursor while something blocks the user-interface thread.
#pragma once

#include <windows.h>

namespace orvane::ui {

// Shows the hour glass from construction to destruction, then the cursor that was shown before.
class WaitCursor {
  public:
    WaitCursor() : previous_(SetCursor(LoadCursorW(nullptr, IDC_WAIT))) {}
    ~WaitCursor() { SetCursor(previous_); }
    WaitCursor(const WaitCursor&) = delete;
    WaitCursor& operator=(const WaitCursor&) = delete;

  private:
    HCURSOR previous_;
};

}  // namespace orvane::ui
