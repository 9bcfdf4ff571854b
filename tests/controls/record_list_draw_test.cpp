#include <gtest/gtest.h>

#include "platform/handles.h"
#include "tests/controls/list_window.h"

namespace orvane::testing {
namespace {

constexpr COLORREF kBlack = RGB(0, 0, 0);
constexpr COLORREF kWhite = RGB(255, 255, 255);

// How many pixels of this colour the window paints in the rectangle.
int Count(HWND window, const RECT& part, COLORREF color) {
    HDC window_dc = GetDC(window);
    UniqueBitmap bitmap;
    UniqueMemoryDc dc;
    bitmap.Reset(CreateCompatibleBitmap(window_dc, part.right, part.bottom));
    dc.Reset(CreateCompatibleDC(window_dc));
    ReleaseDC(window, window_dc);
    SelectObject(dc.Get(), bitmap.Get());
    SendMessageW(window, WM_PRINTCLIENT, reinterpret_cast<WPARAM>(dc.Get()), PRF_CLIENT | PRF_ERASEBKGND);
    int count = 0;
    for (int y = part.top; y < part.bottom; ++y) {
        for (int x = part.left; x < part.right; ++x) {
            count += GetPixel(dc.Get(), x, y) == color ? 1 : 0;
        }
    }
    return count;
}

TEST(RecordListDraw, ShowsTicksKindsAndTheSelection) {
    ListWindow window;
    HWND list = window.list.Handle();
    window.list.SetColumnKind(1, kColumnBlueText1);
    window.Fill({{L"mm", L"MM", true}, {L"mm", L"MM", false}, {L"mm", L"MM", true}, {L"mm", L"MM", false}});
    window.list.SelectAll();
    ListView_SetItemState(list, 0, 0, LVIS_SELECTED);
    ListView_SetItemState(list, 1, 0, LVIS_SELECTED);
    SetFocus(list);
    for (int row = 0; row < 4; ++row) {
        const COLORREF background = row < 2 ? kWhite : GetSysColor(COLOR_HIGHLIGHT);
        const COLORREF mark = row < 2 ? kBlack : kWhite;
        const RECT tick = window.Cell(row, 2);
        const int top = (tick.top + tick.bottom - 10) / 2;
        const RECT inside = {tick.left + 6, top + 1, tick.left + 14, top + 9};
        const int marked = Count(list, inside, mark);
        EXPECT_EQ(marked > 8, window.records[static_cast<std::size_t>(row)].ticked) << row;
        EXPECT_EQ(marked + Count(list, inside, background), 64) << row;
        // Letters are smoothed: what is looked for are their darkest pixels.
        EXPECT_GT(Count(list, window.Cell(row, 1), row < 2 ? RGB(0, 0, 255) : kWhite), 10) << row;
        EXPECT_GT(Count(list, window.Cell(row, 1), background), 500) << row;
    }
}

TEST(RecordListDraw, TheSortMarkIsInTheColumnSorted) {
    ListWindow window;
    HWND header = ListView_GetHeader(window.list.Handle());
    RECT item{};
    Header_GetItemRect(header, 0, &item);
    item.left = item.right - 20;
    for (const int sorted : {1, 0}) {
        window.ClickHeader(sorted);
        EXPECT_EQ(Count(header, item, GetSysColor(COLOR_3DHILIGHT)) > 5, sorted == 0);
    }
}

}  // namespace
}  // namespace orvane::testing
