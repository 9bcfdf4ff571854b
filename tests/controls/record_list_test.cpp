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

int Selected(const ListWindow& window) {
    return static_cast<int>(SendMessageW(window.list.Handle(), LVM_GETSELECTEDCOUNT, 0, 0));
}

ParentWindow::Posted Notice(UINT message, HWND list) {
    return {message, reinterpret_cast<WPARAM>(list), reinterpret_cast<LPARAM>(list)};
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

TEST(RecordList, HeaderClicksSortAndTurn) {
    ListWindow window;
    window.Fill(FourRecords());
    EXPECT_EQ(window.FirstTexts(), (Texts{L"b", L"A", L"c_", L"ca"})) << "no click yet";
    const std::pair<int, Texts> clicks[] = {{0, {L"A", L"b", L"c_", L"ca"}},
                                            {0, {L"ca", L"c_", L"b", L"A"}},
                                            {1, {L"ca", L"c_", L"b", L"A"}},
                                            {1, {L"A", L"b", L"ca", L"c_"}},
                                            {0, {L"A", L"b", L"c_", L"ca"}}};
    for (const auto& [column, order] : clicks) {
        window.ClickHeader(column);
        EXPECT_EQ(window.FirstTexts(), order) << column;
    }
    window.Fill({{L"z", L"", false}, {L"y", L"", false}});
    EXPECT_EQ(window.FirstTexts(), (Texts{L"y", L"z"})) << "filled again: the sort setting holds";
}

TEST(RecordList, OnlyTheListNumbered1039IsReordered) {
    ListWindow window(1048);
    window.Fill(FourRecords());
    window.ClickHeader(0);
    EXPECT_EQ(window.FirstTexts(), (Texts{L"b", L"A", L"c_", L"ca"}));
}

TEST(RecordList, ClickAndSpaceBarFlipTicks) {
    ListWindow window;
    window.Fill(FourRecords());
    window.Pump();
    for (const bool ticked : {true, false}) {
        window.Mouse(WM_LBUTTONDOWN, 1);
        EXPECT_EQ(window.records[1].ticked, ticked);
        EXPECT_EQ(window.Text(1, 2), ticked ? L"0" : L"1");
        EXPECT_EQ(Selected(window), 0) << "the click is swallowed";
        EXPECT_THAT(window.Pump(), ElementsAre(Notice(2023, window.list.Handle())));
    }
    window.list.SelectItem(2);
    for (const LPARAM key_data : {LPARAM{0}, static_cast<LPARAM>(KF_REPEAT) << 16}) {
        SendMessageW(window.list.Handle(), WM_KEYDOWN, VK_SPACE, key_data);
        EXPECT_FALSE(window.records[2].ticked) << "once, however long the key is held down";
    }
}

TEST(RecordList, DoubleClickNamesTheList) {
    ListWindow window;
    window.Fill(FourRecords());
    window.list.SelectItem(0);
    window.Pump();
    window.Mouse(WM_LBUTTONDBLCLK, 3);
    const auto posted = window.Pump();
    EXPECT_EQ(std::count(posted.begin(), posted.end(), Notice(2022, window.list.Handle())), 1);
    const auto first_selected = SendMessageW(window.list.Handle(), LVM_GETNEXTITEM, static_cast<WPARAM>(-1),
                                             MAKELPARAM(LVNI_SELECTED, 0));
    EXPECT_EQ(first_selected, 3) << "the receiver must find the row that was clicked";
}

TEST(RecordList, FilledAgainKeepsPlaceAndFocusedRow) {
    ListWindow window;
    window.Fill(ManyRecords(1000));
    window.list.SelectItem(600);
    const auto top = SendMessageW(window.list.Handle(), LVM_GETTOPINDEX, 0, 0);
    EXPECT_GT(top, 500);
    ShowWindow(window.list.Handle(), SW_HIDE);
    window.list.SetItems(window.records);
    EXPECT_FALSE(IsWindowVisible(window.list.Handle())) << "work on a hidden page must not show its list";
    EXPECT_EQ(SendMessageW(window.list.Handle(), LVM_GETTOPINDEX, 0, 0), top);
    EXPECT_EQ(SendMessageW(window.list.Handle(), LVM_GETITEMSTATE, 600, LVIS_SELECTED | LVIS_FOCUSED),
              LVIS_SELECTED | LVIS_FOCUSED);
}

TEST(RecordList, TenThousandEntries) {
    constexpr int kCount = 10000;
    ListWindow window;
    const auto step = [&window](const char* name, const auto& action) {
        const ULONGLONG start = GetTickCount64();
        action();
        const auto posted = window.Pump();
        // Several times what a busy machine needs; what is quadratic takes seconds.
        EXPECT_LT(GetTickCount64() - start, 1500U) << name;
        const auto notices = std::count(posted.begin(), posted.end(), Notice(2023, window.list.Handle()));
        EXPECT_TRUE(notices >= 1 && notices <= 3) << name << ": not one for each item";
    };
    step("fill", [&] { window.Fill(ManyRecords(kCount)); });
    step("sort by name", [&] { window.ClickHeader(0); });
    step("sort by tick", [&] { window.ClickHeader(2); });
    Texts names = window.FirstTexts();
    std::sort(names.begin(), names.end());
    EXPECT_EQ(std::unique(names.begin(), names.end()) - names.begin(), kCount) << "each entry once";
    step("select all", [&] { window.list.SelectAll(); });
}

}  // namespace
}  // namespace orvane::testing
