#include <gtest/gtest.h>

#include "controls/cell_pictures.h"
#include "controls/record_list.h"
#include "platform/handles.h"
#include "tests/controls/list_window.h"

namespace orvane::testing {
namespace {

constexpr COLORREF kBlack = RGB(0, 0, 0);
constexpr COLORREF kWhite = RGB(255, 255, 255);

// What a window paints of itself, as pixels.
class Picture {
  public:
    explicit Picture(HWND window) {
        RECT client{};
        GetClientRect(window, &client);
        HDC window_dc = GetDC(window);
        bitmap_.Reset(CreateCompatibleBitmap(window_dc, client.right, client.bottom));
        dc_.Reset(CreateCompatibleDC(window_dc));
        ReleaseDC(window, window_dc);
        SelectObject(dc_.Get(), bitmap_.Get());
        SendMessageW(window, WM_PRINTCLIENT, reinterpret_cast<WPARAM>(dc_.Get()),
                     PRF_CLIENT | PRF_ERASEBKGND);
    }

    COLORREF At(int x, int y) const { return GetPixel(dc_.Get(), x, y); }

    // Pixels of this colour in the rectangle.
    int Count(const RECT& part, COLORREF color) const {
        int count = 0;
        for (int y = part.top; y < part.bottom; ++y) {
            for (int x = part.left; x < part.right; ++x) {
                count += At(x, y) == color ? 1 : 0;
            }
        }
        return count;
    }

  private:
    UniqueBitmap bitmap_;
    UniqueMemoryDc dc_;
};

TEST(RecordListDraw, TickedEntriesLookTicked) {
    ListWindow window(1039, LVS_SHOWSELALWAYS);
    window.Fill({{L"a", L"", true}, {L"b", L"", false}, {L"c", L"", true}, {L"d", L"", false}});
    window.list.SelectItem(2);
    ListView_SetItemState(window.list.Handle(), 3, LVIS_SELECTED, LVIS_SELECTED);
    SetFocus(window.Handle());
    const Picture picture(window.list.Handle());
    for (int row = 0; row < 4; ++row) {
        const COLORREF mark = row < 2 ? kBlack : kWhite;
        const COLORREF background = row < 2 ? kWhite : GetSysColor(COLOR_HIGHLIGHT);
        RECT cell = window.Cell(row, 2);
        // What the frame of the picture has in it, in a column of 20 pixels.
        const int top = (cell.top + cell.bottom - 8) / 2;
        const RECT inside{cell.left + 6, top, cell.left + 14, top + 8};
        const int marked = picture.Count(inside, mark);
        EXPECT_EQ(marked > 8, row % 2 == 0) << row;
        EXPECT_EQ(marked + picture.Count(inside, background), 64) << row;
        cell.right = cell.left + 5;
        EXPECT_EQ(picture.Count(cell, background), 5 * (cell.bottom - cell.top)) << row;
    }
}

TEST(RecordListDraw, SelectionFollowsFocusAndTextFollowsKind) {
    ListWindow window;
    window.list.SetColumnKind(0, kColumnText);
    window.list.SetColumnKind(1, kColumnBlueText1);
    window.Fill({{L"mmmm", L"MMMM", false}});
    window.list.SelectItem(0);
    const COLORREF highlight = GetSysColor(COLOR_HIGHLIGHT);
    // Letters are smoothed: what is looked for are their darkest pixels.
    const struct {
        bool focus;
        COLORREF background;
        COLORREF text[2];
    } cases[] = {{false, kWhite, {kBlack, RGB(0, 0, 255)}}, {true, highlight, {kWhite, kWhite}}};
    for (const auto& expected : cases) {
        SetFocus(expected.focus ? window.list.Handle() : window.Handle());
        const Picture picture(window.list.Handle());
        for (int column = 0; column < 2; ++column) {
            RECT cell = window.Cell(0, column);
            InflateRect(&cell, -1, -1);
            EXPECT_GT(picture.Count(cell, expected.background), 1000) << column;
            EXPECT_GT(picture.Count(cell, expected.text[column]), 10) << column;
            cell.right = cell.left + 8;
            EXPECT_EQ(picture.Count(cell, expected.background), 8 * (cell.bottom - cell.top)) << "inset";
        }
    }
    ListView_SetItemState(window.list.Handle(), 0, LVIS_DROPHILITED, LVIS_DROPHILITED);
    SetFocus(window.Handle());
    EXPECT_GT(Picture(window.list.Handle()).Count(window.Cell(0, 0), highlight), 1000);
}

TEST(RecordListDraw, SortMark) {
    ListWindow window;
    HWND header = ListView_GetHeader(window.list.Handle());
    const COLORREF light = GetSysColor(COLOR_3DHILIGHT);
    const COLORREF dark = GetSysColor(COLOR_3DSHADOW);
    HDC dc = GetDC(header);
    HGDIOBJ font = SelectObject(dc, reinterpret_cast<HFONT>(SendMessageW(header, WM_GETFONT, 0, 0)));
    SIZE blank{};
    GetTextExtentPoint32W(dc, L" ", 1, &blank);
    SelectObject(dc, font);
    ReleaseDC(header, dc);
    const int unit = 2 * blank.cx;
    RECT item{};
    Header_GetItemRect(header, 0, &item);
    const int right = item.right - 1;
    const int bottom = item.bottom - 1;
    const RECT room{right - 3 * unit, 0, item.right, item.bottom};

    EXPECT_EQ(Picture(header).Count(room, light), 0) << "no mark before the first sort";
    window.ClickHeader(0);
    const Picture up(header);
    // The triangle's base: light below, its ends included but for the pixel after the last.
    for (int x = right - 5 * unit / 2 - 1; x <= right - 3 * unit / 2; ++x) {
        EXPECT_EQ(up.At(x, bottom - unit), light) << x;
    }
    EXPECT_EQ(up.At(right - 5 * unit / 2 - 1, bottom - unit - 1), dark);
    window.ClickHeader(0);
    const Picture down(header);
    for (int x = right - 5 * unit / 2 - 1; x < right - 3 * unit / 2; ++x) {
        EXPECT_EQ(down.At(x, unit - 1), dark) << x;
    }
    EXPECT_EQ(down.At(right - 3 * unit / 2, unit - 1), light);
    window.ClickHeader(1);
    EXPECT_EQ(Picture(header).Count(room, light), 0) << "the mark moves to the other column";
}

TEST(ColorSwatch, TextStandsOut) {
    constexpr COLORENTRY kDark{RGB(255, 127, 1), 3};
    constexpr COLORENTRY kLight{RGB(255, 128, 1), 3};
    ParentWindow window;
    HDC dc = GetDC(window.Handle());
    for (const COLORENTRY* entry : {&kDark, &kLight, static_cast<const COLORENTRY*>(nullptr)}) {
        const RECT cell{0, 0, 60, 30};
        FillRect(dc, &cell, static_cast<HBRUSH>(GetStockObject(GRAY_BRUSH)));
        DrawColorSwatch(dc, cell, entry);
        EXPECT_EQ(GetPixel(dc, 1, 1), RGB(128, 128, 128));
        EXPECT_EQ(GetPixel(dc, 2, 2), entry != nullptr ? entry->color : kWhite);
        int text_pixels = 0;
        for (int x = 20; x < 40; ++x) {
            for (int y = 5; y < 25; ++y) {
                text_pixels += GetPixel(dc, x, y) == (entry == &kDark ? kWhite : kBlack) ? 1 : 0;
            }
        }
        EXPECT_GT(text_pixels, 3);
    }
    ReleaseDC(window.Handle(), dc);
}

}  // namespace
}  // namespace orvane::testing
