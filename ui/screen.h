// What a drawing has to know of the screen and of the user's colours.
#pragma once

#include <windows.h>

namespace orvane::ui {

// Dots per inch of the screen that the window is on, 96 at 100 %; for a null window those of the system.
int DpiOf(HWND window);
// A length in pixels at 100 % on a screen of that density.
inline int Scaled(int pixels, int dpi) {
    return MulDiv(pixels, dpi, USER_DEFAULT_SCREEN_DPI);
}

// The user has a high-contrast theme: only the system's colours may be used.
bool HasHighContrast();

}  // namespace orvane::ui
