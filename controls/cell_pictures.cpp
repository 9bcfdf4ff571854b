#include "controls/cell_pictures.h"

#include <array>
#include <string>

#include "platform/resources.h"
#include "res/ids.h"
#include "ui/screen.h"

namespace orvane {

namespace {

constexpr COLORREF kBitmapBackground = 0x808000;
constexpr COLORREF kBlack = RGB(0, 0, 0);
constexpr COLORREF kWhite = RGB(255, 255, 255);
constexpr COLORREF kGray = RGB(96, 96, 96);

struct BoxColors {
    COLORREF frame;
    COLORREF inside;
    COLORREF mark;
};

BoxColors ColorsOfBox(bool selected) {
    if (ui::HasHighContrast()) {
        const COLORREF text = GetSysColor(selected ? COLOR_HIGHLIGHTTEXT : COLOR_WINDOWTEXT);
        return {text, GetSysColor(selected ? COLOR_HIGHLIGHT : COLOR_WINDOW), text};
    }
    return selected ? BoxColors{kWhite, GetSysColor(COLOR_HIGHLIGHT), kWhite}
                    : BoxColors{kGray, kWhite, kBlack};
}

void Fill(HDC dc, const RECT& rect, COLORREF color) {
    SetDCBrushColor(dc, color);
    FillRect(dc, &rect, static_cast<HBRUSH>(GetStockObject(DC_BRUSH)));
}

// The outline of the tick, in tenths of the box.
constexpr std::array<POINT, 7> kTickOutline = {{{2, 4}, {4, 6}, {8, 2}, {8, 5}, {5, 8}, {3, 8}, {2, 7}}};

void DrawBox(HDC dc, const RECT& box, bool ticked, bool selected, int line) {
    const BoxColors colors = ColorsOfBox(selected);
    Fill(dc, box, colors.frame);
    RECT inside = box;
    InflateRect(&inside, -line, -line);
    Fill(dc, inside, colors.inside);
    if (!ticked) {
        return;
    }
    std::array<POINT, kTickOutline.size()> outline = kTickOutline;
    for (POINT& point : outline) {
        point = {box.left + MulDiv(point.x, box.right - box.left, kTickSize),
                 box.top + MulDiv(point.y, box.bottom - box.top, kTickSize)};
    }
    HGDIOBJ pen = SelectObject(dc, GetStockObject(NULL_PEN));
    HGDIOBJ brush = SelectObject(dc, GetStockObject(DC_BRUSH));
    SetDCBrushColor(dc, colors.mark);
    Polygon(dc, outline.data(), static_cast<int>(outline.size()));
    SelectObject(dc, brush);
    SelectObject(dc, pen);
}

}  // namespace

void TickPictures::Draw(HDC dc, const RECT& cell, bool ticked, bool selected, int dpi) {
    const int size = ui::Scaled(kTickSize, dpi);
    const POINT corner{(cell.left + cell.right - size) / 2, (cell.top + cell.bottom - size) / 2};
    if (size != kTickSize || ui::HasHighContrast()) {
        const int line = std::max(1, dpi / USER_DEFAULT_SCREEN_DPI);
        DrawBox(dc, {corner.x, corner.y, corner.x + size, corner.y + size}, ticked, selected, line);
        return;
    }
    LoadForPresentColors();
    const Picture& picture = ticked ? *ticked_ : *empty_;
    BitBlt(dc, corner.x, corner.y, size, size, picture.dc.Get(), selected ? size : 0, 0, SRCCOPY);
}

TickPictures::Picture TickPictures::Load(UINT id, COLORREF highlight) {
    Picture picture;
    picture.bitmap.Reset(static_cast<HBITMAP>(
        LoadImageW(ResourceModule(), MAKEINTRESOURCEW(id), IMAGE_BITMAP, 0, 0, LR_CREATEDIBSECTION)));
    picture.dc.Reset(CreateCompatibleDC(nullptr));
    HDC dc = picture.dc.Get();
    SelectObject(dc, picture.bitmap.Get());
    for (int y = 0; y < kTickSize; ++y) {
        for (int x = 0; x < 2 * kTickSize; ++x) {
            if (GetPixel(dc, x, y) == kBitmapBackground) {
                SetPixelV(dc, x, y, x < kTickSize ? kWhite : highlight);
            }
        }
    }
    return picture;
}

void TickPictures::LoadForPresentColors() {
    const COLORREF highlight = GetSysColor(COLOR_HIGHLIGHT);
    if (highlight == highlight_) {
        return;
    }
    ticked_.emplace(Load(IDB_TICKED, highlight));
    empty_.emplace(Load(IDB_UNTICKED, highlight));
    highlight_ = highlight;
}

void DrawColorSwatch(HDC dc, const RECT& cell, const COLORENTRY* entry) {
    constexpr COLORENTRY kNoEntry{kWhite, 15};
    const COLORENTRY& shown = entry != nullptr ? *entry : kNoEntry;
    const int average = (GetRValue(shown.color) + GetGValue(shown.color) + GetBValue(shown.color)) / 3;
    RECT inner = cell;
    InflateRect(&inner, -kCellInset, -kCellInset);
    Fill(dc, inner, shown.color);
    SetBkMode(dc, TRANSPARENT);
    SetTextColor(dc, average < 128 ? kWhite : kBlack);
    DrawTextW(dc, std::to_wstring(shown.index).c_str(), -1, &inner,
              DT_CENTER | DT_VCENTER | DT_SINGLELINE | DT_NOPREFIX);
}

}  // namespace orvane
