// The header of a sorted list.
#pragma once

#include <windows.h>

#include <commctrl.h>

#include <unordered_map>

#include "controls/minimal_standard_hash.h"
#include "ui/control.h"

namespace orvane {

// A header control that draws its items itself and marks the column that the list is sorted by with a small
// triangle, point up for ascending. Every column, whenever it was inserted, is made owner-drawn. Paints
// through a buffer, so that nothing flickers.
class CSortedHeaderCtrl : public ui::Control {
  public:
    // Attaches to a header control that may have columns already; false as in the base class.
    bool Attach(HWND header);

    // The column with the mark, -1 for none.
    int SortColumn() const { return sort_column_; }
    bool Ascending() const { return ascending_; }
    void SetSortColumn(int column, bool ascending);

    int ColumnCount() const { return static_cast<int>(Direct(HDM_GETITEMCOUNT, 0, 0)); }
    // Where the column's header lies, in coordinates of the header; its left and right edge hold for the
    // rows below, too, from a row's left edge on.
    RECT ColumnRect(int column) const;

    // Shows an image of the header's image list left of the column's text; -1 for none.
    void SetColumnImage(int column, int image);

  protected:
    std::optional<LRESULT> OnMessage(UINT message, WPARAM wparam, LPARAM lparam) override;
    std::optional<LRESULT> OnReflected(UINT message, WPARAM wparam, LPARAM lparam) override;

  private:
    LRESULT PassItem(UINT message, WPARAM wparam, LPARAM lparam);
    void OnPaint();
    void DrawItem(const DRAWITEMSTRUCT& item);
    int DrawColumnImage(HDC dc, int column, int left, int unit);
    void DrawSortMark(HDC dc, const RECT& item, int unit) const;

    int sort_column_ = -1;
    bool ascending_ = true;
    std::unordered_map<int, int, MinimalStandardHash> column_images_{kHashBuckets};
};

}  // namespace orvane
