#include "device/folder_copy.h"

#include <gtest/gtest.h>

#include "device/ensure_folder.h"
#include "tests/device_copy/copy_fixture.h"

namespace orvane {
namespace {

using testing::CopyTest;
using testing::ListTree;
using Names = std::vector<std::wstring>;

constexpr auto kDone = DeviceResult::kDone;
constexpr auto kFailed = DeviceResult::kFailed;

class FolderCopyTest : public CopyTest {
  protected:
    // Below `folder`: a file, a sub-folder with one, a folder with nothing but a folder, an empty folder.
    static void MakeTree(const std::wstring& folder) {
        testing::WriteTextFile(folder + L"\\a.txt", "first");
        testing::WriteTextFile(folder + L"\\b\\c.txt", Content(9000));
        testing::WriteTextFile(folder + L"\\d\\e\\f.txt", "");
        testing::MakeFolder(folder + L"\\g");
    }
    DeviceResult ToPc(bool nested = false) {
        return CopyDeviceFolderToPc(L"\\job", OnPc(L"job"), cancel_.Get(), nested);
    }
    DeviceResult ToDevice() { return CopyPcFolderToDevice(OnPc(L"job"), L"\\job", cancel_.Get()); }
};

TEST_F(FolderCopyTest, CopiesTreesUntilTheFirstFailure) {
    for (const wchar_t* refuse : {L"", L"CeCreateFile@\\job\\b\\c.txt=5"}) {
        const bool whole = *refuse == L'\0';
        SCOPED_TRACE(whole);
        Names expected = {L"a.txt", L"b\\"};
        if (whole) {
            expected.insert(expected.end(), {L"b\\c.txt", L"d\\", L"d\\e\\", L"d\\e\\f.txt"});
        }
        Clear();
        MakeTree(OnDevice(L"job"));
        device_->Set(L"REFUSE", refuse);
        EXPECT_EQ(ToPc(), whole ? kDone : kFailed);
        EXPECT_EQ(ListTree(OnPc(L"job")), expected);
        ExpectBalancedSessions();

        Clear();
        MakeTree(OnPc(L"job"));
        device_->Set(L"REFUSE", refuse);
        EXPECT_EQ(ToDevice(), whole ? kDone : kFailed);
        EXPECT_EQ(ListTree(OnDevice(L"job")), whole ? ListTree(OnPc(L"job")) : expected);
        ExpectBalancedSessions();
    }
}

TEST_F(FolderCopyTest, CancelledBeginsNothing) {
    MakeTree(OnDevice(L"job"));
    MakeTree(OnPc(L"other"));
    const UniqueEvent never = NewManualResetEvent();
    const DeviceSession session(never.Get());
    SetEvent(cancel_.Get());
    EXPECT_EQ(ToPc(/*nested=*/true), DeviceResult::kListingCancelled);
    EXPECT_FALSE(testing::Exists(OnPc(L"job")));
    EXPECT_EQ(CopyPcFolderToDevice(OnPc(L"other"), L"\\other", cancel_.Get()), kFailed);
    EXPECT_FALSE(testing::Exists(OnDevice(L"other")));
}

TEST_F(FolderCopyTest, NamesThatThePcCannotHoldAreNotTried) {
    for (const wchar_t* name : {L"nul.txt", L"dot.", L"blank "}) {
        SCOPED_TRACE(::testing::PrintToString(name));
        Clear();
        testing::WriteTextFile(OnDevice(L"job\\a.txt"), "first");
        device_->Set(L"EXTRA_ENTRIES", std::wstring(L"\\job|") + name);
        EXPECT_EQ(ToPc(), kFailed);
        EXPECT_EQ(ListTree(OnPc(L"job")), Names{L"a.txt"});
        EXPECT_EQ(device_->CallsOf(L"CeCreateFile"), 1u);
    }
}

TEST_F(FolderCopyTest, PathsThatDoNotFitFail) {
    // With a name of 107 characters in it a path of 259, which is the longest.
    const std::wstring folder = std::wstring(150, L'd');
    const std::wstring fits(107, L'n');
    testing::WriteTextFile(OnDevice(folder + L"\\" + fits), "x");
    EXPECT_EQ(CopyDeviceFolderToPc(L"\\" + folder, pc_->Path(), cancel_.Get(), false), kDone);
    EXPECT_EQ(CopyPcFolderToDevice(pc_->Path(), L"\\" + folder, cancel_.Get()), kDone);
    testing::WriteTextFile(OnPc(fits + L"n"), "x");
    EXPECT_EQ(CopyPcFolderToDevice(pc_->Path(), L"\\" + folder, cancel_.Get()), kFailed);
    // Such a file cannot be, but a listing can claim it.
    device_->Set(L"EXTRA_ENTRIES", L"\\" + folder + L"|" + fits + L"n");
    EXPECT_EQ(CopyDeviceFolderToPc(L"\\" + folder, OnPc(L"new"), cancel_.Get(), false), kFailed);
    EXPECT_FALSE(testing::Exists(OnPc(L"new\\" + fits + L"n")));
    // A device path that fits where the PC's would not.
    testing::WriteTextFile(OnDevice(L"job\\" + std::wstring(250, L'n')), "x");
    EXPECT_EQ(ToPc(), kFailed);
    ExpectBalancedSessions();
}

TEST_F(FolderCopyTest, CreatesFoldersWithTheirParents) {
    EnsureDeviceFolder(L"\\x\\y\\z\\\\", cancel_.Get());
    EXPECT_TRUE(testing::Exists(OnDevice(L"x\\y\\z")));
    EXPECT_EQ(device_->CallsOf(L"CeCreateDirectory"), 3u);
    ExpectBalancedSessions();
    EnsurePcFolder(pc_->Path() + L"\\x\\y\\z\\\\");
    EXPECT_TRUE(testing::Exists(OnPc(L"x\\y\\z")));
    EnsurePcFolder(L"");
    EnsurePcFolder(L"\\\\nowhere\\share\\x");
    EnsurePcFolder(OnPc(std::wstring(260, L'x')));
}

}  // namespace
}  // namespace orvane
