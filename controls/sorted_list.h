// A list that sorts itself by the column whose header is clicked.
#pragma once

#include <windows.h>

#include <commctrl.h>

#include <vector>

#include "controls/sorted_header.h"
#include "controls/sorted_list_record.h"
#include "ui/control.h"

namespace orvane {

// The base of the program's report lists. The rows are records of the owner, which the window asks for when
// it shows them, so that a hundred thousand are as quick as a hundred. The window's thread only.
//
// The window that it attaches to needs LVS_REPORT | LVS_OWNERDATA | LVS_OWNERDRAWFIXED, and no
// LVS_NOCOLUMNHEADER. LVS_SHOWSELALWAYS keeps the selection visible in a list without focus. The extended
// styles it needs (LVS_EX_DOUBLEBUFFER against flicker, LVS_EX_FULLROWSELECT) are set here. The parent must
// pass its notifications through ui::Control::Reflect. When the list comes to a screen of another density its
// columns and rows follow.
class CSortedListCtrl : public ui::Control {
  public:
    // Attaches to the list, its header and what columns it has; false when there is no such list or header.
    // A list asks for its row height when it is created, before anybody can attach: it is made to ask again.
    bool Attach(HWND list);

    CSortedHeaderCtrl& Header() { return header_; }
    const CSortedHeaderCtrl& Header() const { return header_; }
    // Whether a click on a header sorts; off until it is switched on.
    void SetSortEnabled(bool enabled) { sort_enabled_ = enabled; }
    // Sorts by the header's present column and direction. Selection and focus stay with their records.
    void Sort();

    // Both take the focus first. The item selected last is left with the item focus, which only one item can
    // have. For lists in which rows are selected to be worked on, of which the program has none.
    virtual void SelectAll();
    virtual void InvertSelection();
    // Makes the item the only selected one, focused and in view. Does nothing for an index outside the list.
    void SelectItem(int index);

    int ItemCount() const { return static_cast<int>(rows_.size()); }
    // The record of the item, null when there is none.
    SortedListRecord* RecordAt(int index) const;

  protected:
    // Shows these records, sorted by the present setting. The scroll position stays as far as there are rows,
    // and so does the focused row if its record is still there; else the focus stays at the same place.
    void SetRows(std::vector<SortedListRecord*> rows);
    const std::vector<SortedListRecord*>& Rows() const { return rows_; }

    std::optional<LRESULT> OnMessage(UINT message, WPARAM wparam, LPARAM lparam) override;
    std::optional<LRESULT> OnReflected(UINT message, WPARAM wparam, LPARAM lparam) override;

    // The first item with the state (LVNI_...) after an index, -1 when there is none.
    int NextItem(int after, UINT state) const;
    UINT ItemState(int index, UINT mask) const;
    // Index -1 stands for all items.
    void SetItemState(int index, UINT state, UINT mask) const;
    void RedrawItem(int index) const;
    void RedrawAll() const { InvalidateRect(Handle(), nullptr, TRUE); }
    int Dpi() const { return dpi_; }

  private:
    // For changes of the states of many items: keeps the list from painting from construction to destruction,
    // then has all of it painted once. Lists keep this state themselves: a hidden list stays hidden.
    // Meanwhile the header object is detached from its window, which the list asks for its layout at every
    // change.
    class RedrawPause {
      public:
        explicit RedrawPause(CSortedListCtrl& list) : list_(list), header_(list.header_.Handle()) {
            list_.header_.Detach();
            list_.Direct(WM_SETREDRAW, FALSE, 0);
        }
        ~RedrawPause() {
            list_.header_.Attach(header_);
            list_.Direct(WM_SETREDRAW, TRUE, 0);
            list_.RedrawAll();
        }
        RedrawPause(const RedrawPause&) = delete;
        RedrawPause& operator=(const RedrawPause&) = delete;

      private:
        CSortedListCtrl& list_;
        HWND header_;
    };

    void OnColumnClick(const NMLISTVIEW& click);
    void OnDensityChanged();
    int FindText(const NMLVFINDITEMW& find) const;
    void FocusSomeRow() const;
    std::vector<int> SelectedItems() const;
    void ClearStates();
    UINT RowHeight() const;
    // The one item with the item focus; -1 takes it from the item that has it.
    void SetItemFocus(int index) const;

    // As the last header click named it; 0 before the first.
    UINT_PTR control_id_ = 0;
    CSortedHeaderCtrl header_;
    bool sort_enabled_ = false;
    int dpi_ = USER_DEFAULT_SCREEN_DPI;
    std::vector<SortedListRecord*> rows_;
};

}  // namespace orvane
