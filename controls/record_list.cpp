#include "controls/record_list.h"

#include <windowsx.h>

#include <algorithm>

namespace orvane {

namespace {

constexpr int kTickColumn = 2;

// The list to itself: items were drawn since the last one.
constexpr UINT kDrawNotice = WM_APP + 1;

// The flags that a kind can be made of.
constexpr DWORD kKindFlags = 0xF7F;

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

// Fills the buffer that comes with the question; items without a record are left as they are.
void FillDisplayInfo(LVITEMW& item) {
    const SortedListRecord* record = RecordOf(item.lParam);
    if (record != nullptr && (item.mask & LVIF_TEXT) != 0 && item.cchTextMax > 0) {
        lstrcpynW(item.pszText, CellText(*record, item.iSubItem), item.cchTextMax);
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

void USortedListCtrl::SetItems(std::size_t count,
                               const std::function<SortedListRecord*(std::size_t)>& record_at) {
    const int column_count = Header().ColumnCount();
    const RedrawPause pause(*this);
    const int top = static_cast<int>(Direct(LVM_GETTOPINDEX, 0, 0));
    const int focused = NextItem(-1, LVNI_FOCUSED);
    // Compared only: the record may be gone by now.
    const SortedListRecord* focused_record = focused >= 0 ? RecordAt(focused) : nullptr;
    const UINT focused_state = focused >= 0 ? ItemState(focused, LVIS_SELECTED | LVIS_FOCUSED) : 0;

    Direct(LVM_DELETEALLITEMS, 0, 0);
    Direct(LVM_SETITEMCOUNT, count, 0);
    for (std::size_t index = 0; index < count; ++index) {
        InsertItem(static_cast<int>(index), record_at(index), column_count);
    }
    Sort();

    if (focused_record != nullptr) {
        LVFINDINFOW find{};
        find.flags = LVFI_PARAM;
        find.lParam = reinterpret_cast<LPARAM>(focused_record);
        const auto row =
            static_cast<int>(Direct(LVM_FINDITEMW, static_cast<WPARAM>(-1), reinterpret_cast<LPARAM>(&find)));
        if (row >= 0) {
            SetItemState(row, focused_state, LVIS_SELECTED | LVIS_FOCUSED);
        } else if (count > 0) {
            // Its record is gone: the keyboard stays at the same place.
            SetItemState(std::min(focused, static_cast<int>(count) - 1), focused_state,
                         LVIS_SELECTED | LVIS_FOCUSED);
        }
    }
    ScrollTo(top);
}

// Makes the row the topmost one, as far as there are enough rows below it.
void USortedListCtrl::ScrollTo(int row) const {
    const int top = static_cast<int>(Direct(LVM_GETTOPINDEX, 0, 0));
    if (row != top && ItemCount() > 0) {
        const RECT bounds = ItemRect(0, LVIR_BOUNDS);
        Direct(LVM_SCROLL, 0, LPARAM{row - top} * (bounds.bottom - bounds.top));
    }
}

void USortedListCtrl::InsertItem(int index, SortedListRecord* record, int column_count) const {
    LVITEMW item{};
    item.mask = LVIF_TEXT | LVIF_PARAM;
    item.iItem = index;
    item.pszText = LPSTR_TEXTCALLBACKW;
    item.lParam = reinterpret_cast<LPARAM>(record);
    const LRESULT row = Direct(LVM_INSERTITEMW, 0, reinterpret_cast<LPARAM>(&item));
    for (int column = 1; row >= 0 && column < column_count; ++column) {
        item.iSubItem = column;
        Direct(LVM_SETITEMTEXTW, static_cast<WPARAM>(row), reinterpret_cast<LPARAM>(&item));
    }
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
            return std::nullopt;
    }
}

std::optional<LRESULT> USortedListCtrl::OnReflected(UINT message, WPARAM wparam, LPARAM lparam) {
    if (message == WM_NOTIFY && reinterpret_cast<const NMHDR*>(lparam)->code == LVN_GETDISPINFOW) {
        FillDisplayInfo(reinterpret_cast<NMLVDISPINFOW*>(lparam)->item);
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

// False when the row has no record.
bool USortedListCtrl::FlipTick(int row) const {
    SortedListRecord* record = row >= 0 ? RecordAt(row) : nullptr;
    if (record == nullptr) {
        return false;
    }
    record->ticked = !record->ticked;
    RedrawItem(row);
    return true;
}

bool USortedListCtrl::OnLeftButtonDown(POINT point) const {
    const Cell cell = CellAt(point);
    if (cell.column != kTickColumn || !FlipTick(cell.row)) {
        return false;
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
bool USortedListCtrl::OnSpace(LPARAM key_data) const {
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

}  // namespace orvane
