// What a drawing has to know of the screen and of the user's colours.
#pragma once

#include <windows.h>

#include "platform/handles.h"

namespace orvane::ui {

// Dots per inch of the screen that the window is on, 96 at 100 %; for a null window those of the system.
int DpiOf(HWND window);
// A length in pixels at 100 % on a screen of that density.
inline int Scaled(int pixels, int dpi) {
    return MulDiv(pixels, dpi, USER_DEFAULT_SCREEN_DPI);
}

// The icons of a window, each the drawing for the size that its screen has for it: the big one of task bar
// and task switcher, the small one of the caption. They must live as long as the window shows them.
class WindowIcons {
  public:
    // Gives the window that icon of the resources; to be called again when its screen's density changes.
    void Set(HWND window, int icon_id);
    HICON Big() const { return big_.Get(); }

  private:
    UniqueIcon big_;
    UniqueIcon small_;
};

// Shows an icon of the resources in a control for icons: the drawing for the size that 32 pixels at 100 %
// have on its screen. The result must live as long as the control shows it.
UniqueIcon ShowIcon(HWND control, int icon_id);

// The user has a high-contrast theme: only the system's colours may be used.
bool HasHighContrast();

}  // namespace orvane::ui
