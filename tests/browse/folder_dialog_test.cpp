#include "browse/folder_dialog.h"

#include <gtest/gtest.h>

#include <filesystem>

#include "platform/text_case.h"
#include "res/ids.h"
#include "tests/support/dialog_script.h"
#include "tests/support/temp_folder.h"

namespace orvane {

namespace {

using testing::ItemText;

TEST(FolderDialog, AnswersTheFolderThatWasOpened) {
    const testing::TempFolder folder;
    testing::MakeFolder(folder / L"sub");
    const auto current = std::filesystem::current_path();
    CFolderDialog dialog(folder.Path(), folder.Path(), 1, L"", nullptr);
    const INT_PTR result = testing::RunWithScript(
        [&] { return dialog.DoModal(); },
        [&](HWND window) {
            HWND list = GetDlgItem(window, IDC_FOLDER_DIRECTORY_LIST);
            EXPECT_TRUE(testing::WaitUntil([&] { return SendMessageW(list, LB_GETCURSEL, 0, 0) == 0; }));
            EXPECT_EQ(ItemText(window, IDC_FOLDER_DIRECTORY), folder.Path());
            EXPECT_NE(SendMessageW(list, LB_SELECTSTRING, static_cast<WPARAM>(-1),
                                   reinterpret_cast<LPARAM>(L"[sub]")),
                      LB_ERR);
            SendMessageW(window, WM_COMMAND, MAKEWPARAM(IDC_FOLDER_DIRECTORY_LIST, LBN_DBLCLK),
                         reinterpret_cast<LPARAM>(list));
            testing::Press(window, IDOK);
        });
    EXPECT_EQ(result, IDOK);
    EXPECT_TRUE(EqualIgnoringCase(dialog.Chosen().folder, folder / L"sub")) << dialog.Chosen().folder;
    EXPECT_TRUE(EqualIgnoringCase(dialog.Chosen().directory, folder / L"sub")) << dialog.Chosen().directory;
    EXPECT_EQ(std::filesystem::current_path(), current);
}

TEST(FolderDialog, AFolderOfTheFilesNameIsOneLikeAnyOther) {
    const testing::TempFolder folder;
    testing::MakeFolder(folder / L"Dummy\\Dummy");
    for (const std::wstring& start : {folder.Path(), folder / L"Dummy", folder / L"Dummy\\Dummy"}) {
        CFolderDialog dialog(start, start, 1, L"", nullptr);
        EXPECT_EQ(testing::RunWithScript([&] { return dialog.DoModal(); },
                                         [](HWND window) { testing::Press(window, IDOK); }),
                  IDOK);
        EXPECT_TRUE(EqualIgnoringCase(dialog.Chosen().folder, start)) << dialog.Chosen().folder;
        EXPECT_TRUE(EqualIgnoringCase(dialog.Chosen().directory, start)) << dialog.Chosen().directory;
    }
}

TEST(ChosenFolder, IsTheFieldUnlessThatIsAbbreviated) {
    const struct {
        const wchar_t* field;
        const wchar_t* file_path;
        std::size_t name_offset;
        const wchar_t* folder;
        const wchar_t* directory;
    } cases[] = {
        {L"c:\\data\\jobs\\\\", L"C:\\Data\\Jobs\\Dummy", 13, L"c:\\data\\jobs", L"C:\\Data\\Jobs"},
        {L"c:\\...\\JOBS", L"C:\\Data\\Jobs\\Dummy", 13, L"C:\\Data\\Jobs", L"C:\\Data\\Jobs"},
        // From where the directory's last component begins, whatever the field has there.
        {L"c:\\...\\new", L"C:\\Dat\\Jobs\\Dummy", 12, L"C:\\Dat\\Jobs\\new", L"C:\\Dat\\Jobs"},
        {L"c:\\...", L"C:\\Data\\Jobs\\Dummy", 13, L"C:\\Data\\Jobs", L"C:\\Data\\Jobs"},
        {L"...", L"C:\\Dummy", 3, L"C:", L"C:"},
        {L"...", L"", 0, L"", L""},
    };
    for (const auto& c : cases) {
        const ChosenFolder chosen = ChosenFolderOf(c.field, c.file_path, c.name_offset);
        EXPECT_EQ(chosen.folder, c.folder) << c.field;
        EXPECT_EQ(chosen.directory, c.directory) << c.field;
    }
}

}  // namespace

}  // namespace orvane
