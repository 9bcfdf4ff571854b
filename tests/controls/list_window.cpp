#include "tests/controls/list_window.h"

#include "platform/resources.h"

namespace orvane::testing {

namespace {

constexpr wchar_t kClassName[] = L"orvane_controls_test";

LRESULT CALLBACK ParentProcedure(HWND window, UINT message, WPARAM wparam, LPARAM lparam) {
    if (const auto reflected = ui::Control::Reflect(window, message, wparam, lparam)) {
        return *reflected;
    }
    return DefWindowProcW(window, message, wparam, lparam);
}

}  // namespace

ParentWindow::ParentWindow() {
    WNDCLASSW window_class{};
    window_class.lpfnWndProc = ParentProcedure;
    window_class.hInstance = ResourceModule();
    window_class.lpszClassName = kClassName;
    RegisterClassW(&window_class);
    window_ = CreateWindowExW(0, kClassName, L"", WS_POPUP | WS_VISIBLE | WS_CLIPCHILDREN, 0, 0, 500, 300,
                              nullptr, nullptr, ResourceModule(), nullptr);
}

HWND ParentWindow::AddControl(const wchar_t* class_name, DWORD style, int id, const RECT& place) const {
    return CreateWindowExW(0, class_name, L"", WS_CHILD | WS_VISIBLE | style, place.left, place.top,
                           place.right - place.left, place.bottom - place.top, window_,
                           reinterpret_cast<HMENU>(static_cast<INT_PTR>(id)), ResourceModule(), nullptr);
}

std::vector<ParentWindow::Posted> ParentWindow::Pump() {
    MSG message{};
    while (PeekMessageW(&message, nullptr, 0, 0, PM_REMOVE)) {
        if (message.hwnd == window_ && message.message >= WM_USER && message.message < WM_APP) {
            posted_.push_back({message.message, message.wParam, message.lParam});
        }
        DispatchMessageW(&message);
    }
    return std::exchange(posted_, {});
}

ListWindow::ListWindow(int control_id, DWORD extra_style) {
    HWND window =
        AddControl(WC_LISTVIEWW, LVS_REPORT | LVS_OWNERDATA | LVS_OWNERDRAWFIXED | extra_style, control_id, {0, 0, 480, 280});
    list.Attach(window);
    list.SetNotifyWindow(Handle());
    list.SetSortEnabled(true);
    list.SetColumnCount(3);
    list.SetColumnKind(2, kColumnCheckBox);
    const std::pair<const wchar_t*, int> columns[] = {{L"File Name", 300}, {L"Date", 130}, {L" ", 20}};
    for (int index = 0; index < 3; ++index) {
        LVCOLUMNW column{};
        column.mask = LVCF_TEXT | LVCF_WIDTH | LVCF_FMT;
        column.pszText = const_cast<wchar_t*>(columns[index].first);
        column.cx = columns[index].second;
        SendMessageW(window, LVM_INSERTCOLUMNW, static_cast<WPARAM>(index),
                     reinterpret_cast<LPARAM>(&column));
    }
}

void ListWindow::Fill(std::vector<SortedListRecord> new_records) {
    records = std::move(new_records);
    list.SetItems(records);
}

void ListWindow::ClickHeader(int column) const {
    NMLISTVIEW click{};
    click.hdr.hwndFrom = list.Handle();
    click.hdr.idFrom = static_cast<UINT_PTR>(GetDlgCtrlID(list.Handle()));
    click.hdr.code = LVN_COLUMNCLICK;
    click.iItem = -1;
    click.iSubItem = column;
    SendMessageW(Handle(), WM_NOTIFY, click.hdr.idFrom, reinterpret_cast<LPARAM>(&click));
}

RECT ListWindow::Cell(int row, int column) const {
    RECT cell{};
    cell.left = LVIR_BOUNDS;
    cell.top = column;
    SendMessageW(list.Handle(), LVM_GETSUBITEMRECT, static_cast<WPARAM>(row),
                 reinterpret_cast<LPARAM>(&cell));
    return cell;
}

void ListWindow::Mouse(UINT message, int row, int column) const {
    const RECT cell = Cell(row, column);
    const int x = column == 0 ? cell.left + 20 : (cell.left + cell.right) / 2;
    SendMessageW(list.Handle(), message, MK_LBUTTON, MAKELPARAM(x, (cell.top + cell.bottom) / 2));
}

std::vector<std::wstring> ListWindow::FirstTexts() const {
    std::vector<std::wstring> texts;
    for (int row = 0; row < list.ItemCount(); ++row) {
        texts.push_back(Text(row, 0));
    }
    return texts;
}

std::wstring ListWindow::Text(int row, int column) const {
    wchar_t text[300] = L"";
    LVITEMW item{};
    item.iSubItem = column;
    item.pszText = text;
    item.cchTextMax = 300;
    SendMessageW(list.Handle(), LVM_GETITEMTEXTW, static_cast<WPARAM>(row), reinterpret_cast<LPARAM>(&item));
    return text;
}

}  // namespace orvane::testing
