#include "jobs/file_types.h"

#include <gtest/gtest.h>

namespace orvane {
namespace {

constexpr std::size_t kImg = RowOfType(L".img");
constexpr std::size_t kBmp = RowOfType(L".bmp");

TEST(FileTypes, AFileTakesPartByTheEndOfItsName) {
    // One name for each row, in any case and place.
    const std::array<const wchar_t*, kFileTypes.size()> names = {
        L"\\a.QVJ", L"\\a.tn3", L"\\x\\a.Rd3", L"\\a.b.pt3", L"\\\u00E4.lN3", L"\\a.jpg",
        L".bmp",    L"\\.img",  L"\\a.XML",    L"\\a.tp3",   L"a.wkf",        L"\\a.qvj.txt"};
    for (std::size_t row = 0; row < names.size(); ++row) {
        for (std::size_t other = 0; other < names.size(); ++other) {
            EXPECT_EQ(PassesExtensionFilter(names[row], FileTypes().set(other)), row == other) << names[row];
        }
    }
    for (const wchar_t* name : {L"", L"\\qvj", L"\\a.jpeg", L"\\a.qvj ", L"\\a.qvj.001", L"\\a.\u0131mg"}) {
        EXPECT_FALSE(PassesExtensionFilter(name, FileTypes().set())) << name;
    }
}

TEST(FileTypes, ImagesFollowTheBitmapsInASynchronizationOnly) {
    for (const FileTypes chosen : {FileTypes().set(kImg), FileTypes().set(kBmp), ~FileTypes().set(kBmp)}) {
        EXPECT_EQ(SynchronizedTypes(chosen), FileTypes(chosen).set(kImg, chosen[kBmp]));
        EXPECT_EQ(IsListedType(L"a.img", chosen), chosen[kImg]);
    }
}

TEST(FileTypes, CompanionFoldersBelongToJobFilesWithANameOnly) {
    EXPECT_TRUE(HasCompanionFolder(L"\\x\\Job 1.WKF"));
    EXPECT_EQ(CompanionFolder(L"\\x\\Job 1.WKF"), L"\\x\\Job 1");
    for (const wchar_t* name : {L"\\Job.qvj", L"\\Jobwkf", L".wkf", L""}) {
        EXPECT_FALSE(HasCompanionFolder(name)) << name;
    }
}

}  // namespace
}  // namespace orvane
