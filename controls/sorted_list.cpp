#include "controls/sorted_list.h"

#include <algorithm>

#include "controls/tick_pictures.h"

namespace orvane {

namespace {

// The one list whose items a header click reorders.
constexpr UINT_PTR kSortableControlId = 1039;

constexpr UINT kSelectedAndFocused = LVIS_SELECTED | LVIS_FOCUSED;

// Lists ask for the height of owner-drawn rows when their size changes; told that it did, they ask again.
void AskForRowHeight(HWND list) {
    RECT place{};
    GetWindowRect(list, &place);
    WINDOWPOS position{};
    position.hwnd = list;
    position.cx = place.right - place.left;
    position.cy = place.bottom - place.top;
    position.flags = SWP_NOACTIVATE | SWP_NOMOVE | SWP_NOOWNERZORDER | SWP_NOZORDER;
    SendMessageW(list, WM_WINDOWPOSCHANGED, 0, reinterpret_cast<LPARAM>(&position));
}

}  // namespace

bool CSortedListCtrl::Attach(HWND list) {
    auto* header = reinterpret_cast<HWND>(SendMessageW(list, LVM_GETHEADER, 0, 0));
    if (header == nullptr || !ui::Control::Attach(list)) {
        return false;
    }
    const DWORD styles = LVS_EX_DOUBLEBUFFER | LVS_EX_FULLROWSELECT;
    SendMessageW(list, LVM_SETEXTENDEDLISTVIEWSTYLE, styles, styles);
    AskForRowHeight(list);
    return header_.Attach(header);
}

void CSortedListCtrl::Sort() {
    Direct(LVM_SORTITEMS, reinterpret_cast<WPARAM>(this),
           reinterpret_cast<LPARAM>(&CSortedListCtrl::CompareThunk));
}

// Only one item can have the item focus. It is set once, at the end, where item after item would leave it:
// a list paints each change of it at once.
void CSortedListCtrl::SelectAll() {
    SetFocus(Handle());
    const RedrawPause pause(*this);
    const int count = ItemCount();
    for (int index = 0; index < count; ++index) {
        SetItemState(index, LVIS_SELECTED, LVIS_SELECTED);
        RedrawItem(index);
    }
    SetItemFocus(count - 1);
}

void CSortedListCtrl::InvertSelection() {
    SetFocus(Handle());
    const RedrawPause pause(*this);
    const int count = ItemCount();
    int last_selected = -1;
    for (int index = 0; index < count; ++index) {
        const bool selected = ItemState(index, LVIS_SELECTED) != 0;
        SetItemState(index, selected ? 0 : LVIS_SELECTED, LVIS_SELECTED);
        RedrawItem(index);
        last_selected = selected ? last_selected : index;
    }
    SetItemFocus(last_selected);
}

void CSortedListCtrl::SelectItem(int index) {
    if (index < 0 || index >= ItemCount()) {
        return;
    }
    for (int selected = NextItem(-1, LVNI_SELECTED); selected >= 0;
         selected = NextItem(selected, LVNI_SELECTED)) {
        SetItemState(selected, 0, kSelectedAndFocused);
    }
    SetItemState(index, kSelectedAndFocused, kSelectedAndFocused);
    Direct(LVM_ENSUREVISIBLE, static_cast<WPARAM>(index), FALSE);
}

SortedListRecord* CSortedListCtrl::RecordAt(int index) const {
    LVITEMW item{};
    item.mask = LVIF_PARAM;
    item.iItem = index;
    const bool found = Direct(LVM_GETITEMW, 0, reinterpret_cast<LPARAM>(&item)) != 0;
    return found ? RecordOf(item.lParam) : nullptr;
}

std::optional<LRESULT> CSortedListCtrl::OnReflected(UINT message, WPARAM /*wparam*/, LPARAM lparam) {
    if (message == WM_NOTIFY && reinterpret_cast<const NMHDR*>(lparam)->code == LVN_COLUMNCLICK) {
        OnColumnClick(*reinterpret_cast<const NMLISTVIEW*>(lparam));
        return 0;
    }
    if (message == WM_MEASUREITEM) {
        reinterpret_cast<MEASUREITEMSTRUCT*>(lparam)->itemHeight = RowHeight();
        return TRUE;
    }
    return std::nullopt;
}

int CSortedListCtrl::NextItem(int after, UINT state) const {
    return static_cast<int>(Direct(LVM_GETNEXTITEM, static_cast<WPARAM>(after), MAKELPARAM(state, 0)));
}

// The one item with the item focus; -1 takes it from the item that has it.
void CSortedListCtrl::SetItemFocus(int index) const {
    const int focused = NextItem(-1, LVNI_FOCUSED);
    if (index >= 0) {
        SetItemState(index, LVIS_FOCUSED, LVIS_FOCUSED);
    } else if (focused >= 0) {
        SetItemState(focused, 0, LVIS_FOCUSED);
    }
}

UINT CSortedListCtrl::ItemState(int index, UINT mask) const {
    return static_cast<UINT>(Direct(LVM_GETITEMSTATE, static_cast<WPARAM>(index), mask));
}

void CSortedListCtrl::SetItemState(int index, UINT state, UINT mask) const {
    LVITEMW item{};
    item.state = state;
    item.stateMask = mask;
    Direct(LVM_SETITEMSTATE, static_cast<WPARAM>(index), reinterpret_cast<LPARAM>(&item));
}

void CSortedListCtrl::RedrawItem(int index) const {
    Direct(LVM_UPDATE, static_cast<WPARAM>(index), 0);
}

int CALLBACK CSortedListCtrl::CompareThunk(LPARAM a, LPARAM b, LPARAM list) {
    return reinterpret_cast<const CSortedListCtrl*>(list)->Compare(a, b);
}

int CSortedListCtrl::Compare(LPARAM a, LPARAM b) const {
    // Meant so: every other list shows the header's mark but keeps the order of its items.
    if (control_id_ != kSortableControlId) {
        return 0;
    }
    const SortedListRecord* first = RecordOf(a);
    const SortedListRecord* second = RecordOf(b);
    if (first == nullptr || second == nullptr) {
        return 0;
    }
    const int result = CompareRecords(*first, *second, header_.SortColumn());
    return header_.Ascending() ? result : -result;
}

void CSortedListCtrl::OnColumnClick(const NMLISTVIEW& click) {
    control_id_ = click.hdr.idFrom;
    const bool ascending = click.iSubItem != header_.SortColumn() || !header_.Ascending();
    if (!sort_enabled_) {
        return;
    }
    if ((GetWindowLongPtrW(Handle(), GWL_STYLE) & LVS_TYPEMASK) == LVS_REPORT) {
        header_.SetSortColumn(click.iSubItem, ascending);
    }
    Sort();
}

// Room for a line of text and for a tick picture in its cell.
UINT CSortedListCtrl::RowHeight() const {
    HDC dc = GetDC(Handle());
    auto* font = reinterpret_cast<HFONT>(SendMessageW(Handle(), WM_GETFONT, 0, 0));
    HGDIOBJ previous = font != nullptr ? SelectObject(dc, font) : nullptr;
    TEXTMETRICW metrics{};
    GetTextMetricsW(dc, &metrics);
    if (previous != nullptr) {
        SelectObject(dc, previous);
    }
    ReleaseDC(Handle(), dc);
    constexpr LONG kTextMargin = 2;
    return static_cast<UINT>(std::max<LONG>(metrics.tmHeight + kTextMargin, kTickHeight + 2 * kCellInset));
}

}  // namespace orvane
