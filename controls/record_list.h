// A list of records that the user ticks.
#pragma once

#include <windows.h>

#include <commctrl.h>

#include <concepts>
#include <cstddef>
#include <utility>
#include <vector>

#include "controls/cell_pictures.h"
#include "controls/sorted_list.h"

namespace orvane {

// Posted to the notify window after a double click in the list: wParam and lParam the list's window.
inline constexpr UINT kListDoubleClick = WM_USER + 998;
// Posted to the notify window after items of the list were drawn, so also after every change of a tick that
// can be seen; wParam and lParam the list's window. One is posted for each round of painting, always after
// its last item, and never a second one for items of the same round: a repaint of many items, or many
// repaints in a row without a look at the message queue, cannot fill it. For this the list posts a private
// message to itself with the first item drawn and passes it on as this one when it arrives. The receiver
// must not invalidate the list in turn.
inline constexpr UINT kListItemsDrawn = WM_USER + 999;

// What a column shows, the bits of USortedListCtrl::SetColumnKind.
inline constexpr DWORD kColumnText = 0x1;
inline constexpr DWORD kColumnCheckBox = 0x4;
inline constexpr DWORD kColumnAlignedText = 0x800;
inline constexpr DWORD kColumnBlueText1 = 0x300;
inline constexpr DWORD kColumnBlueText2 = 0x500;

// A list of SortedListRecord: column 0 and 1 show the record's texts, column 2 its tick, by the kinds that
// are set for the columns. A click into column 2 flips the tick of that row, the space bar that of the
// focused row. The records belong to the owner: while the list has items they must neither move nor end, nor
// may their ticks be changed by others.
// For styles and thread see CSortedListCtrl.
class USortedListCtrl : public CSortedListCtrl {
  public:
    struct COLUMN_STRUCT {
        DWORD kind = 0;
        // For the kinds that need one.
        INT_PTR extra = 0;
    };

    void SetNotifyWindow(HWND window) { notify_window_ = window; }

    // The number of columns that have a kind; new ones are drawn as black text.
    void SetColumnCount(std::size_t count) { columns_.resize(count); }
    // Gives a column the kind that the flags name. False for a column that is not described, for no flag of
    // 0xF7F, and when the kind needs an extra value and `extra` is 0. Flags that name no kind (0x10 alone for
    // instance) are accepted and change nothing.
    bool SetColumnKind(int column, DWORD flags, INT_PTR extra = 0);
    const std::vector<COLUMN_STRUCT>& Columns() const { return columns_; }

    // Replaces all items by one for each record, in their order, and sorts them by the present setting. The
    // scroll position stays, and so does the focused row if its record lies at the same address as before.
    template <std::derived_from<SortedListRecord> Record>
    void SetItems(std::vector<Record>& records) {
        std::vector<SortedListRecord*> rows;
        rows.reserve(records.size());
        for (Record& record : records) {
            rows.push_back(&record);
        }
        SetRecords(std::move(rows));
    }

    // Ticks are changed through the list, which redraws what shows them and keeps count.
    // False when there is no such row.
    bool FlipTick(int row);
    void TickAll(bool ticked);
    std::size_t TickedCount() const { return ticked_count_; }

  protected:
    std::optional<LRESULT> OnMessage(UINT message, WPARAM wparam, LPARAM lparam) override;
    std::optional<LRESULT> OnReflected(UINT message, WPARAM wparam, LPARAM lparam) override;

  private:
    struct Cell {
        int row;
        int column;
    };

    void SetRecords(std::vector<SortedListRecord*> rows);
    Cell CellAt(POINT point) const;

    bool OnLeftButtonDown(POINT point);
    void OnLeftButtonDoubleClick(POINT point);
    bool OnSpace(LPARAM key_data);
    void OnItemDrawn();
    void OnDrawNotice();

    void DrawItem(const DRAWITEMSTRUCT& item);
    void DrawImages(HDC dc, int row, const RECT& bounds) const;
    void DrawCell(HDC dc, const SortedListRecord& record, int column, RECT cell, bool selected);
    COLORREF TextColor(int column, bool selected) const;
    RECT CellRect(int column, const RECT& bounds) const;
    RECT ItemRect(int row, LONG part) const;

    HWND notify_window_ = nullptr;
    std::vector<COLUMN_STRUCT> columns_;
    std::size_t ticked_count_ = 0;
    TickPictures tick_pictures_;
    // The private message is on its way.
    bool draw_notice_posted_ = false;
};

}  // namespace orvane
