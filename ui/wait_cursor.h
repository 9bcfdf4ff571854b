// The wait cursor while something blocks the user-interface thread.
#pragma once

#include <windows.h>

namespace orvane::ui {

// Shows the hour glass from construction to destruction, then the arrow.
class WaitCursor {
  public:
    WaitCursor() { SetCursor(LoadCursorW(nullptr, IDC_WAIT)); }
    ~WaitCursor() { SetCursor(LoadCursorW(nullptr, IDC_ARROW)); }
    WaitCursor(const WaitCursor&) = delete;
    WaitCursor& operator=(const WaitCursor&) = delete;
};

}  // namespace orvane::ui
