#include "controls/tick_pictures.h"

#include "platform/resources.h"
#include "res/ids.h"

namespace orvane {

namespace {

constexpr COLORREF kBackground = 0x808000;
constexpr COLORREF kWhite = RGB(255, 255, 255);

}  // namespace

void TickPictures::Draw(HDC dc, const RECT& cell, bool ticked, bool selected) {
    LoadForPresentColors();
    const Picture& picture = ticked ? *ticked_ : *empty_;
    RECT inner = cell;
    InflateRect(&inner, -kCellInset, -kCellInset);
    BitBlt(dc, (inner.left + inner.right - kTickWidth) / 2, (inner.top + inner.bottom - kTickHeight) / 2,
           kTickWidth, kTickHeight, picture.dc.Get(), selected ? kTickWidth : 0, 0, SRCCOPY);
}

TickPictures::Picture TickPictures::Load(UINT id, COLORREF highlight) {
    Picture picture;
    picture.bitmap.Reset(static_cast<HBITMAP>(
        LoadImageW(ResourceModule(), MAKEINTRESOURCEW(id), IMAGE_BITMAP, 0, 0, LR_CREATEDIBSECTION)));
    picture.dc.Reset(CreateCompatibleDC(nullptr));
    HDC dc = picture.dc.Get();
    SelectObject(dc, picture.bitmap.Get());
    for (int y = 0; y < kTickHeight; ++y) {
        for (int x = 0; x < 2 * kTickWidth; ++x) {
            if (GetPixel(dc, x, y) == kBackground) {
                SetPixelV(dc, x, y, x < kTickWidth ? kWhite : highlight);
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

}  // namespace orvane
