#include "controls/sorted_list_record.h"

#include <cwchar>

namespace orvane {

SortedListRecord* RecordOf(LPARAM item_data) {
    return item_data == 0 || item_data == -1 ? nullptr : reinterpret_cast<SortedListRecord*>(item_data);
}

const wchar_t* CellText(const SortedListRecord& record, int column) {
    switch (column) {
        case 0:
            return record.first_text.c_str();
        case 1:
            return record.second_text.c_str();
        case 2:
            return record.ticked ? L"0" : L"1";
        default:
            return L"";
    }
}

int CompareRecords(const SortedListRecord& a, const SortedListRecord& b, int column) {
    switch (column) {
        case 0:
            return _wcsicmp(a.first_text.c_str(), b.first_text.c_str());
        case 1:
            return _wcsicmp(a.second_text.c_str(), b.second_text.c_str());
        case 2:
            // Not an ordering, and meant so: ticks are only told equal (1) or not (0).
            return a.ticked == b.ticked ? 1 : 0;
        default:
            return 0;
    }
}

}  // namespace orvane
