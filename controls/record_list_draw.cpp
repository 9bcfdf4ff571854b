// How the rows of a record list are drawn.
#include <cwchar>

#include "controls/record_list.h"

namespace orvane {

namespace {

constexpr COLORREF kBlack = RGB(0, 0, 0);
constexpr COLORREF kBlue = RGB(0, 0, 255);
constexpr COLORREF kWhite = RGB(255, 255, 255);

// The longest cell text that is drawn, with its terminator; the rest would not fit a screen.
constexpr int kTextSize = 1024;

// Cell texts keep this many widths of a blank clear on both sides.
constexpr int kTextInsetBlanks = 3;

UINT TextFlags(int format) {
    const UINT flags = DT_SINGLELINE | DT_VCENTER | DT_NOPREFIX | DT_END_ELLIPSIS;
    switch (format & LVCFMT_JUSTIFYMASK) {
        case LVCFMT_RIGHT:
            return flags | DT_RIGHT;
        case LVCFMT_CENTER:
            return flags | DT_CENTER;
        default:
            return flags | DT_LEFT;
    }
}

}  // namespace

void USortedListCtrl::DrawItem(const DRAWITEMSTRUCT& item) {
    HDC dc = item.hDC;
    const int row = static_cast<int>(item.itemID);
    // The rectangle of a drawing message starts a little to the right of the row in some lists.
    const RECT bounds = ItemRect(row, LVIR_BOUNDS);
    const bool has_focus = GetFocus() == Handle();
    const bool shows_selection =
        has_focus || (GetWindowLongPtrW(Handle(), GWL_STYLE) & LVS_SHOWSELALWAYS) != 0;
    const UINT state = ItemState(row, LVIS_SELECTED | LVIS_FOCUSED | LVIS_DROPHILITED);
    const bool selected =
        (state & LVIS_DROPHILITED) != 0 || (shows_selection && (state & LVIS_SELECTED) != 0);

    const auto list_color = static_cast<COLORREF>(Direct(LVM_GETBKCOLOR, 0, 0));
    SetDCBrushColor(dc, selected                 ? GetSysColor(COLOR_HIGHLIGHT)
                        : list_color == CLR_NONE ? GetSysColor(COLOR_WINDOW)
                                                 : list_color);
    FillRect(dc, &bounds, static_cast<HBRUSH>(GetStockObject(DC_BRUSH)));
    DrawImages(dc, row, bounds);
    SetBkMode(dc, TRANSPARENT);
    const int column_count = Header().ColumnCount();
    for (int column = 0; column < column_count; ++column) {
        RECT cell = CellRect(column, bounds);
        if (column == 0) {
            // Right of the pictures.
            cell.left = ItemRect(row, LVIR_LABEL).left;
        }
        DrawCell(dc, row, column, cell, selected);
    }
    if (has_focus && (state & LVIS_FOCUSED) != 0) {
        SetTextColor(dc, kBlack);
        SetBkColor(dc, kWhite);
        DrawFocusRect(dc, &bounds);
    }
}

void USortedListCtrl::DrawImages(HDC dc, int row, const RECT& bounds) const {
    LVITEMW item{};
    item.mask = LVIF_IMAGE | LVIF_STATE;
    item.iItem = row;
    item.stateMask = LVIS_STATEIMAGEMASK;
    Direct(LVM_GETITEMW, 0, reinterpret_cast<LPARAM>(&item));
    const auto images = [this](WPARAM which) {
        return reinterpret_cast<HIMAGELIST>(Direct(LVM_GETIMAGELIST, which, 0));
    };
    // State images count from 1.
    const int state_image = static_cast<int>((item.state & LVIS_STATEIMAGEMASK) >> 12) - 1;
    if (HIMAGELIST states = images(LVSIL_STATE); states != nullptr && state_image >= 0) {
        ImageList_Draw(states, state_image, dc, bounds.left, bounds.top, ILD_TRANSPARENT);
    }
    if (HIMAGELIST icons = images(LVSIL_SMALL); icons != nullptr) {
        const RECT icon = ItemRect(row, LVIR_ICON);
        ImageList_Draw(icons, item.iImage, dc, icon.left, icon.top, ILD_TRANSPARENT);
    }
}

void USortedListCtrl::DrawCell(HDC dc, int row, int column, RECT cell, bool selected) {
    wchar_t text[kTextSize] = L"";
    LVITEMW item{};
    item.iSubItem = column;
    item.pszText = text;
    item.cchTextMax = kTextSize;
    Direct(LVM_GETITEMTEXTW, static_cast<WPARAM>(row), reinterpret_cast<LPARAM>(&item));

    const auto index = static_cast<std::size_t>(column);
    const bool described = index < columns_.size();
    const DWORD kind = described ? columns_[index].kind : 0;
    if (kind == kColumnCheckBox) {
        // "0" is an entry that the user ticked.
        tick_pictures_.Draw(dc, cell, std::wcstol(text, nullptr, 10) == 0, selected);
        return;
    }
    COLORREF color = selected ? kWhite : kBlack;
    if (!described) {
        color = GetSysColor(selected ? COLOR_HIGHLIGHTTEXT : COLOR_WINDOWTEXT);
    } else if (!selected && (kind == kColumnBlueText1 || kind == kColumnBlueText2)) {
        color = kBlue;
    }
    SIZE blank{};
    GetTextExtentPoint32W(dc, L" ", 1, &blank);
    InflateRect(&cell, -kTextInsetBlanks * blank.cx, 0);
    SetTextColor(dc, color);
    LVCOLUMNW info{};
    info.mask = LVCF_FMT;
    Direct(LVM_GETCOLUMNW, static_cast<WPARAM>(column), reinterpret_cast<LPARAM>(&info));
    DrawTextW(dc, text, -1, &cell, TextFlags(info.fmt));
}

// The cell of a column in a row with these bounds. Taken from the header, since lists differ in what they
// tell about column 0.
RECT USortedListCtrl::CellRect(int column, const RECT& bounds) const {
    const RECT place = Header().ColumnRect(column);
    return {bounds.left + place.left, bounds.top, bounds.left + place.right, bounds.bottom};
}

// A part of an item (LVIR_...), in coordinates of the list.
RECT USortedListCtrl::ItemRect(int row, LONG part) const {
    RECT rect{};
    rect.left = part;
    Direct(LVM_GETITEMRECT, static_cast<WPARAM>(row), reinterpret_cast<LPARAM>(&rect));
    return rect;
}

}  // namespace orvane
