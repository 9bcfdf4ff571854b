// The device's folder tree, the properties of its items, and the chooser of a PC folder.
#include <gtest/gtest.h>

#include <algorithm>
#include <array>
#include <filesystem>

#include "browse/browse_dialog.h"
#include "browse/file_property_dialog.h"
#include "browse/folder_dialog.h"
#include "platform/text_case.h"
#include "res/ids.h"
#include "tests/support/dialog_script.h"
#include "tests/support/folder_device.h"
#include "tests/support/message_boxes.h"

namespace orvane::testing {
namespace {

using Lines = std::vector<std::wstring>;

const std::wstring kNoFiles = L"*.asdfdfsasdf";

bool IsReading(HWND dialog) {
    return std::ranges::any_of(DialogsBeside(dialog),
                               [](HWND other) { return GetDlgItem(other, IDC_LOAD_ICON) != nullptr; });
}

HWND TreeOf(HWND dialog) {
    return GetDlgItem(dialog, IDC_BROWSE_TREE);
}

// Each item in the order of the tree: a blank per level, its picture's number, a "*" if it is bold, its text.
void Describe(HWND tree, HTREEITEM item, const std::wstring& indent, Lines& lines) {
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

Lines Items(HWND dialog) {
    Lines lines;
    Describe(TreeOf(dialog), TreeView_GetRoot(TreeOf(dialog)), L"", lines);
    return lines;
}

class BrowseDialog : public ::testing::Test {
  protected:
    BrowseDialog() {
        MakeFolder(device_.PcPath(L"\\Temp"));
        MakeFolder(device_.PcPath(L"\\CF Card\\Jobs\\A"));
        WriteTextFile(device_.PcPath(L"\\CF Card\\Jobs\\b\\1.txt"), "1");
        WriteTextFile(device_.PcPath(L"\\CF Card\\Jobs\\a.TXT"), "a");
        WriteTextFile(device_.PcPath(L"\\CF Card\\Jobs\\c.job"), "c");
    }

    // Runs the dialog with the script, to "OK"; the folder that it answers.
    std::wstring Run(const std::wstring& filter, const std::wstring& initial_folder,
                     const std::function<void(HWND)>& script, int file_name_mode = 1) {
        CCeBrowseDlg dialog(file_name_mode, 0, {filter}, L"Browse", initial_folder, nullptr);
        RunWithScript([&] { return dialog.DoModal(); },
                      [&](HWND window) {
                          EXPECT_TRUE(WaitUntil([window] { return IsReading(window); }));
                          EXPECT_TRUE(WaitUntil([window] { return !IsReading(window); }));
                          SendMessageW(window, WM_NULL, 0, 0);  // Its thread takes messages again.
                          script(window);
                          Press(window, IDOK);
                      });
        return dialog.ResultFolder();
    }

    FolderDevice device_;
};

TEST_F(BrowseDialog, ShowsTheDeviceSortedAndSelectsTheDeepestFolder) {
    const std::wstring files = Run(L"txt", L"\\cf card\\JOBS\\a.txt\\missing", [](HWND dialog) {
        EXPECT_EQ(Items(dialog), (Lines{L"1*CF Card", L" 1*Jobs", L"  1*A", L"  2*b", L"   3 1.txt",
                                        L"  3 a.TXT", L"1*Temp"}));
        EXPECT_EQ(ItemText(dialog, IDC_BROWSE_FOLDER), L"\\CF Card\\Jobs\\");
        // The tree has the place of its placeholder in the tab order.
        HWND tree = TreeOf(dialog);
        EXPECT_EQ(GetNextDlgTabItem(dialog, tree, FALSE), GetDlgItem(dialog, IDOK));
        auto file = TreeView_GetChild(tree, TreeView_GetSelection(tree));
        while (auto next = TreeView_GetNextSibling(tree, file)) {
            file = next;
        }
        const std::tuple<HTREEITEM, const wchar_t*, const wchar_t*> selections[] = {
            {nullptr, L"", L""},
            {file, L"\\CF Card\\Jobs\\", L"a.TXT"},
            {TreeView_GetRoot(tree), L"\\CF Card\\", L"a.TXT"}};
        for (const auto& [item, folder, name] : selections) {
            TreeView_SelectItem(tree, item);
            EXPECT_EQ(ItemText(dialog, IDC_BROWSE_FOLDER), folder);
            EXPECT_EQ(ItemText(dialog, IDC_BROWSE_FILE_NAME), name);
        }
    });
    EXPECT_EQ(files, L"\\CF Card\\");
    const std::wstring nothing = Run(kNoFiles, L"\\Tem\\Jobs", [](HWND dialog) {
        EXPECT_EQ(Items(dialog), (Lines{L"2*CF Card", L" 2*Jobs", L"  1*A", L"  1*b", L"1*Temp"}));
    });
    EXPECT_EQ(nothing, L"");
}

TEST_F(BrowseDialog, RefreshReadsAgainOnceAndShowsItsMessage) {
    Run(kNoFiles, L"\\CF Card", [this](HWND dialog) {
        HWND tree = TreeOf(dialog);
        SendMessageW(dialog, WM_NEXTDLGCTL, reinterpret_cast<WPARAM>(tree), TRUE);
        TreeView_SelectItem(tree, TreeView_GetNextSibling(tree, TreeView_GetRoot(tree)));
        MakeFolder(device_.PcPath(L"\\Temp\\new"));
        for (const wchar_t* folder : {L"\\Temp\\", L"\\CF Card\\"}) {
            const MessageBoxAnswerer boxes;
            PostMessageW(tree, WM_KEYDOWN, VK_F5, 0);
            EXPECT_TRUE(WaitUntil([dialog] { return IsReading(dialog); }));
            PostMessageW(tree, WM_KEYDOWN, VK_F5, 0);  // Impatiently.
            EXPECT_TRUE(WaitUntil([&] { return boxes.Seen().size() == 1 && IsWindowEnabled(dialog); }));
            EXPECT_EQ(boxes.Seen()[0].text, L"Failed to read from remote device.");
            EXPECT_FALSE(IsReading(dialog));
            // Where the folder has gone, the tree that has the focus begins anew.
            EXPECT_EQ(ItemText(dialog, IDC_BROWSE_FOLDER), folder);
            EXPECT_EQ(Items(dialog).back(), folder[1] == L'T' ? L" 1*new" : L"  1*b");
            std::filesystem::remove_all(device_.PcPath(L"\\Temp"));
        }
        const MessageBoxAnswerer boxes;
        device_.Set(L"REFUSE", L"CeFindAllFiles@\\*=5");
        PostMessageW(tree, WM_COMMAND, IDM_TREE_REFRESH, 0);
        EXPECT_TRUE(WaitUntil([&] { return boxes.Seen().size() == 2 && IsWindowEnabled(dialog); }));
        EXPECT_EQ(ItemText(dialog, IDC_BROWSE_FOLDER), L"");
        EXPECT_EQ(Items(dialog), Lines()) << "nothing of a device that cannot be read";
    });
}

TEST_F(BrowseDialog, PropertyShowsTheSelectedItem) {
    const FILETIME written = UtcTime(2001, 2, 3, 12);
    const std::wstring file = device_.PcPath(L"\\Temp\\A & B.job");
    WriteTextFile(file, "12", written);
    SetFileAttributesW(file.c_str(), FILE_ATTRIBUTE_READONLY);
    Run(L"job", L"\\Temp", [&](HWND dialog) {
        for (const bool is_file : {false, true}) {
            PostMessageW(TreeOf(dialog), WM_COMMAND, IDM_TREE_PROPERTY, 0);
            HWND property = nullptr;
            EXPECT_TRUE(WaitUntil([&] {
                const auto dialogs = DialogsBeside(dialog);
                property = dialogs.empty() ? nullptr : dialogs[dialogs[0] == dialog ? dialogs.size() - 1 : 0];
                return dialogs.size() == 2;
            }));
            EXPECT_EQ(ItemText(property, IDC_PROPERTY_PATH), is_file ? L"\\Temp\\A & B.job" : L"\\Temp");
            EXPECT_EQ(ItemText(property, IDC_PROPERTY_TYPE), is_file ? L"JOB File" : L"Folder");
            EXPECT_EQ(ItemText(property, IDC_PROPERTY_DATE) == DateText(written), is_file);
            EXPECT_EQ(IsWindowVisible(GetDlgItem(property, IDC_PROPERTY_SIZE)) != FALSE, is_file);
            EXPECT_EQ(ItemText(property, IDC_PROPERTY_SIZE), is_file ? L"2 bytes" : L"0 bytes");
            EXPECT_EQ(IsDlgButtonChecked(property, IDC_PROPERTY_READ_ONLY) != 0, is_file);
            Press(property, IDOK);
            EXPECT_TRUE(WaitUntil([&] { return IsWindowEnabled(dialog) != FALSE; }));
            HWND tree = TreeOf(dialog);
            TreeView_SelectItem(tree, TreeView_GetChild(tree, TreeView_GetSelection(tree)));
        }
    });
}

TEST(FolderDialog, AnswersTheFolderThatWasOpened) {
    const TempFolder folder;
    MakeFolder(folder / L"Dummy\\Dummy");  // As the file of the dialog is named.
    const auto current = std::filesystem::current_path();
    for (const bool opens : {true, false}) {
        const std::wstring start = opens ? folder.Path() : folder / L"Dummy\\Dummy";
        CFolderDialog dialog(start, start, 1, L"", nullptr);
        const auto script = [&](HWND window) {
            HWND list = GetDlgItem(window, IDC_FOLDER_DIRECTORY_LIST);
            EXPECT_TRUE(WaitUntil([&] { return ItemText(window, IDC_FOLDER_DIRECTORY) == start; }));
            if (opens) {
                EXPECT_TRUE(WaitUntil([&] { return SendMessageW(list, LB_GETCURSEL, 0, 0) == 0; }));
                SendMessageW(list, LB_SELECTSTRING, 0, reinterpret_cast<LPARAM>(L"[Dummy]"));
                SendMessageW(window, WM_COMMAND, MAKEWPARAM(IDC_FOLDER_DIRECTORY_LIST, LBN_DBLCLK),
                             reinterpret_cast<LPARAM>(list));
            }
            Press(window, IDOK);
        };
        EXPECT_EQ(RunWithScript([&] { return dialog.DoModal(); }, script), IDOK);
        EXPECT_TRUE(EqualIgnoringCase(dialog.Chosen().folder, opens ? folder / L"Dummy" : start))
            << dialog.Chosen().folder;
    }
    EXPECT_EQ(std::filesystem::current_path(), current);
}

TEST(FolderDialog, ExpandsAnAbbreviatedField) {
    // The field, the path of the dialog's file, the folder that it means.
    const wchar_t* const cases[][3] = {
        {L"c:\\data\\jobs\\\\", L"C:\\Data\\Jobs\\Dummy", L"c:\\data\\jobs"},
        {L"c:\\...\\JOBS", L"C:\\Data\\Jobs\\Dummy", L"C:\\Data\\Jobs"},
        // From where the directory's last component begins, whatever the field has there.
        {L"c:\\...\\new", L"C:\\Dat\\Jobs\\Dummy", L"C:\\Dat\\Jobs\\new"},
        {L"c:\\...", L"C:\\Data\\Jobs\\Dummy", L"C:\\Data\\Jobs"},
        {L"...", L"C:\\Dummy", L"C:"},
        {L"...", L"", L""},
    };
    for (const auto& [field, file, folder] : cases) {
        EXPECT_EQ(ChosenFolderOf(field, file, std::wstring_view(file).rfind(L'\\') + 1).folder, folder)
            << field;
    }
}

}  // namespace
}  // namespace orvane::testing
