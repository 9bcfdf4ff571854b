// A window with one record list.
#pragma once

#include <windows.h>

#include <commctrl.h>

#include <string>
#include <utility>
#include <vector>

#include "controls/record_list.h"

namespace orvane::testing {

// A parent window that reflects notifications to its controls, as dialogs do, and collects the messages
// from WM_USER on that are posted to it.
class ParentWindow {
  public:
    struct Posted {
        UINT message;
        WPARAM wparam;
        LPARAM lparam;
        bool operator==(const Posted&) const = default;
    };

    ParentWindow();
    ~ParentWindow() { DestroyWindow(window_); }
    ParentWindow(const ParentWindow&) = delete;
    ParentWindow& operator=(const ParentWindow&) = delete;

    HWND Handle() const { return window_; }
    HWND AddControl(const wchar_t* class_name, DWORD style, int id, const RECT& place) const;
    // Paints and handles all that is in the queue; what was posted to the window since the last call.
    std::vector<Posted> Pump();

  private:
    HWND window_;
    std::vector<Posted> posted_;
};

// The window with a list of three columns (name, date, tick), as the program uses it, that sorts.
struct ListWindow : ParentWindow {
    explicit ListWindow(int control_id = 1039, DWORD extra_style = 0);

    void Fill(std::vector<SortedListRecord> new_records);
    void ClickHeader(int column) const;
    // A press (or another mouse message) into the middle of a cell.
    void Mouse(UINT message, int row, int column) const;
    RECT Cell(int row, int column) const;
    std::vector<std::wstring> FirstTexts() const;
    std::wstring Text(int row, int column) const;

    std::vector<SortedListRecord> records;
    USortedListCtrl list;
};

}  // namespace orvane::testing
