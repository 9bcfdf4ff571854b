// What the cells of a record list show beside text.
#pragma once

#include <windows.h>

#include <optional>

#include "platform/handles.h"

namespace orvane {

// Lengths in pixels at 100 %: the width and height of a tick picture, and how far pictures and colour
// swatches stay clear of their cell's edges.
inline constexpr int kTickSize = 10;
inline constexpr int kCellInset = 2;

// The ticked and the empty box. At 100 % they come from the program's resources: bitmaps with a frame for a
// normal item and, right of it, one for a selected item, whose background RGB(0, 128, 128) becomes white in
// the first and the system's highlight colour in the second. They are loaded at the first drawing and again
// when the user changed the highlight colour. For denser screens the same boxes are drawn with lines, and so
// they are, in the system's colours, under a high-contrast theme.
class TickPictures {
  public:
    // In the middle of the cell of a window with that many dots per inch.
    void Draw(HDC dc, const RECT& cell, bool ticked, bool selected, int dpi);

  private:
    struct Picture {
        UniqueBitmap bitmap;
        // Has the bitmap selected, and so is declared after it.
        UniqueMemoryDc dc;
    };

    static Picture Load(UINT id, COLORREF highlight);
    void LoadForPresentColors();

    std::optional<Picture> ticked_;
    std::optional<Picture> empty_;
    COLORREF highlight_ = CLR_INVALID;
};

// One colour of a palette.
struct COLORENTRY {
    COLORREF color;
    int index;
};

// A cell that shows a colour of a palette; kept for lists of colours, of which the program has none. Fills
// the cell with the entry's colour and writes its number in the middle, in white on dark colours and in black
// on light ones. Without an entry: white, number 15.
void DrawColorSwatch(HDC dc, const RECT& cell, const COLORENTRY* entry);

}  // namespace orvane
