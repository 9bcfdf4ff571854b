// What a sorted list shows in one row.
#pragma once

#include <string>

namespace orvane {

// The record behind a list's row. Records belong to the list's owner, who may derive from this type, and must
// stay where they are as long as the list shows them.
struct SortedListRecord {
    std::wstring first_text;   // column 0
    std::wstring second_text;  // column 1
    bool ticked = false;       // column 2: the user picked the entry
};

}  // namespace orvane
