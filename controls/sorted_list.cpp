#include "controls/sorted_list.h"

#include <algorithm>
#include <functional>
#include <string>
#include <utility>

#include "controls/cell_pictures.h"
#include "ui/screen.h"

namespace orvane {

namespace {

// The one list whose items a header click reorders.
constexpr UINT_PTR kSortableControlId = 1039;

constexpr int kTickColumn = 2;
constexpr UINT kSelectedAndFocused = LVIS_SELECTED | LVIS_FOCUSED;

// Sent to controls when their dialog has come to a screen of another density; not in every header.
constexpr UINT kDensityChanged = 0x02E3;

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

// Lists are compared and searched without regard to the case of ASCII letters.
wchar_t Folded(wchar_t letter) {
    return letter >= L'A' && letter <= L'Z' ? static_cast<wchar_t>(letter - L'A' + L'a') : letter;
}

bool BeginsWith(const std::wstring& text, const std::wstring& start) {
    return text.size() >= start.size() &&
           std::equal(start.begin(), start.end(), text.begin(),
                      [](wchar_t a, wchar_t b) { return Folded(a) == Folded(b); });
}

// Sorts by merging, from runs of one to the whole; what does not follow another keeps its place. It needs no
// ordering: whatever `follows` answers, it is asked n log n times and no item is lost.
template <class Item, class Follows>
void MergeSort(std::vector<Item>& items, Follows follows) {
    const std::size_t size = items.size();
    std::vector<Item> merged(size);
    for (std::size_t run = 1; run < size; run *= 2) {
        for (std::size_t begin = 0; begin < size; begin += 2 * run) {
            const std::size_t middle = std::min(begin + run, size);
            const std::size_t end = std::min(middle + run, size);
            std::size_t left = begin;
            std::size_t right = middle;
            for (std::size_t to = begin; to < end; ++to) {
                const bool take_right = left == middle || (right < end && follows(items[left], items[right]));
                merged[to] = items[take_right ? right++ : left++];
            }
        }
        items.swap(merged);
    }
}

struct Keyed {
    const wchar_t* key;
    SortedListRecord* record;
};

// The records of a list, to be sorted by a column; those that the column shows as texts are folded once.
class SortedRows {
  public:
    SortedRows(const std::vector<SortedListRecord*>& rows, int column) : column_(column) {
        std::size_t length = 0;
        for (const SortedListRecord* record : rows) {
            length += Text(*record).size() + 1;
        }
        texts_.reserve(length);
        for (SortedListRecord* record : rows) {
            rows_.push_back({texts_.data() + texts_.size(), record});
            std::transform(Text(*record).begin(), Text(*record).end(), std::back_inserter(texts_), Folded);
            texts_.push_back(L'\0');
        }
    }

    std::vector<SortedListRecord*> Sorted(bool ascending) {
        MergeSort(rows_, [this, ascending](const Keyed& a, const Keyed& b) {
            return ascending ? Compare(a, b) > 0 : Compare(a, b) < 0;
        });
        std::vector<SortedListRecord*> sorted;
        for (const Keyed& row : rows_) {
            sorted.push_back(row.record);
        }
        return sorted;
    }

  private:
    const std::wstring& Text(const SortedListRecord& record) const {
        static const std::wstring none;
        return column_ == 0 ? record.first_text : column_ == 1 ? record.second_text : none;
    }
    // Below, equal to or above 0 as `a` comes before, level with or after `b`. Columns without texts hold
    // everything level.
    int Compare(const Keyed& a, const Keyed& b) const {
        if (column_ == kTickColumn) {
            // Not an ordering, and meant so: ticks are only told equal (1) or not (0).
            return a.record->ticked == b.record->ticked ? 1 : 0;
        }
        return std::wcscmp(a.key, b.key);
    }

    const int column_;
    std::wstring texts_;
    std::vector<Keyed> rows_;
};

}  // namespace

bool CSortedListCtrl::Attach(HWND list) {
    auto* header = reinterpret_cast<HWND>(SendMessageW(list, LVM_GETHEADER, 0, 0));
    if (header == nullptr || !ui::Control::Attach(list)) {
        return false;
    }
    const DWORD styles = LVS_EX_DOUBLEBUFFER | LVS_EX_FULLROWSELECT;
    SendMessageW(list, LVM_SETEXTENDEDLISTVIEWSTYLE, styles, styles);
    dpi_ = ui::DpiOf(list);
    AskForRowHeight(list);
    return header_.Attach(header);
}

void CSortedListCtrl::SetRows(std::vector<SortedListRecord*> rows) {
    const int focused = NextItem(-1, LVNI_FOCUSED);
    // Compared only: the record may be gone by now.
    const SortedListRecord* focused_record = RecordAt(focused);
    const UINT focused_state = focused_record != nullptr ? ItemState(focused, kSelectedAndFocused) : 0;
    ClearStates();

    rows_ = std::move(rows);
    Direct(LVM_SETITEMCOUNT, rows_.size(), LVSICF_NOSCROLL);
    Sort();
    if (focused_record != nullptr && !rows_.empty()) {
        const auto found = std::find(rows_.begin(), rows_.end(), focused_record);
        const int row = found != rows_.end() ? static_cast<int>(found - rows_.begin())
                                             : std::min(focused, ItemCount() - 1);
        SetItemState(row, focused_state, kSelectedAndFocused);
    }
    FocusSomeRow();
    RedrawAll();
}

void CSortedListCtrl::Sort() {
    // Meant so: every other list shows the header's mark but keeps the order of its items.
    if (control_id_ != kSortableControlId) {
        return;
    }
    const SortedListRecord* focused = RecordAt(NextItem(-1, LVNI_FOCUSED));
    std::vector<const SortedListRecord*> selected;
    for (const int row : SelectedItems()) {
        selected.push_back(RecordAt(row));
    }
    if (selected.size() == rows_.size()) {
        selected.clear();  // They stay as they are, whatever their order.
    } else {
        ClearStates();
    }
    rows_ = SortedRows(rows_, header_.SortColumn()).Sorted(header_.Ascending());

    const RedrawPause pause(*this);
    std::sort(selected.begin(), selected.end(), std::less<>());
    for (int row = 0; row < ItemCount(); ++row) {
        const SortedListRecord* record = RecordAt(row);
        if (std::binary_search(selected.begin(), selected.end(), record, std::less<>())) {
            SetItemState(row, LVIS_SELECTED, LVIS_SELECTED);
        }
        if (record == focused) {
            SetItemFocus(row);
        }
    }
}

void CSortedListCtrl::SelectAll() {
    SetFocus(Handle());
    const RedrawPause pause(*this);
    SetItemState(-1, LVIS_SELECTED, LVIS_SELECTED);
    SetItemFocus(ItemCount() - 1);
}

void CSortedListCtrl::InvertSelection() {
    SetFocus(Handle());
    const RedrawPause pause(*this);
    int last_selected = -1;
    for (int index = 0; index < ItemCount(); ++index) {
        const bool selected = ItemState(index, LVIS_SELECTED) != 0;
        SetItemState(index, selected ? 0 : LVIS_SELECTED, LVIS_SELECTED);
        last_selected = selected ? last_selected : index;
    }
    SetItemFocus(last_selected);
}

void CSortedListCtrl::SelectItem(int index) {
    if (index < 0 || index >= ItemCount()) {
        return;
    }
    ClearStates();
    SetItemState(index, kSelectedAndFocused, kSelectedAndFocused);
    Direct(LVM_ENSUREVISIBLE, static_cast<WPARAM>(index), FALSE);
}

SortedListRecord* CSortedListCtrl::RecordAt(int index) const {
    return index >= 0 && index < ItemCount() ? rows_[static_cast<std::size_t>(index)] : nullptr;
}

std::optional<LRESULT> CSortedListCtrl::OnMessage(UINT message, WPARAM wparam, LPARAM lparam) {
    switch (message) {
        case WM_SETFOCUS: {
            const LRESULT result = Default(message, wparam, lparam);
            FocusSomeRow();
            return result;
        }
        case kDensityChanged:
            OnDensityChanged();
            return std::nullopt;
        default:
            return std::nullopt;
    }
}

std::optional<LRESULT> CSortedListCtrl::OnReflected(UINT message, WPARAM /*wparam*/, LPARAM lparam) {
    if (message == WM_MEASUREITEM) {
        reinterpret_cast<MEASUREITEMSTRUCT*>(lparam)->itemHeight = RowHeight();
        return TRUE;
    }
    if (message != WM_NOTIFY) {
        return std::nullopt;
    }
    switch (reinterpret_cast<const NMHDR*>(lparam)->code) {
        case LVN_COLUMNCLICK:
            OnColumnClick(*reinterpret_cast<const NMLISTVIEW*>(lparam));
            return 0;
        case LVN_ODFINDITEMW:
            return FindText(*reinterpret_cast<const NMLVFINDITEMW*>(lparam));
        default:
            return std::nullopt;
    }
}

int CSortedListCtrl::NextItem(int after, UINT state) const {
    return static_cast<int>(Direct(LVM_GETNEXTITEM, static_cast<WPARAM>(after), MAKELPARAM(state, 0)));
}

void CSortedListCtrl::SetItemFocus(int index) const {
    const int focused = NextItem(-1, LVNI_FOCUSED);
    if (index >= 0) {
        SetItemState(index, LVIS_FOCUSED, LVIS_FOCUSED);
    } else if (focused >= 0) {
        SetItemState(focused, 0, LVIS_FOCUSED);
    }
}

std::vector<int> CSortedListCtrl::SelectedItems() const {
    std::vector<int> items;
    if (Direct(LVM_GETSELECTEDCOUNT, 0, 0) > 0) {
        for (int row = NextItem(-1, LVNI_SELECTED); row >= 0; row = NextItem(row, LVNI_SELECTED)) {
            items.push_back(row);
        }
    }
    return items;
}

void CSortedListCtrl::ClearStates() {
    const RedrawPause pause(*this);
    for (const int item : SelectedItems()) {
        SetItemState(item, 0, LVIS_SELECTED);
    }
    SetItemFocus(-1);
}

// A list with the keyboard focus has a row with it, too: else no key would tell where one is.
void CSortedListCtrl::FocusSomeRow() const {
    if (GetFocus() == Handle() && !rows_.empty() && NextItem(-1, LVNI_FOCUSED) < 0) {
        SetItemFocus(0);
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

void CSortedListCtrl::OnDensityChanged() {
    const int before = std::exchange(dpi_, ui::DpiOf(Handle()));
    for (int column = 0; column < header_.ColumnCount(); ++column) {
        const auto width = static_cast<int>(Direct(LVM_GETCOLUMNWIDTH, static_cast<WPARAM>(column), 0));
        Direct(LVM_SETCOLUMNWIDTH, static_cast<WPARAM>(column), MulDiv(width, dpi_, before));
    }
    AskForRowHeight(Handle());
    RedrawAll();
}

// The row that the user is typing the first letters of, -1 for none; the search goes round the end.
int CSortedListCtrl::FindText(const NMLVFINDITEMW& find) const {
    if ((find.lvfi.flags & (LVFI_STRING | LVFI_PARTIAL)) == 0 || find.lvfi.psz == nullptr) {
        return -1;
    }
    const std::wstring start = find.lvfi.psz;
    const std::size_t first = find.iStart > 0 ? static_cast<std::size_t>(find.iStart) : 0;
    for (std::size_t step = 0; step < rows_.size(); ++step) {
        const std::size_t row = (first + step) % rows_.size();
        if (BeginsWith(rows_[row]->first_text, start)) {
            return static_cast<int>(row);
        }
    }
    return -1;
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
    constexpr int kTextMargin = 2;
    return static_cast<UINT>(std::max<int>(metrics.tmHeight + ui::Scaled(kTextMargin, dpi_),
                                           ui::Scaled(kTickSize, dpi_) + 2 * ui::Scaled(kCellInset, dpi_)));
}

}  // namespace orvane
