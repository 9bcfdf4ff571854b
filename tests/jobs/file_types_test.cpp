#include "jobs/file_types.h"

#include <gtest/gtest.h>

#include <string>

namespace orvane {
namespace {

constexpr std::size_t kImg = RowOfType(L".img");
constexpr std::size_t kBmp = RowOfType(L".bmp");

TEST(FileTypes, AFileTakesPartByTheEndOfItsName) {
    for (std::size_t row = 0; row < kFileTypes.size(); ++row) {
        const std::wstring lower(kFileTypes[row].extension);
        std::wstring upper = lower;
        CharUpperW(upper.data());
        for (const std::wstring& name :
             {L"\\a" + lower, L"\\x\\\u00E4.txt.qvj" + upper, L"\\" + upper, lower}) {
            EXPECT_TRUE(PassesExtensionFilter(name, FileTypes().set(row))) << name;
            EXPECT_FALSE(PassesExtensionFilter(name, ~FileTypes().set(row))) << name;
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
