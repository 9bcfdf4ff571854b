#include "controls/record_list.h"

#include <windowsx.h>

#include <algorithm>
#include <cwchar>

#include "ui/screen.h"

namespace orvane {

namespace {

constexpr int kTickColumn = 2;

// The list to itself: items were drawn since the last one.
constexpr UINT kDrawNotice = WM_APP + 1;

// The flags that a kind can be made of.
constexpr DWORD kKindFlags = 0xF7F;

constexpr COLORREF kBlack = RGB(0, 0, 0);
constexpr COLORREF kBlue = RGB(0, 0, 255);
constexpr COLORREF kWhite = RGB(255, 255, 255);

// Cell texts keep this many widths of a blank clear on both sides.
constexpr int kTextInsetBlanks = 3;

// The kind that the flags name, 0 for none. The first match in this order counts.
DWORD KindOf(DWORD flags) {
    for (const DWORD single : {0x1U, 0x800U, 0x4U, 0x2U}) {
        if ((flags & single) != 0) {
            return single;
        }
    }
    if ((flags & 0x10U) != 0) {
        return (flags & 0x20U) != 0 ? 0x30 : (flags & 0x40U) != 0 ? 0x50 : 0;
    }
    if ((flags & 0x8U) != 0) {
        return 0x8;
    }
    if ((flags & 0x100U) != 0) {
        return (flags & 0x400U) != 0 ? kColumnBlueText2 : (flags & 0x200U) != 0 ? kColumnBlueText1 : 0;
    }
    return 0;
}

bool NeedsExtra(DWORD kind) {
    return kind == 0x2 || kind == 0x30 || kind == 0x50;
}

// The text of a cell; empty for columns beyond the third. The tick column reads "0" for a ticked entry and
// "1" for one that is not: meant so, whoever reads the list's texts takes them in this sense.
const wchar_t* CellText(const SortedListRecord& record, int column) {
    switch (column) {
        case 0:
            return record.first_text.c_str();
        case 1:
            return record.second_text.c_str();
        case kTickColumn:
            return record.ticked ? L"0" : L"1";
        default:
            return L"";
    }
}

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

bool USortedListCtrl::SetColumnKind(int column, DWORD flags, INT_PTR extra) {
    if (column < 0 || static_cast<std::size_t>(column) >= columns_.size() || (flags & kKindFlags) == 0) {
        return false;
    }
    const DWORD kind = KindOf(flags);
    if (NeedsExtra(kind) && extra == 0) {
        return false;
    }
    if (kind != 0) {
        columns_[static_cast<std::size_t>(column)] = {kind, extra};
    }
    return true;
}

void USortedListCtrl::SetRecords(std::vector<SortedListRecord*> rows) {
    ticked_count_ = static_cast<std::size_t>(std::count_if(
        rows.begin(), rows.end(), [](const SortedListRecord* record) { return record->ticked; }));
    SetRows(std::move(rows));
}

bool USortedListCtrl::FlipTick(int row) {
    SortedListRecord* record = RecordAt(row);
    if (record == nullptr) {
        return false;
    }
    record->ticked = !record->ticked;
    ticked_count_ = record->ticked ? ticked_count_ + 1 : ticked_count_ - 1;
    RedrawItem(row);
    return true;
}

void USortedListCtrl::TickAll(bool ticked) {
    for (SortedListRecord* record : Rows()) {
        record->ticked = ticked;
    }
    ticked_count_ = ticked ? Rows().size() : 0;
    RedrawAll();
}

std::optional<LRESULT> USortedListCtrl::OnMessage(UINT message, WPARAM wparam, LPARAM lparam) {
    const POINT point{GET_X_LPARAM(lparam), GET_Y_LPARAM(lparam)};
    switch (message) {
        case WM_LBUTTONDOWN:
            return OnLeftButtonDown(point) ? std::optional<LRESULT>(0) : std::nullopt;
        case WM_LBUTTONDBLCLK:
            OnLeftButtonDoubleClick(point);
            return std::nullopt;
        case WM_KEYDOWN:
            return wparam == VK_SPACE && OnSpace(lparam) ? std::optional<LRESULT>(0) : std::nullopt;
        case WM_CHAR:
            // The space bar ticks; the list would go on to search for an item that begins with a blank.
            return wparam == L' ' ? std::optional<LRESULT>(0) : std::nullopt;
        case kDrawNotice:
            OnDrawNotice();
            return 0;
        default:
            return CSortedListCtrl::OnMessage(message, wparam, lparam);
    }
}

std::optional<LRESULT> USortedListCtrl::OnReflected(UINT message, WPARAM wparam, LPARAM lparam) {
    if (message == WM_NOTIFY && reinterpret_cast<const NMHDR*>(lparam)->code == LVN_GETDISPINFOW) {
        LVITEMW& item = reinterpret_cast<NMLVDISPINFOW*>(lparam)->item;
        const SortedListRecord* record = RecordAt(item.iItem);
        if (record != nullptr && (item.mask & LVIF_TEXT) != 0 && item.cchTextMax > 0) {
            lstrcpynW(item.pszText, CellText(*record, item.iSubItem), item.cchTextMax);
        }
        return 0;
    }
    if (message == WM_DRAWITEM) {
        DrawItem(*reinterpret_cast<const DRAWITEMSTRUCT*>(lparam));
        OnItemDrawn();
        return TRUE;
    }
    return CSortedListCtrl::OnReflected(message, wparam, lparam);
}

// Row and column are -1 where there is no item or no column.
USortedListCtrl::Cell USortedListCtrl::CellAt(POINT point) const {
    LVHITTESTINFO hit{};
    hit.pt = point;
    const int row = static_cast<int>(Direct(LVM_HITTEST, 0, reinterpret_cast<LPARAM>(&hit)));
    if (row < 0) {
        return {-1, -1};
    }
    const RECT bounds = ItemRect(row, LVIR_BOUNDS);
    const int column_count = Header().ColumnCount();
    for (int column = 0; column < column_count; ++column) {
        const RECT cell = CellRect(column, bounds);
        if (PtInRect(&cell, point)) {
            return {row, column};
        }
    }
    return {row, -1};
}

bool USortedListCtrl::OnLeftButtonDown(POINT point) {
    const Cell cell = CellAt(point);
    if (cell.column != kTickColumn || !FlipTick(cell.row)) {
        return false;
    }
    if (NextItem(-1, LVNI_FOCUSED) < 0) {
        // The keyboard goes on where the mouse was.
        SetItemState(cell.row, LVIS_FOCUSED, LVIS_FOCUSED);
    }
    SetFocus(Handle());
    return true;
}

// The receiver treats the selected row. The first click of two into the tick column selected nothing, so the
// row is selected here: the message must not flip the tick of another row.
void USortedListCtrl::OnLeftButtonDoubleClick(POINT point) {
    const Cell cell = CellAt(point);
    if (cell.column == kTickColumn) {
        SelectItem(cell.row);
    }
    if (notify_window_ != nullptr) {
        const auto list = reinterpret_cast<LONG_PTR>(Handle());
        PostMessageW(notify_window_, kListDoubleClick, static_cast<WPARAM>(list), list);
    }
}

// Flips the focused row once for each press, however long the key is held. With Ctrl the key selects.
bool USortedListCtrl::OnSpace(LPARAM key_data) {
    if (GetKeyState(VK_CONTROL) < 0) {
        return false;
    }
    const bool held_down = (HIWORD(key_data) & KF_REPEAT) != 0;
    const int row = NextItem(-1, LVNI_FOCUSED);
    if (row >= 0) {
        // The user sees what is ticked, and the owner hears of it when the row is drawn.
        Direct(LVM_ENSUREVISIBLE, static_cast<WPARAM>(row), FALSE);
    }
    return held_down || FlipTick(row);
}

void USortedListCtrl::OnItemDrawn() {
    if (!draw_notice_posted_ && notify_window_ != nullptr) {
        draw_notice_posted_ = PostMessageW(Handle(), kDrawNotice, 0, 0) != FALSE;
    }
}

void USortedListCtrl::OnDrawNotice() {
    draw_notice_posted_ = false;
    const auto list = reinterpret_cast<LONG_PTR>(Handle());
    PostMessageW(notify_window_, kListItemsDrawn, static_cast<WPARAM>(list), list);
}

void USortedListCtrl::DrawItem(const DRAWITEMSTRUCT& item) {
    HDC dc = item.hDC;
    const int row = static_cast<int>(item.itemID);
    const SortedListRecord* record = RecordAt(row);
    if (record == nullptr) {
        return;
    }
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
        DrawCell(dc, *record, column, cell, selected);
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

void USortedListCtrl::DrawCell(HDC dc, const SortedListRecord& record, int column, RECT cell, bool selected) {
    const wchar_t* text = CellText(record, column);
    const auto index = static_cast<std::size_t>(column);
    if (index < columns_.size() && columns_[index].kind == kColumnCheckBox) {
        // "0" is an entry that the user ticked.
        tick_pictures_.Draw(dc, cell, std::wcstol(text, nullptr, 10) == 0, selected, Dpi());
        return;
    }
    SIZE blank{};
    GetTextExtentPoint32W(dc, L" ", 1, &blank);
    InflateRect(&cell, -kTextInsetBlanks * blank.cx, 0);
    SetTextColor(dc, TextColor(column, selected));
    LVCOLUMNW info{};
    info.mask = LVCF_FMT;
    Direct(LVM_GETCOLUMNW, index, reinterpret_cast<LPARAM>(&info));
    DrawTextW(dc, text, -1, &cell, TextFlags(info.fmt));
}

COLORREF USortedListCtrl::TextColor(int column, bool selected) const {
    const auto index = static_cast<std::size_t>(column);
    if (index >= columns_.size() || ui::HasHighContrast()) {
        return GetSysColor(selected ? COLOR_HIGHLIGHTTEXT : COLOR_WINDOWTEXT);
    }
    if (selected) {
        return kWhite;
    }
    const DWORD kind = columns_[index].kind;
    return kind == kColumnBlueText1 || kind == kColumnBlueText2 ? kBlue : kBlack;
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
