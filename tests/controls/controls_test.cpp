#include <gmock/gmock.h>
#include <gtest/gtest.h>

#include <algorithm>
#include <string>
#include <utility>
#include <vector>

#include "controls/page_tab.h"
#include "controls/record_list.h"
#include "platform/handles.h"
#include "platform/resources.h"

namespace orvane::testing {
namespace {

using ::testing::Contains;
using ::testing::ElementsAre;
using ::testing::IsEmpty;
using Texts = std::vector<std::wstring>;

// A parent window that reflects notifications to its controls, as dialogs do, and collects the messages
// from WM_USER on that are posted to it.
class ParentWindow {
  public:
    using Posted = std::tuple<UINT, WPARAM, LPARAM>;

    ParentWindow() {
        WNDCLASSW window_class{};
        window_class.lpfnWndProc = [](HWND window, UINT message, WPARAM wparam, LPARAM lparam) {
            const auto reflected = ui::Control::Reflect(window, message, wparam, lparam);
            return reflected ? *reflected : DefWindowProcW(window, message, wparam, lparam);
        };
        window_class.hInstance = ResourceModule();
        window_class.lpszClassName = L"orvane_controls_test";
        RegisterClassW(&window_class);
        window_ = CreateWindowExW(0, window_class.lpszClassName, L"", WS_POPUP | WS_VISIBLE | WS_CLIPCHILDREN,
                                  0, 0, 500, 300, nullptr, nullptr, ResourceModule(), nullptr);
    }
    ~ParentWindow() { DestroyWindow(window_); }

    HWND Handle() const { return window_; }
    HWND AddControl(const wchar_t* class_name, DWORD style, int id, const RECT& place) const {
        return CreateWindowExW(0, class_name, L"", WS_CHILD | WS_VISIBLE | style, place.left, place.top,
                               place.right - place.left, place.bottom - place.top, window_,
                               reinterpret_cast<HMENU>(static_cast<INT_PTR>(id)), ResourceModule(), nullptr);
    }
    // Paints and handles all that is in the queue; what was posted to the window since the last call.
    std::vector<Posted> Pump() {
        std::vector<Posted> posted;
        for (MSG message; PeekMessageW(&message, nullptr, 0, 0, PM_REMOVE);) {
            if (message.hwnd == window_ && message.message >= WM_USER && message.message < WM_APP) {
                posted.emplace_back(message.message, message.wParam, message.lParam);
            }
            DispatchMessageW(&message);
        }
        return posted;
    }

  private:
    HWND window_;
};

// The window with a list of three columns (name, date, tick), as the program uses it, that sorts.
struct ListWindow : ParentWindow {
    ListWindow() {
        list.Attach(AddControl(WC_LISTVIEWW, LVS_REPORT | LVS_OWNERDATA | LVS_OWNERDRAWFIXED, 1039,
                               {0, 0, 480, 280}));
        list.SetNotifyWindow(Handle());
        list.SetSortEnabled(true);
        list.SetColumnCount(3);
        list.SetColumnKind(2, kColumnCheckBox);
        const int widths[] = {300, 130, 20};
        for (int index = 0; index < 3; ++index) {
            LVCOLUMNW column{};
            column.mask = LVCF_WIDTH;
            column.cx = widths[index];
            Send(LVM_INSERTCOLUMNW, static_cast<WPARAM>(index), reinterpret_cast<LPARAM>(&column));
        }
    }

    LRESULT Send(UINT message, WPARAM wparam = 0, LPARAM lparam = 0) const {
        return SendMessageW(list.Handle(), message, wparam, lparam);
    }
    void Fill(std::vector<SortedListRecord> new_records) {
        const auto before = std::exchange(records, std::move(new_records));  // Ends after the list let go.
        list.SetItems(records);
    }
    void ClickHeader(int column) const {
        NMLISTVIEW click{};
        click.hdr.hwndFrom = list.Handle();
        click.hdr.idFrom = static_cast<UINT_PTR>(GetDlgCtrlID(list.Handle()));
        click.hdr.code = LVN_COLUMNCLICK;
        click.iSubItem = column;
        SendMessageW(Handle(), WM_NOTIFY, click.hdr.idFrom, reinterpret_cast<LPARAM>(&click));
    }
    RECT Cell(int row, int column) const {
        RECT cell{LVIR_BOUNDS, column, 0, 0};
        Send(LVM_GETSUBITEMRECT, static_cast<WPARAM>(row), reinterpret_cast<LPARAM>(&cell));
        return cell;
    }
    // A press (or another mouse message) into the tick column.
    void MouseAtTick(UINT message, int row) const {
        const RECT cell = Cell(row, 2);
        Send(message, MK_LBUTTON, MAKELPARAM((cell.left + cell.right) / 2, (cell.top + cell.bottom) / 2));
    }
    Texts FirstTexts() const {
        Texts texts;
        for (int row = 0; row < list.ItemCount(); ++row) {
            texts.push_back(list.RecordAt(row)->first_text);
        }
        return texts;
    }
    LRESULT Selected() const { return Send(LVM_GETSELECTEDCOUNT); }
    int FirstWith(UINT state) const {
        return static_cast<int>(Send(LVM_GETNEXTITEM, static_cast<WPARAM>(-1), MAKELPARAM(state, 0)));
    }
    Posted Notice(UINT message) const {
        return {message, reinterpret_cast<WPARAM>(list.Handle()), reinterpret_cast<LPARAM>(list.Handle())};
    }

    std::vector<SortedListRecord> records;
    USortedListCtrl list;
};

std::vector<SortedListRecord> FourRecords() {
    return {{L"b", L"2", true}, {L"A", L"3", false}, {L"c_", L"1", true}, {L"ca", L"1", false}};
}

TEST(RecordList, HeaderClicksSortAndTurn) {
    ListWindow window;
    window.Fill(FourRecords());
    window.list.SelectItem(1);
    EXPECT_EQ(window.FirstTexts(), (Texts{L"b", L"A", L"c_", L"ca"})) << "no click yet";
    const std::tuple<int, bool, Texts> clicks[] = {
        {0, true, {L"A", L"b", L"c_", L"ca"}}, {0, false, {L"ca", L"c_", L"b", L"A"}},
        {1, true, {L"ca", L"c_", L"b", L"A"}}, {1, false, {L"A", L"b", L"ca", L"c_"}},
        {0, true, {L"A", L"b", L"c_", L"ca"}},
    };
    for (const auto& [column, ascending, order] : clicks) {
        window.ClickHeader(column);
        EXPECT_EQ(window.FirstTexts(), order) << column << ascending;
        EXPECT_EQ(window.list.Header().SortColumn(), column);
        EXPECT_EQ(window.list.Header().Ascending(), ascending);
        EXPECT_EQ(window.FirstWith(LVNI_SELECTED), order[0] == L"A" ? 0 : 3) << "A stays selected";
    }
    window.Fill({{L"z", L"", false}, {L"y", L"", false}});
    EXPECT_EQ(window.FirstTexts(), (Texts{L"y", L"z"})) << "filled again: the sort setting holds";
}

TEST(RecordList, ClicksAndKeysTick) {
    ListWindow window;
    window.Fill(FourRecords());
    window.Pump();
    window.MouseAtTick(WM_LBUTTONDOWN, 1);
    EXPECT_TRUE(window.records[1].ticked);
    EXPECT_EQ(window.Selected(), 0) << "the click is swallowed";
    EXPECT_EQ(window.FirstWith(LVNI_FOCUSED), 1) << "a list with the focus has a focused row";
    EXPECT_EQ(GetFocus(), window.list.Handle());
    EXPECT_THAT(window.Pump(), Contains(window.Notice(2023)));
    window.MouseAtTick(WM_LBUTTONDOWN, 1);
    EXPECT_FALSE(window.records[1].ticked);

    window.list.SelectItem(2);
    window.Send(WM_KEYDOWN, VK_SPACE, 0);
    EXPECT_FALSE(window.records[2].ticked);
    window.Send(WM_KEYDOWN, VK_SPACE, static_cast<LPARAM>(KF_REPEAT) << 16);
    EXPECT_FALSE(window.records[2].ticked) << "a key held down";
    window.Send(WM_KEYDOWN, VK_DOWN, 0);
    window.Send(WM_KEYDOWN, VK_SPACE, 0);
    EXPECT_TRUE(window.records[3].ticked);
    EXPECT_EQ(window.list.TickedCount(), 2U);

    window.list.SelectItem(0);
    window.MouseAtTick(WM_LBUTTONDBLCLK, 3);
    EXPECT_THAT(window.Pump(), Contains(window.Notice(2022)));
    EXPECT_EQ(window.FirstWith(LVNI_SELECTED), 3) << "the receiver must find the row that was clicked";
}

TEST(RecordList, AHundredThousandEntries) {
    constexpr int kCount = 100'000;
    std::vector<SortedListRecord> many(kCount);
    for (int number = 0; number < kCount; ++number) {  // Every name once, out of order.
        many[static_cast<std::size_t>(number)].first_text = std::to_wstring(number * 7919LL % kCount);
    }
    ListWindow window;
    const auto step = [&window](const char* name, const auto& action) {
        const ULONGLONG start = GetTickCount64();
        action();
        const auto posted = window.Pump();
        // Several times what a busy machine needs; what is quadratic takes minutes.
        EXPECT_LT(GetTickCount64() - start, 5000) << name;
        const auto notices = std::count(posted.begin(), posted.end(), window.Notice(2023));
        EXPECT_GE(notices, 1) << name;
        EXPECT_LE(notices, 3) << name << ": not one for each item";
    };
    step("fill", [&] { window.Fill(many); });
    step("sort by name", [&] { window.ClickHeader(0); });
    EXPECT_EQ(window.list.RecordAt(0)->first_text, L"0");
    step("sort by tick, which is no ordering", [&] { window.ClickHeader(2); });
    Texts names = window.FirstTexts();
    std::sort(names.begin(), names.end());
    EXPECT_EQ(std::unique(names.begin(), names.end()) - names.begin(), kCount) << "each entry once";
    step("select all", [&] { window.list.SelectAll(); });
    step("sort with all selected", [&] { window.ClickHeader(0); });
    EXPECT_EQ(window.Selected(), kCount);
    step("invert", [&] { window.list.InvertSelection(); });
    step("tick all", [&] { window.list.TickAll(true); });
    step("untick the last", [&] {
        window.list.SelectItem(kCount - 1);
        window.MouseAtTick(WM_LBUTTONDOWN, kCount - 1);
    });
    EXPECT_EQ(window.list.TickedCount(), kCount - 1U);
    const LRESULT top = window.Send(LVM_GETTOPINDEX);
    step("fill again", [&] { window.list.SetItems(window.records); });
    EXPECT_EQ(window.Send(LVM_GETTOPINDEX), top);
    EXPECT_EQ(window.FirstWith(LVNI_FOCUSED), kCount - 1);
    step("fill with fewer", [&] { window.Fill(FourRecords()); });
    EXPECT_EQ(window.FirstWith(LVNI_FOCUSED), 3) << "the keyboard stays in the list";
}

TEST(RecordListDraw, TickedEntriesLookTicked) {
    ListWindow window;
    window.Fill({{L"", L"", true}, {L"", L"", false}});
    window.list.SelectAll();
    UniqueMemoryDc dc(CreateCompatibleDC(nullptr));
    UniqueBitmap bitmap(CreateBitmap(500, 300, 1, 32, nullptr));
    SelectObject(dc.Get(), bitmap.Get());
    for (const bool focus : {false, true}) {
        SetFocus(focus ? window.list.Handle() : window.Handle());
        window.Send(WM_PRINTCLIENT, reinterpret_cast<WPARAM>(dc.Get()), PRF_CLIENT | PRF_ERASEBKGND);
        for (int row = 0; row < 2; ++row) {
            RECT box = window.Cell(row, 2);
            InflateRect(&box, -6, -(box.bottom - box.top - 8) / 2);  // What the box has in it.
            int marked = 0;
            for (int pixel = 0; pixel < 64; ++pixel) {
                marked += GetPixel(dc.Get(), box.left + pixel % 8, box.top + pixel / 8) ==
                          (focus ? RGB(255, 255, 255) : RGB(0, 0, 0));
            }
            EXPECT_EQ(marked > 8, row == 0) << focus;
        }
    }
}

TEST(PageTab, ShowsThePageThatIsSelectedAndEnablesAllWithItself) {
    ParentWindow window;
    // A control of each page and one that is on both.
    HWND first = window.AddControl(L"BUTTON", 0, 1, {0, 40, 50, 60});
    HWND second = window.AddControl(L"BUTTON", 0, 2, {60, 40, 110, 60});
    HWND both = window.AddControl(L"BUTTON", 0, 3, {120, 40, 170, 60});
    const auto each = [&](auto test) {
        return std::vector<bool>{test(first) != 0, test(second) != 0, test(both) != 0};
    };
    CSTabCtrl tabs;
    tabs.Attach(window.AddControl(WC_TABCONTROLW, 0, 1046, {0, 0, 400, 30}));
    TCITEMW item{};
    SendMessageW(tabs.Handle(), TCM_INSERTITEMW, 0, reinterpret_cast<LPARAM>(&item));
    SendMessageW(tabs.Handle(), TCM_INSERTITEMW, 0, reinterpret_cast<LPARAM>(&item));
    tabs.SetNotifyWindow(window.Handle());
    EXPECT_TRUE(tabs.AttachControlToTab(second, 1) && tabs.AttachControlToTab(both, 1));
    EXPECT_TRUE(tabs.AttachControlToTab(first, 0) && tabs.AttachControlToTab(both, 0));
    EXPECT_THAT(each(IsWindowVisible), ElementsAre(false, false, false)) << "whatever tab is selected";
    EXPECT_EQ(tabs.SetCurSel(0), 1) << "what was inserted first was selected and moved on";
    EXPECT_THAT(each(IsWindowVisible), ElementsAre(true, false, true));
    EXPECT_THAT(window.Pump(), IsEmpty()) << "only the user's selections are told";
    SendMessageW(tabs.Handle(), TCM_SETCURFOCUS, 1, 0);
    EXPECT_THAT(each(IsWindowVisible), ElementsAre(false, true, true));
    EXPECT_THAT(window.Pump(), ElementsAre(ParentWindow::Posted{2021, 1046, 1}));

    tabs.EnableTabControls(0, false);
    EXPECT_THAT(each(IsWindowEnabled), ElementsAre(false, true, false));
    for (const bool enabled : {false, true}) {
        EnableWindow(tabs.Handle(), enabled);
        EXPECT_THAT(each(IsWindowEnabled), ElementsAre(enabled, enabled, enabled));
    }
}

}  // namespace
}  // namespace orvane::testing
