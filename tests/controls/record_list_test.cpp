#include "controls/record_list.h"

#include <gmock/gmock.h>
#include <gtest/gtest.h>

#include <algorithm>

#include "tests/controls/list_window.h"

namespace orvane::testing {
namespace {

using ::testing::ElementsAre;

using Texts = std::vector<std::wstring>;

std::vector<SortedListRecord> FourRecords() {
    return {{L"b", L"2", true}, {L"A", L"3", false}, {L"c_", L"1", true}, {L"ca", L"1", false}};
}

// Plain entries, named by their number, none ticked.
std::vector<SortedListRecord> ManyRecords(int count) {
    std::vector<SortedListRecord> records;
    for (int number = 0; number < count; ++number) {
        // 7919 is prime to the counts in use: every name once, out of order.
        records.push_back({L"Job" + std::to_wstring(number * 7919 % count) + L".qvj", L"01/02/2012", false});
    }
    return records;
}

int Selected(const ListWindow& window) {
    return static_cast<int>(SendMessageW(window.list.Handle(), LVM_GETSELECTEDCOUNT, 0, 0));
}

ParentWindow::Posted Notice(UINT message, HWND list) {
    return {message, reinterpret_cast<WPARAM>(list), reinterpret_cast<LPARAM>(list)};
}

TEST(RecordList, HeaderClicksSortAndTurn) {
    ListWindow window;
    window.Fill(FourRecords());
    EXPECT_EQ(window.FirstTexts(), (Texts{L"b", L"A", L"c_", L"ca"})) << "no click yet";
    const struct {
        int column;
        bool ascending;
        Texts order;
    } clicks[] = {
        {0, true, {L"A", L"b", L"c_", L"ca"}}, {0, false, {L"ca", L"c_", L"b", L"A"}},
        {1, true, {L"ca", L"c_", L"b", L"A"}}, {1, false, {L"A", L"b", L"ca", L"c_"}},
        {0, true, {L"A", L"b", L"c_", L"ca"}},
    };
    for (const auto& click : clicks) {
        window.ClickHeader(click.column);
        EXPECT_EQ(window.FirstTexts(), click.order) << click.column << click.ascending;
        EXPECT_EQ(window.list.Header().SortColumn(), click.column);
        EXPECT_EQ(window.list.Header().Ascending(), click.ascending);
    }
    window.Fill({{L"z", L"", false}, {L"y", L"", false}});
    EXPECT_EQ(window.FirstTexts(), (Texts{L"y", L"z"})) << "filled again: the sort setting holds";
    window.list.SetSortEnabled(false);
    window.ClickHeader(0);
    EXPECT_TRUE(window.list.Header().Ascending());
    ListWindow other(1048);
    other.Fill(FourRecords());
    other.ClickHeader(0);
    EXPECT_EQ(other.list.Header().SortColumn(), 0);
    EXPECT_EQ(other.FirstTexts(), (Texts{L"b", L"A", L"c_", L"ca"})) << "only the list numbered 1039 sorts";
}

TEST(RecordList, ClickAndSpaceBarFlipTicks) {
    ListWindow window;
    window.Fill(FourRecords());
    window.Pump();
    window.Mouse(WM_LBUTTONDOWN, 1, 2);
    EXPECT_TRUE(window.records[1].ticked);
    EXPECT_EQ(Selected(window), 0) << "the click is swallowed";
    EXPECT_EQ(GetFocus(), window.list.Handle());
    EXPECT_THAT(window.Pump(), ElementsAre(Notice(2023, window.list.Handle())));
    window.Mouse(WM_LBUTTONDOWN, 1, 2);
    EXPECT_FALSE(window.records[1].ticked);

    window.list.SelectItem(2);
    SendMessageW(window.list.Handle(), WM_KEYDOWN, VK_SPACE, 0);
    EXPECT_FALSE(window.records[2].ticked);
    SendMessageW(window.list.Handle(), WM_KEYDOWN, VK_SPACE, static_cast<LPARAM>(KF_REPEAT) << 16);
    EXPECT_FALSE(window.records[2].ticked) << "a key held down";
    SendMessageW(window.list.Handle(), WM_KEYDOWN, VK_DOWN, 0);
    SendMessageW(window.list.Handle(), WM_KEYDOWN, VK_SPACE, 0);
    EXPECT_TRUE(window.records[3].ticked);
}

TEST(RecordList, DoubleClickNamesTheList) {
    ListWindow window;
    window.Fill(FourRecords());
    window.list.SelectItem(0);
    window.Pump();
    window.Mouse(WM_LBUTTONDBLCLK, 3, 2);
    const auto posted = window.Pump();
    EXPECT_EQ(std::count(posted.begin(), posted.end(), Notice(2022, window.list.Handle())), 1);
    const auto first_selected = SendMessageW(window.list.Handle(), LVM_GETNEXTITEM, static_cast<WPARAM>(-1),
                                             MAKELPARAM(LVNI_SELECTED, 0));
    EXPECT_EQ(first_selected, 3) << "the receiver must find the row that was clicked";
}

TEST(RecordList, SelectionOperations) {
    ListWindow window;
    window.Fill(ManyRecords(100));
    ShowWindow(window.list.Handle(), SW_HIDE);
    window.list.SelectItem(80);
    const auto top = SendMessageW(window.list.Handle(), LVM_GETTOPINDEX, 0, 0);
    EXPECT_GT(top, 60);
    for (const int outside : {-1, 100}) {
        window.list.SelectItem(outside);
        EXPECT_EQ(Selected(window), 1) << outside;
    }
    window.list.InvertSelection();
    EXPECT_EQ(Selected(window), 99);
    EXPECT_EQ(SendMessageW(window.list.Handle(), LVM_GETITEMSTATE, 80, LVIS_SELECTED | LVIS_FOCUSED), 0);
    window.list.SelectAll();
    EXPECT_EQ(Selected(window), 100);
    window.list.SelectItem(3);
    EXPECT_EQ(Selected(window), 1);
    EXPECT_FALSE(IsWindowVisible(window.list.Handle())) << "work on a hidden page must not show its list";
}

TEST(RecordList, FilledAgainKeepsPlaceAndFocusedRow) {
    ListWindow window;
    window.Fill(ManyRecords(1000));
    window.list.SelectItem(600);
    const auto top = SendMessageW(window.list.Handle(), LVM_GETTOPINDEX, 0, 0);
    window.list.SetItems(window.records);
    EXPECT_EQ(SendMessageW(window.list.Handle(), LVM_GETTOPINDEX, 0, 0), top);
    EXPECT_EQ(SendMessageW(window.list.Handle(), LVM_GETITEMSTATE, 600, LVIS_SELECTED | LVIS_FOCUSED),
              LVIS_SELECTED | LVIS_FOCUSED);
    window.Fill({});
    EXPECT_EQ(window.list.ItemCount(), 0);
}

TEST(RecordList, ColumnKinds) {
    const struct {
        int column;
        DWORD flags;
        INT_PTR extra;
        bool accepted;
        DWORD stored;
    } cases[] = {
        {0, 0x801, 0, true, 0x1},   {0, 0x806, 0, true, 0x800}, {0, 0x6, 0, true, 0x4},
        {0, 0x2, 0, false, 0},      {0, 0x2, 5, true, 0x2},     {0, 0x38, 5, true, 0x30},
        {0, 0x30, 0, false, 0},     {0, 0x70, 5, true, 0x30},   {0, 0x50, 5, true, 0x50},
        {0, 0x50, 0, false, 0},     {0, 0x18, 0, true, 0},      {0, 0x108, 0, true, 0x8},
        {0, 0x700, 0, true, 0x500}, {0, 0x300, 0, true, 0x300}, {0, 0x100, 0, true, 0},
        {0, 0x80, 0, false, 0},     {-1, 0x1, 0, false, 0},     {3, 0x1, 0, false, 0},
        {2, 0x4, 0, true, 0},
    };
    for (const auto& row : cases) {
        USortedListCtrl list;
        list.SetColumnCount(3);
        EXPECT_EQ(list.SetColumnKind(row.column, row.flags, row.extra), row.accepted) << row.flags;
        EXPECT_EQ(list.Columns()[0].kind, row.stored) << row.flags;
    }
}

TEST(RecordList, AHundredThousandEntries) {
    constexpr int kCount = 100000;
    ListWindow window;
    const auto step = [&window](const char* name, const auto& action) {
        const ULONGLONG start = GetTickCount64();
        action();
        const auto posted = window.Pump();
        // Several times what a busy machine needs; what is quadratic takes seconds.
        EXPECT_LT(GetTickCount64() - start, 1500) << name;
        const auto notices = std::count(posted.begin(), posted.end(), Notice(2023, window.list.Handle()));
        EXPECT_GE(notices, 1) << name;
        EXPECT_LE(notices, 3) << name << ": not one for each item";
    };
    step("fill", [&] { window.Fill(ManyRecords(kCount)); });
    step("sort by name", [&] { window.ClickHeader(0); });
    EXPECT_EQ(window.Text(0, 0), L"Job0.qvj");
    step("sort by tick", [&] { window.ClickHeader(2); });
    Texts names = window.FirstTexts();
    std::sort(names.begin(), names.end());
    EXPECT_EQ(std::unique(names.begin(), names.end()) - names.begin(), kCount) << "each entry once";
    step("select all", [&] { window.list.SelectAll(); });
    step("invert", [&] { window.list.InvertSelection(); });
    step("scroll", [&] { window.list.SelectItem(kCount - 1); });
    step("tick", [&] { window.Mouse(WM_LBUTTONDOWN, kCount - 1, 2); });
    step("fill again", [&] { window.list.SetItems(window.records); });
}

}  // namespace
}  // namespace orvane::testing
