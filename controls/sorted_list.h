// A list that sorts itself by the column whose header is clicked.
#pragma once

#include <windows.h>

#include <commctrl.h>

#include "controls/sorted_header.h"
#include "controls/sorted_list_record.h"
#include "ui/control.h"

namespace orvane {

// The base of the program's report lists. The item data are addresses of SortedListRecord, as far as the
// comparison is concerned. The window's thread only.
//
// The window that it attaches to needs LVS_REPORT | LVS_OWNERDRAWFIXED, and no LVS_NOCOLUMNHEADER or
// LVS_SORT... style. LVS_SHOWSELALWAYS keeps the selection visible in a list without focus. The extended
// styles it needs (LVS_EX_DOUBLEBUFFER against flicker, LVS_EX_FULLROWSELECT) are set here. The parent must
// pass its notifications through ui::Control::Reflect.
class CSortedListCtrl : public ui::Control {
  public:
    // Attaches to the list, its header and what columns it has; false when there is no such list or header.
    // A list asks for its row height when it is created, before anybody can attach: it is made to ask again.
    bool Attach(HWND list);

    CSortedHeaderCtrl& Header() { return header_; }
    const CSortedHeaderCtrl& Header() const { return header_; }
    // Whether a click on a header sorts; off until it is switched on.
    void SetSortEnabled(bool enabled) { sort_enabled_ = enabled; }
    // Sorts by the header's present column and direction.
    void Sort();

    // Both take the focus first. The item selected last is left with the item focus.
    virtual void SelectAll();
    virtual void InvertSelection();
    // Makes the item the only selected one, focused and in view. Does nothing for an index outside the list.
    void SelectItem(int index);

    int ItemCount() const { return static_cast<int>(Direct(LVM_GETITEMCOUNT, 0, 0)); }
    // The record of the item, null when there is none.
    SortedListRecord* RecordAt(int index) const;

  protected:
    // For changes of thousands of items: keeps the list from painting from construction to destruction, then
    // has all of it painted once. Lists keep this state themselves: a hidden list stays hidden. Meanwhile
    // the header object is detached from its window, which the list asks for its layout at every change.
    class RedrawPause {
      public:
        explicit RedrawPause(CSortedListCtrl& list) : list_(list), header_(list.header_.Handle()) {
            list_.header_.Detach();
            list_.Direct(WM_SETREDRAW, FALSE, 0);
        }
        ~RedrawPause() {
            list_.header_.Attach(header_);
            list_.Direct(WM_SETREDRAW, TRUE, 0);
            InvalidateRect(list_.Handle(), nullptr, TRUE);
        }
        RedrawPause(const RedrawPause&) = delete;
        RedrawPause& operator=(const RedrawPause&) = delete;

      private:
        CSortedListCtrl& list_;
        HWND header_;
    };

    std::optional<LRESULT> OnReflected(UINT message, WPARAM wparam, LPARAM lparam) override;

    // The first item with the state (LVNI_...) after an index, -1 when there is none.
    int NextItem(int after, UINT state) const;
    UINT ItemState(int index, UINT mask) const;
    void SetItemState(int index, UINT state, UINT mask) const;
    void RedrawItem(int index) const;

  private:
    static int CALLBACK CompareThunk(LPARAM a, LPARAM b, LPARAM list);
    int Compare(LPARAM a, LPARAM b) const;
    void OnColumnClick(const NMLISTVIEW& click);
    UINT RowHeight() const;
    void SetItemFocus(int index) const;

    // As the last header click named it; 0 before the first.
    UINT_PTR control_id_ = 0;
    CSortedHeaderCtrl header_;
    bool sort_enabled_ = false;
};

}  // namespace orvane
