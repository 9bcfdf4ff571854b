#include "device/folder_copy.h"

#include <gtest/gtest.h>

#include "device/device_path.h"
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

TEST_F(FolderCopyTest, CopiesTrees) {
    MakeTree(OnDevice(L"job"));
    EXPECT_EQ(ToPc(), kDone);
    EXPECT_EQ(ListTree(OnPc(L"job")),
              (Names{L"a.txt", L"b\\", L"b\\c.txt", L"d\\", L"d\\e\\", L"d\\e\\f.txt"}));
    EXPECT_TRUE(testing::ReadTextFile(OnPc(L"job\\b\\c.txt")) == Content(9000));
    EXPECT_EQ(device_->CallsOf(L"CeRapiInitEx"), 1u);  // One session for the whole walk.

    Clear();
    MakeTree(OnPc(L"job"));
    EXPECT_EQ(ToDevice(), kDone);
    EXPECT_EQ(ListTree(OnDevice(L"job")), ListTree(OnPc(L"job")));
    EXPECT_TRUE(testing::ReadTextFile(OnDevice(L"job\\b\\c.txt")) == Content(9000));
    ExpectBalancedSessions();
}

TEST_F(FolderCopyTest, NothingToCopy) {
    testing::MakeFolder(OnDevice(L"job"));
    EXPECT_EQ(ToPc(), kDone);
    EXPECT_FALSE(testing::Exists(OnPc(L"job")));
    EXPECT_EQ(CopyPcFolderToDevice(OnPc(L"none"), L"\\none", cancel_.Get()), kDone);
    EXPECT_TRUE(testing::Exists(OnDevice(L"none")));
    device_->Set(L"REFUSE", L"CeFindAllFiles=5");
    EXPECT_EQ(ToPc(), kFailed);
    ExpectBalancedSessions();
}

TEST_F(FolderCopyTest, EndsWithTheFirstFailure) {
    const wchar_t* refuse = L"CeCreateFile@\\job\\b\\c.txt=5";
    MakeTree(OnDevice(L"job"));
    device_->Set(L"REFUSE", refuse);
    EXPECT_EQ(ToPc(), kFailed);
    EXPECT_EQ(ListTree(OnPc(L"job")), (Names{L"a.txt", L"b\\"}));

    Clear();
    MakeTree(OnPc(L"job"));
    device_->Set(L"REFUSE", refuse);
    EXPECT_EQ(ToDevice(), kFailed);
    EXPECT_EQ(ListTree(OnDevice(L"job")), (Names{L"a.txt", L"b\\"}));
    ExpectBalancedSessions();
}

TEST_F(FolderCopyTest, Cancelled) {
    MakeTree(OnDevice(L"job"));
    MakeTree(OnPc(L"other"));
    const UniqueEvent never = NewManualResetEvent();
    const DeviceSession session(never.Get());
    SetEvent(cancel_.Get());
    EXPECT_EQ(ToPc(), kFailed);
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
    for (const std::size_t length : {107u, 108u}) {
        const DeviceResult expected = DevicePathFits(152 + length) ? kDone : kFailed;
        const std::wstring name(length, L'n');
        Clear();
        testing::MakeFolder(OnDevice(folder));
        if (expected == kDone) {
            testing::WriteTextFile(OnDevice(folder + L"\\" + name), "x");
        } else {  // Such a file cannot be, but a listing can claim it.
            device_->Set(L"EXTRA_ENTRIES", L"\\" + folder + L"|" + name);
        }
        EXPECT_EQ(CopyDeviceFolderToPc(L"\\" + folder, pc_->Path(), cancel_.Get(), false), expected);
        EXPECT_EQ(testing::Exists(OnPc(name)), expected == kDone);
        Clear();
        testing::WriteTextFile(OnPc(name), "x");
        EXPECT_EQ(CopyPcFolderToDevice(pc_->Path(), L"\\" + folder, cancel_.Get()), expected);
    }
    // A device path that fits where the PC's would not.
    const std::wstring name(250, L'n');
    testing::WriteTextFile(OnDevice(L"job\\" + name), "x");
    EXPECT_EQ(ToPc(), kFailed);
    EXPECT_EQ(device_->CallsOf(L"CeReadFile"), 0u);
    ExpectBalancedSessions();
}

TEST_F(FolderCopyTest, CreatesFoldersWithTheirParents) {
    for (const wchar_t* path : {L"\\x\\y\\z", L"\\x\\y\\z\\\\"}) {
        SCOPED_TRACE(path);
        Clear();
        EnsureDeviceFolder(path, cancel_.Get());
        EXPECT_EQ(device_->CallsOf(L"CeCreateDirectory"), 3u);
        EXPECT_TRUE(testing::Exists(OnDevice(L"x\\y\\z")));
        ExpectBalancedSessions();
        const DeviceSession session(cancel_.Get());
        EnsureDeviceFolderInSession(L"\\x\\y\\z\\v");
        EXPECT_EQ(device_->CallsOf(L"CeCreateDirectory"), 4u);  // Only the one that was missing.
        EXPECT_TRUE(testing::Exists(OnDevice(L"x\\y\\z\\v")));

        EnsurePcFolder(pc_->Path() + path);
        EXPECT_TRUE(testing::Exists(OnPc(L"x\\y\\z")));
    }
    SetEvent(cancel_.Get());
    EnsureDeviceFolder(L"\\n", cancel_.Get());
    EXPECT_FALSE(testing::Exists(OnDevice(L"n")));
    EnsurePcFolder(L"");
    EnsurePcFolder(L"\\\\nowhere\\share\\x");
    EnsurePcFolder(OnPc(std::wstring(260, L'x')));
}

}  // namespace
}  // namespace orvane
