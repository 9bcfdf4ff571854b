#include "browse/browse_dialog.h"

#include <gtest/gtest.h>

#include <algorithm>
#include <array>
#include <filesystem>

#include "browse/file_property_dialog.h"
#include "res/ids.h"
#include "tests/support/dialog_script.h"
#include "tests/support/folder_device.h"
#include "tests/support/message_boxes.h"

namespace orvane {

namespace {

using testing::ItemText;
using testing::WaitUntil;

const std::wstring kNoFiles = L"*.asdfdfsasdf";
constexpr const wchar_t* kLoadFailed = L"failed to read from remote device";
constexpr const wchar_t* kRefreshed = L"Failed to read from remote device.";

bool IsReading(HWND dialog) {
    const std::vector<HWND> dialogs = testing::DialogsBeside(dialog);
    return std::any_of(dialogs.begin(), dialogs.end(),
                       [](HWND other) { return GetDlgItem(other, IDC_LOAD_ICON) != nullptr; });
}

// Returns when the wait dialog has come and gone and its thread takes messages again.
void AwaitRead(HWND dialog) {
    EXPECT_TRUE(WaitUntil([dialog] { return IsReading(dialog); }));
    EXPECT_TRUE(WaitUntil([dialog] { return !IsReading(dialog); }));
    SendMessageW(dialog, WM_NULL, 0, 0);
}

// The one of the visible dialogs that takes input.
HWND EnabledDialog(HWND dialog) {
    std::vector<HWND> dialogs = testing::DialogsBeside(dialog);
    std::erase_if(dialogs, [](HWND other) { return !IsWindowEnabled(other); });
    EXPECT_EQ(dialogs.size(), 1U);
    return dialogs.empty() ? nullptr : dialogs[0];
}

HWND TreeOf(HWND dialog) {
    return GetDlgItem(dialog, IDC_BROWSE_TREE);
}

// Each item in the order of the tree: a blank per level, its picture's number, a "*" if it is bold, its text.
void Describe(HWND tree, HTREEITEM item, const std::wstring& indent, std::vector<std::wstring>& lines) {
    for (; item != nullptr; item = TreeView_GetNextSibling(tree, item)) {
        std::array<wchar_t, 300> text{};
        TVITEMW data{};
        data.mask = TVIF_HANDLE | TVIF_TEXT | TVIF_STATE;
        data.hItem = item;
        data.pszText = text.data();
        data.cchTextMax = static_cast<int>(text.size());
        data.stateMask = TVIS_STATEIMAGEMASK | TVIS_BOLD;
        TreeView_GetItem(tree, &data);
        lines.push_back(indent + std::to_wstring((data.state & TVIS_STATEIMAGEMASK) >> 12) +
                        ((data.state & TVIS_BOLD) != 0 ? L"*" : L" ") + text.data());
        Describe(tree, TreeView_GetChild(tree, item), indent + L' ', lines);
    }
}

std::vector<std::wstring> Items(HWND dialog) {
    std::vector<std::wstring> lines;
    Describe(TreeOf(dialog), TreeView_GetRoot(TreeOf(dialog)), L"", lines);
    return lines;
}

// Tells the dialog of a double click, which the tree has not seen and so does not act upon.
void DoubleClick(HWND dialog) {
    NMHDR notification = {TreeOf(dialog), IDC_BROWSE_TREE, static_cast<UINT>(NM_DBLCLK)};
    SendMessageW(dialog, WM_NOTIFY, IDC_BROWSE_TREE, reinterpret_cast<LPARAM>(&notification));
}

class BrowseDialog : public ::testing::Test {
  protected:
    BrowseDialog() {
        testing::MakeFolder(device_.PcPath(L"\\Temp"));
        testing::MakeFolder(device_.PcPath(L"\\CF Card\\Jobs\\A"));
        testing::WriteTextFile(device_.PcPath(L"\\CF Card\\Jobs\\b\\1.txt"), "1");
        testing::WriteTextFile(device_.PcPath(L"\\CF Card\\Jobs\\a.TXT"), "a");
        testing::WriteTextFile(device_.PcPath(L"\\CF Card\\Jobs\\c.job"), "c");
    }

    INT_PTR Run(const std::wstring& filter, const std::wstring& initial_folder,
                const std::function<void(HWND)>& script, int file_name_mode = 1) {
        CCeBrowseDlg dialog(file_name_mode, 0, {filter}, L"Browse", initial_folder, nullptr);
        const auto after_reading = [&](HWND window) {
            AwaitRead(window);
            script(window);
        };
        const INT_PTR result = testing::RunWithScript([&] { return dialog.DoModal(); }, after_reading);
        result_folder_ = dialog.ResultFolder();
        return result;
    }

    testing::FolderDevice device_;
    std::wstring result_folder_;
};

TEST_F(BrowseDialog, ShowsTheDeviceSortedAndSelectsTheDeepestFolder) {
    const INT_PTR result = Run(L"txt", L"\\cf card\\JOBS\\a.txt\\missing", [](HWND dialog) {
        EXPECT_EQ(Items(dialog), (std::vector<std::wstring>{L"1*CF Card", L" 1*Jobs", L"  1*A", L"  2*b",
                                                            L"   3 1.txt", L"  3 a.TXT", L"1*Temp"}));
        EXPECT_EQ(ItemText(dialog, IDC_BROWSE_FOLDER), L"\\CF Card\\Jobs\\");
        EXPECT_EQ(ui::WindowText(dialog), L"Browse");
        // The tree has the place of its placeholder in the tab order.
        HWND folder = GetDlgItem(dialog, IDC_BROWSE_FOLDER);
        EXPECT_EQ(GetNextDlgTabItem(dialog, folder, FALSE), TreeOf(dialog));
        EXPECT_EQ(GetNextDlgTabItem(dialog, TreeOf(dialog), FALSE), GetDlgItem(dialog, IDOK));
        testing::Press(dialog, IDOK);
    });
    EXPECT_EQ(result, IDOK);
    EXPECT_EQ(result_folder_, L"\\CF Card\\Jobs\\");
}

TEST_F(BrowseDialog, AnswersNothingWithoutASelection) {
    const INT_PTR result = Run(kNoFiles, L"\\Tem\\Jobs", [](HWND dialog) {
        EXPECT_EQ(Items(dialog),
                  (std::vector<std::wstring>{L"2*CF Card", L" 2*Jobs", L"  1*A", L"  1*b", L"1*Temp"}));
        testing::Press(dialog, IDOK);
    });
    EXPECT_EQ(result, IDOK);
    EXPECT_EQ(result_folder_, L"");
}

TEST_F(BrowseDialog, PicturesFollowTheUser) {
    Run(kNoFiles, L"\\Temp", [](HWND dialog) {
        for (const wchar_t* shown : {L"2*Temp", L"1*Temp"}) {
            DoubleClick(dialog);
            EXPECT_EQ(Items(dialog).back(), shown);
        }
        TreeView_SelectItem(TreeOf(dialog), TreeView_GetRoot(TreeOf(dialog)));
        // A folder with something in it changes when it opens, not by the click.
        DoubleClick(dialog);
        EXPECT_EQ(Items(dialog)[0], L"2*CF Card");
        SendMessageW(TreeOf(dialog), WM_KEYDOWN, VK_RIGHT, 0);
        EXPECT_EQ(Items(dialog)[0], L"1*CF Card");
        SendMessageW(TreeOf(dialog), WM_KEYDOWN, VK_LEFT, 0);
        EXPECT_EQ(Items(dialog)[0], L"2*CF Card");
    });
}

TEST_F(BrowseDialog, FileNameFieldKeepsTheNameOnlyInItsMode) {
    for (const int mode : {0, 1}) {
        Run(
            L"job", L"\\CF Card\\Jobs",
            [mode](HWND dialog) {
                HWND tree = TreeOf(dialog);
                HTREEITEM jobs = TreeView_GetSelection(tree);
                // The last of its three entries.
                HTREEITEM second = TreeView_GetNextSibling(tree, TreeView_GetChild(tree, jobs));
                TreeView_SelectItem(tree, TreeView_GetNextSibling(tree, second));
                EXPECT_EQ(ItemText(dialog, IDC_BROWSE_FOLDER), L"\\CF Card\\Jobs\\");
                EXPECT_EQ(ItemText(dialog, IDC_BROWSE_FILE_NAME), L"c.job");
                TreeView_SelectItem(tree, TreeView_GetParent(tree, jobs));
                EXPECT_EQ(ItemText(dialog, IDC_BROWSE_FOLDER), L"\\CF Card\\");
                EXPECT_EQ(ItemText(dialog, IDC_BROWSE_FILE_NAME), mode != 0 ? L"c.job" : L"");
                TreeView_SelectItem(tree, nullptr);
                EXPECT_EQ(ItemText(dialog, IDC_BROWSE_FOLDER), L"");
                EXPECT_EQ(ItemText(dialog, IDC_BROWSE_FILE_NAME), L"");
            },
            mode);
    }
}

TEST_F(BrowseDialog, RefreshReadsAgainOnceAndShowsItsMessage) {
    Run(kNoFiles, L"\\CF Card", [this](HWND dialog) {
        HWND tree = TreeOf(dialog);
        SendMessageW(dialog, WM_NEXTDLGCTL, reinterpret_cast<WPARAM>(tree), TRUE);
        TreeView_SelectItem(tree, TreeView_GetNextSibling(tree, TreeView_GetRoot(tree)));
        testing::MakeFolder(device_.PcPath(L"\\Temp\\new"));
        for (const wchar_t* folder : {L"\\Temp\\", L"\\CF Card\\"}) {
            const testing::MessageBoxAnswerer boxes;
            PostMessageW(tree, WM_KEYDOWN, VK_F5, 0);
            EXPECT_TRUE(WaitUntil([dialog] { return IsReading(dialog); }));
            PostMessageW(tree, WM_KEYDOWN, VK_F5, 0);  // Impatiently.
            EXPECT_TRUE(WaitUntil([&] { return boxes.Seen().size() == 1 && IsWindowEnabled(dialog); }));
            EXPECT_EQ(boxes.Seen()[0].text, kRefreshed);
            EXPECT_EQ(boxes.Seen()[0].caption, L"Orvanelink");
            EXPECT_FALSE(IsReading(dialog));
            // Where the folder has gone, the tree that has the focus begins anew.
            EXPECT_EQ(ItemText(dialog, IDC_BROWSE_FOLDER), folder);
            EXPECT_EQ(Items(dialog).back(), folder[1] == L'T' ? L" 1*new" : L"  1*b");
            std::filesystem::remove_all(device_.PcPath(L"\\Temp"));
        }
    });
}

TEST_F(BrowseDialog, AFolderThatCannotBeReadEmptiesTheTreeAndIsToldOfFirst) {
    Run(kNoFiles, L"\\Temp", [this](HWND dialog) {
        device_.Set(L"REFUSE", L"CeFindAllFiles@\\CF Card\\Jobs\\*=5");
        PostMessageW(TreeOf(dialog), WM_COMMAND, IDM_TREE_REFRESH, 0);
        AwaitRead(dialog);
        EXPECT_TRUE(WaitUntil([&] { return testing::DialogsBeside(dialog).size() == 3; }));
        for (const wchar_t* text : {kLoadFailed, kRefreshed}) {
            // Only the newest takes input, so that they close in the order in which they can.
            HWND box = EnabledDialog(dialog);
            EXPECT_NE(FindWindowExW(box, nullptr, nullptr, text), nullptr) << text;
            PostMessageW(box, WM_CLOSE, 0, 0);
            EXPECT_TRUE(WaitUntil([box] { return !IsWindow(box); }));
        }
        EXPECT_EQ(ItemText(dialog, IDC_BROWSE_FOLDER), L"");
        EXPECT_EQ(Items(dialog), std::vector<std::wstring>());
    });
}

TEST_F(BrowseDialog, ContextMenuIsForTheItemUnderThePointOrTheSelectedOne) {
    Run(kNoFiles, L"", [](HWND dialog) {
        HWND tree = TreeOf(dialog);
        HTREEITEM temp = TreeView_GetNextSibling(tree, TreeView_GetRoot(tree));
        RECT label{};
        TreeView_GetItemRect(tree, temp, &label, TRUE);
        const struct {
            UINT message;
            LPARAM point;
            bool has_property;
        } cases[] = {{WM_RBUTTONUP, MAKELPARAM(100, 150), false},
                     {WM_RBUTTONUP, MAKELPARAM(label.left + 2, label.top + 2), true},
                     {WM_CONTEXTMENU, -1, true}};
        for (const auto& c : cases) {
            if (c.message == WM_RBUTTONUP) {
                SendMessageW(tree, WM_RBUTTONDOWN, MK_RBUTTON, c.point);
            }
            PostMessageW(tree, c.message, 0, c.point);
            HWND menu_window = nullptr;
            EXPECT_TRUE(WaitUntil([&] {
                menu_window = FindWindowW(L"#32768", nullptr);
                return menu_window != nullptr && IsWindowVisible(menu_window);
            }));
            const auto menu = reinterpret_cast<HMENU>(SendMessageW(menu_window, MN_GETHMENU, 0, 0));
            EXPECT_EQ(GetMenuItemID(menu, 1), static_cast<UINT>(IDM_TREE_REFRESH));
            EXPECT_EQ((GetMenuState(menu, IDM_TREE_PROPERTY, MF_BYCOMMAND) & MF_GRAYED) == 0, c.has_property);
            EXPECT_EQ(TreeView_GetSelection(tree) == temp, c.has_property);
            SendMessageW(tree, WM_CANCELMODE, 0, 0);
            EXPECT_TRUE(WaitUntil([&] { return !IsWindow(menu_window) || !IsWindowVisible(menu_window); }));
        }
    });
}

TEST_F(BrowseDialog, PropertyShowsTheSelectedItem) {
    const FILETIME written = testing::UtcTime(2001, 2, 3, 12);
    const std::wstring file = device_.PcPath(L"\\Temp\\A & B.job");
    testing::WriteTextFile(file, "12", written);
    SetFileAttributesW(file.c_str(), FILE_ATTRIBUTE_READONLY);
    Run(L"job", L"\\Temp", [&written](HWND dialog) {
        const struct {
            const wchar_t* path;
            const wchar_t* type;
            const wchar_t* date_label;
            bool is_file;
        } cases[] = {{L"\\Temp", L"Folder", L"Created:", false},
                     {L"\\Temp\\A & B.job", L"JOB File", L"Modified:", true}};
        for (const auto& c : cases) {
            PostMessageW(TreeOf(dialog), WM_COMMAND, IDM_TREE_PROPERTY, 0);
            EXPECT_TRUE(WaitUntil([&] { return testing::DialogsBeside(dialog).size() == 2; }));
            HWND property = EnabledDialog(dialog);
            EXPECT_EQ(ItemText(property, IDC_PROPERTY_PATH), c.path);
            EXPECT_EQ(ItemText(property, IDC_PROPERTY_TYPE), c.type);
            EXPECT_EQ(ItemText(property, IDC_PROPERTY_DATE_LABEL), c.date_label);
            EXPECT_EQ(ItemText(property, IDC_PROPERTY_DATE) == DateText(written), c.is_file);
            EXPECT_EQ(IsWindowVisible(GetDlgItem(property, IDC_PROPERTY_SIZE)) != FALSE, c.is_file);
            EXPECT_EQ(ItemText(property, IDC_PROPERTY_SIZE), c.is_file ? L"2 bytes" : L"0 bytes");
            EXPECT_EQ(IsDlgButtonChecked(property, IDC_PROPERTY_READ_ONLY) != 0, c.is_file);
            EXPECT_EQ(IsDlgButtonChecked(property, IDC_PROPERTY_HIDDEN), 0U);
            testing::Press(property, IDOK);
            EXPECT_TRUE(WaitUntil([&] { return IsWindowEnabled(dialog) != FALSE; }));
            HWND tree = TreeOf(dialog);
            TreeView_SelectItem(tree, TreeView_GetChild(tree, TreeView_GetSelection(tree)));
        }
    });
}

TEST(PropertyTexts, TypeIsTheUpperCaseExtension) {
    const struct {
        const wchar_t* path;
        const wchar_t* type;
    } cases[] = {{L"\\Jobs\\site1.job", L"JOB File"},
                 {L"\\Jobs\\a.b.t\u00e4g", L"T\u00c4G File"},
                 {L"\\My.Folder\\readme", L" File"},
                 {L"\\Jobs\\readme", L""},
                 {L"\\Jobs\\name..", L""},
                 {L"\\Jobs\\.profile", L"PROFILE File"}};
    for (const auto& c : cases) {
        EXPECT_EQ(FileTypeText(c.path), c.type) << c.path;
    }
}

TEST(PropertyTexts, SayWhatCannotBeShown) {
    EXPECT_EQ(SizeText(3'000'000'000), L"-1294967296 bytes");
    // Beyond the year 9999 there are file times but no OLE dates.
    EXPECT_EQ(DateText(testing::UtcTime(20000, 1, 1)), L"Invalid DateTime");
}

TEST(DirTree, RefusesAFilterThatIsTooLong) {
    UCeDirTree tree;
    EXPECT_TRUE(tree.AddFilter(std::wstring(15, L'x')));
    EXPECT_FALSE(tree.AddFilter(std::wstring(16, L'x')));
}

}  // namespace

}  // namespace orvane
