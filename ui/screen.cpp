#include "ui/screen.h"

#include <utility>

#include "platform/resources.h"

namespace orvane::ui {

namespace {

// In pixels at 100 %.
constexpr int kBigIcon = 32;
constexpr int kSmallIcon = 16;

}  // namespace

int DpiOf(HWND window) {
    // Windows 7 to 8.1 do not know it.
    using GetDpiForWindowFunction = UINT(WINAPI*)(HWND);
    static const auto get_dpi_for_window = reinterpret_cast<GetDpiForWindowFunction>(
        reinterpret_cast<void*>(GetProcAddress(GetModuleHandleW(L"user32.dll"), "GetDpiForWindow")));
    const UINT window_dpi =
        get_dpi_for_window != nullptr && window != nullptr ? get_dpi_for_window(window) : 0;
    if (window_dpi != 0) {
        return static_cast<int>(window_dpi);
    }
    HDC dc = GetDC(nullptr);
    const int system_dpi = dc != nullptr ? GetDeviceCaps(dc, LOGPIXELSX) : 0;
    ReleaseDC(nullptr, dc);
    return system_dpi != 0 ? system_dpi : USER_DEFAULT_SCREEN_DPI;
}

void WindowIcons::Set(HWND window, int icon_id) {
    // The window shows the new ones before the old ones go.
    UniqueIcon big_icon = LoadOwnedIcon(icon_id, Scaled(kBigIcon, DpiOf(window)));
    UniqueIcon small_icon = LoadOwnedIcon(icon_id, Scaled(kSmallIcon, DpiOf(window)));
    SendMessageW(window, WM_SETICON, ICON_BIG, reinterpret_cast<LPARAM>(big_icon.Get()));
    SendMessageW(window, WM_SETICON, ICON_SMALL, reinterpret_cast<LPARAM>(small_icon.Get()));
    big_ = std::move(big_icon);
    small_ = std::move(small_icon);
}

UniqueIcon ShowIcon(HWND control, int icon_id) {
    UniqueIcon icon = LoadOwnedIcon(icon_id, Scaled(kBigIcon, DpiOf(control)));
    SendMessageW(control, STM_SETICON, reinterpret_cast<WPARAM>(icon.Get()), 0);
    return icon;
}

bool HasHighContrast() {
    HIGHCONTRASTW contrast{};
    contrast.cbSize = sizeof contrast;
    return SystemParametersInfoW(SPI_GETHIGHCONTRAST, contrast.cbSize, &contrast, 0) != FALSE &&
           (contrast.dwFlags & HCF_HIGHCONTRASTON) != 0;
}

}  // namespace orvane::ui
