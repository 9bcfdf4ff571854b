// The pictures in the tick column.
#pragma once

#include <windows.h>

#include <optional>

#include "platform/handles.h"

namespace orvane {

// Size of one frame of a tick picture, in pixels.
inline constexpr int kTickWidth = 10;
inline constexpr int kTickHeight = 10;
// How far pictures and colour swatches stay clear of their cell's edges, in pixels.
inline constexpr int kCellInset = 2;

// The ticked and the empty box, from the program's resources. Each bitmap holds a frame for a normal item
// and, right of it, one for a selected item; their background is RGB(0, 128, 128), which becomes white in the
// first and the system's highlight colour in the second. The bitmaps are loaded at the first drawing and
// again when the user changed the highlight colour. Without them nothing is drawn.
class TickPictures {
  public:
    void Draw(HDC dc, const RECT& cell, bool ticked, bool selected);

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

}  // namespace orvane
