#include "controls/color_swatch.h"

#include <string>

#include "controls/tick_pictures.h"
#include "platform/handles.h"

namespace orvane {

void DrawColorSwatch(HDC dc, const RECT& cell, const COLORENTRY* entry) {
    constexpr COLORENTRY kNoEntry{RGB(255, 255, 255), 15};
    const COLORENTRY& shown = entry != nullptr ? *entry : kNoEntry;
    const int average = (GetRValue(shown.color) + GetGValue(shown.color) + GetBValue(shown.color)) / 3;
    RECT inner = cell;
    InflateRect(&inner, -kCellInset, -kCellInset);
    const UniqueBrush brush(CreateSolidBrush(shown.color));
    FillRect(dc, &inner, brush.Get());
    SetBkMode(dc, TRANSPARENT);
    SetTextColor(dc, average < 128 ? RGB(255, 255, 255) : RGB(0, 0, 0));
    DrawTextW(dc, std::to_wstring(shown.index).c_str(), -1, &inner,
              DT_CENTER | DT_VCENTER | DT_SINGLELINE | DT_NOPREFIX);
}

}  // namespace orvane
