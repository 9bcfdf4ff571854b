// The exchange between a dialog's controls and its members, one description for both directions.
#pragma once

#include <windows.h>

#include <string>

namespace orvane::ui {

class DataExchange {
  public:
    // `save` true: the controls' data go into the members; false: the members are shown in the controls.
    DataExchange(HWND dialog, bool save) : dialog_(dialog), save_(save) {}

    void Text(int id, std::wstring& value) const;
    // A check box; 1 for ticked, 0 for not.
    void Check(int id, int& value) const;

  private:
    HWND dialog_;
    bool save_;
};

// The whole text of a window, however long.
std::wstring WindowText(HWND window);

}  // namespace orvane::ui
