#include <gtest/gtest.h>

#include "browse/file_property_dialog.h"
#include "browse/folder_dialog.h"
#include "tests/support/temp_folder.h"

namespace orvane {

namespace {

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

TEST(PropertyTexts, ADateBeyondOleDatesFailsWithAText) {
    // Beyond the year 9999 there are file times but no OLE dates.
    EXPECT_EQ(DateText(testing::UtcTime(20000, 1, 1)), L"Invalid DateTime");
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
