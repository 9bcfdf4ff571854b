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

    ParentWindow() { SetWindowLongPtrW(window_, GWLP_WNDPROC, reinterpret_cast<LONG_PTR>(Procedure)); }
    ~ParentWindow() { DestroyWindow(window_); }
    ParentWindow(const ParentWindow&) = delete;
    ParentWindow& operator=(const ParentWindow&) = delete;

    HWND Handle() const { return window_; }
    HWND AddControl(const wchar_t* class_name, DWORD style, int id, const RECT& place) const {
        return CreateWindowExW(0, class_name, L"", WS_CHILD | WS_VISIBLE | style, place.left, place.top,
                               place.right - place.left, place.bottom - place.top, window_,
                               reinterpret_cast<HMENU>(static_cast<INT_PTR>(id)), nullptr, nullptr);
    }
    // Paints and handles all that is in the queue; what was posted to the window since the last call.
    std::vector<Posted> Pump() const {
        std::vector<Posted> posted;
        MSG message{};
        while (PeekMessageW(&message, nullptr, 0, 0, PM_REMOVE)) {
            if (message.hwnd == window_ && message.message >= WM_USER && message.message < WM_APP) {
                posted.push_back({message.message, message.wParam, message.lParam});
            }
            DispatchMessageW(&message);
        }
        return posted;
    }

  private:
    static LRESULT CALLBACK Procedure(HWND window, UINT message, WPARAM wparam, LPARAM lparam) {
        const auto reflected = ui::Control::Reflect(window, message, wparam, lparam);
        return reflected ? *reflected : DefWindowProcW(window, message, wparam, lparam);
    }

    HWND window_ = CreateWindowExW(0, L"STATIC", L"", WS_POPUP | WS_VISIBLE | WS_CLIPCHILDREN, 0, 0, 500, 300,
                                   nullptr, nullptr, nullptr, nullptr);
};

// The window with a list of three columns (name, date, tick), as the program uses it, that sorts.
struct ListWindow : ParentWindow {
    explicit ListWindow(int control_id = 1039) {
        const DWORD style = LVS_REPORT | LVS_OWNERDRAWFIXED | LVS_SHOWSELALWAYS;
        list.Attach(AddControl(WC_LISTVIEWW, style, control_id, {0, 0, 480, 280}));
        list.SetNotifyWindow(Handle());
        list.SetSortEnabled(true);
        list.SetColumnCount(3);
        list.SetColumnKind(2, kColumnCheckBox);
        for (const int width : {20, 130, 300}) {
            LVCOLUMNW column{};
            column.mask = LVCF_WIDTH;
            column.cx = width;
            SendMessageW(list.Handle(), LVM_INSERTCOLUMNW, 0, reinterpret_cast<LPARAM>(&column));
        }
    }

    void Fill(std::vector<SortedListRecord> new_records) {
        records = std::move(new_records);
        list.SetItems(records);
    }
    void ClickHeader(int column) const {
        NMLISTVIEW click{};
        click.hdr = {list.Handle(), static_cast<UINT_PTR>(GetDlgCtrlID(list.Handle())), LVN_COLUMNCLICK};
        click.iItem = -1;
        click.iSubItem = column;
        SendMessageW(Handle(), WM_NOTIFY, click.hdr.idFrom, reinterpret_cast<LPARAM>(&click));
    }
    RECT Cell(int row, int column) const {
        RECT cell{LVIR_BOUNDS, column, 0, 0};
        SendMessageW(list.Handle(), LVM_GETSUBITEMRECT, static_cast<WPARAM>(row),
                     reinterpret_cast<LPARAM>(&cell));
        return cell;
    }
    // A press (or another mouse message) into the tick of a row.
    void Mouse(UINT message, int row) const {
        const RECT cell = Cell(row, 2);
        const LPARAM point = MAKELPARAM((cell.left + cell.right) / 2, (cell.top + cell.bottom) / 2);
        SendMessageW(list.Handle(), message, MK_LBUTTON, point);
    }
    std::wstring Text(int row, int column) const {
        wchar_t text[300] = L"";
        LVITEMW item{};
        item.iSubItem = column;
        item.pszText = text;
        item.cchTextMax = 300;
        SendMessageW(list.Handle(), LVM_GETITEMTEXTW, static_cast<WPARAM>(row),
                     reinterpret_cast<LPARAM>(&item));
        return text;
    }
    std::vector<std::wstring> FirstTexts() const {
        std::vector<std::wstring> texts;
        for (int row = 0; row < list.ItemCount(); ++row) {
            texts.push_back(Text(row, 0));
        }
        return texts;
    }

    std::vector<SortedListRecord> records;
    USortedListCtrl list;
};

}  // namespace orvane::testing
