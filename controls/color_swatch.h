// A cell that shows a colour of a palette.
#pragma once

#include <windows.h>

namespace orvane {

// One colour of a palette.
struct COLORENTRY {
    COLORREF color;
    int index;
};

// Fills the cell with the entry's colour and writes its number in the middle, in white on dark colours and
// in black on light ones. Without an entry: white, number 15.
void DrawColorSwatch(HDC dc, const RECT& cell, const COLORENTRY* entry);

}  // namespace orvane
