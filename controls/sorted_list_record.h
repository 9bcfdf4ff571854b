// What a sorted list shows in one row.
#pragma once

#include <windows.h>

#include <string>

namespace orvane {

// The record behind a list item; the item's data is its address. Records belong to the list's owner, who
// may derive from this type, and must stay where they are as long as the list has the item.
struct SortedListRecord {
    std::wstring first_text;   // column 0
    std::wstring second_text;  // column 1
    bool ticked = false;       // column 2: the user picked the entry
};

// The record of an item with this data; null when the item has none (data 0 or all ones).
SortedListRecord* RecordOf(LPARAM item_data);

// The text of a cell as the list shows it; empty for columns beyond the third. The tick column reads "0" for
// a ticked entry and "1" for one that is not: meant so, the owner's commands read it in this sense.
const wchar_t* CellText(const SortedListRecord& record, int column);

// Below, equal to or above 0 as `a` comes before, level with or after `b` in the ascending order of the
// column. Texts are compared without regard to case (ASCII letters, folded to small ones). Columns beyond
// the third hold everything level.
int CompareRecords(const SortedListRecord& a, const SortedListRecord& b, int column);

}  // namespace orvane
