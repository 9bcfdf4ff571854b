#include "device/device_listing.h"

#include <gtest/gtest.h>

#include <algorithm>
#include <thread>

#include "device/connect.h"
#include "platform/handles.h"
#include "tests/support/folder_device.h"
#include "tests/support/temp_folder.h"

namespace orvane {
namespace {

using Texts = std::vector<std::wstring>;

// Every entry below the node as a relative path, folders with "\" at their end, in the order of the names.
Texts PathsOf(const FileNode& node) {
    Texts paths;
    for (const FileNode& child : node.Children()) {
        const std::wstring path = child.name + (child.is_folder != 0 ? L"\\" : L"");
        paths.push_back(path);
        for (const std::wstring& below : PathsOf(child)) {
            paths.push_back(path + below);
        }
    }
    std::sort(paths.begin(), paths.end());
    return paths;
}

class DeviceListing : public ::testing::Test {
  protected:
    DeviceResult List(const std::wstring& folder, const Texts& extensions = {}, bool recursive = true) {
        const UniqueEvent never = NewManualResetEvent();
        const DeviceSession session(never.Get());
        return ListDeviceFolder(folder, extensions, recursive, root_, cancel_.Get());
    }
    static DWORD WINAPI ListAll(void* test) {
        return static_cast<DWORD>(static_cast<DeviceListing*>(test)->List(L"\\"));
    }

    testing::FolderDevice device_;
    UniqueEvent cancel_ = NewManualResetEvent();
    FileNode root_;
};

TEST(MatchesExtension, ComparesWhatFollowsTheLastDot) {
    const Texts qvj = {L"tn3", L"Qvj"};
    EXPECT_TRUE(MatchesExtension(L"a.doc", {}));
    EXPECT_TRUE(MatchesExtension(L"A.qvJ", qvj));
    for (const wchar_t* other : {L"a.qvj.bak", L"a.qv", L"qvj", L"dot."}) {
        EXPECT_FALSE(MatchesExtension(other, qvj)) << ::testing::PrintToString(other);
    }
    EXPECT_TRUE(MatchesExtension(L"noext", Texts{L"*"}));
    EXPECT_TRUE(MatchesExtension(L"noext", Texts{L""}));
}

TEST_F(DeviceListing, KeepsFoldersAndMatchingFilesWithTheirFields) {
    const FILETIME written = testing::UtcTime(2024, 3, 5);
    testing::WriteTextFile(device_.PcPath(L"\\Jobs\\A.QVJ"), "12345", written);
    testing::WriteTextFile(device_.PcPath(L"\\Jobs\\b.doc"), "");
    testing::WriteTextFile(device_.PcPath(L"\\Jobs\\Sub\\c.qvj"), "");
    testing::MakeFolder(device_.PcPath(L"\\Jobs\\Empty.doc"));

    ASSERT_EQ(List(L"\\Jobs", {}, false), DeviceResult::kDone);
    EXPECT_EQ(PathsOf(root_), (Texts{L"A.QVJ", L"Empty.doc\\", L"Sub\\", L"b.doc"}));
    ASSERT_EQ(List(L"\\Jobs\\", {L"qvj"}), DeviceResult::kDone);
    EXPECT_EQ(PathsOf(root_), (Texts{L"A.QVJ", L"Empty.doc\\", L"Sub\\", L"Sub\\c.qvj"}));
    for (const FileNode& node : root_.Children()) {
        EXPECT_EQ(testing::TicksOf(node.last_write_time) == testing::TicksOf(written), node.is_folder == 0);
        EXPECT_EQ(node.size_low, node.is_folder == 0 ? 5U : 0U);
    }
}

TEST_F(DeviceListing, StopsWhereItIsCancelledOrRefused) {
    testing::WriteTextFile(device_.PcPath(L"\\Jobs\\Sub\\c.qvj"), "");
    EXPECT_EQ(List(L"\\Missing"), DeviceResult::kFailed);
    EXPECT_EQ(root_.child_count, 0);
    device_.Set(L"REFUSE", L"CeFindAllFiles#2=5");
    EXPECT_EQ(List(L"\\Jobs"), DeviceResult::kDone);
    EXPECT_EQ(PathsOf(root_), Texts{L"Sub\\"});
    EXPECT_TRUE(root_.children[0].unread);
    device_.Set(L"REFUSE", L"");
    device_.Set(L"VANISH", L"2");
    EXPECT_EQ(List(L"\\Jobs"), DeviceResult::kFailed);
    device_.Set(L"VANISH", L"");
    device_.Set(L"REFUSE", L"");

    device_.Set(L"CALL_DELAY", L"400");
    // The event comes while the first folder is being listed.
    const std::jthread signal([this] {
        Sleep(150);
        SetEvent(cancel_.Get());
    });
    EXPECT_EQ(List(L"\\Jobs"), DeviceResult::kListingCancelled);
    EXPECT_EQ(PathsOf(root_), Texts{L"Sub\\"});
}

TEST_F(DeviceListing, DoesNotTrustTheDevice) {
    testing::MakeFolder(device_.PcPath(L"\\Jobs"));
    device_.StartTrace();
    device_.Set(
        L"EXTRA_ENTRIES",
        L"\\Jobs|..|folder;\\Jobs|.|folder;\\Jobs|;\\Jobs|a\\b;\\Jobs|a/b;\\Jobs|c:d;\\Jobs|..\\up|folder;"
        L"\\Jobs|long|unterminated;\\Jobs|good.qvj|size=4294967303");
    ASSERT_EQ(List(L"\\Jobs"), DeviceResult::kDone);
    ASSERT_EQ(PathsOf(root_), Texts{L"good.qvj"});
    EXPECT_EQ(root_.children[0].size_high, 1U);
    EXPECT_EQ(root_.children[0].size_low, 7U);

    const struct {
        const wchar_t* found_count;
        const wchar_t* found_null;
    } cases[] = {{L"", L"1"}, {L"4294967295", L""}, {L"3000000", L""}};
    for (const auto& c : cases) {
        device_.Set(L"FOUND_COUNT", c.found_count);
        device_.Set(L"FOUND_NULL", c.found_null);
        SCOPED_TRACE(::testing::PrintToString(c.found_count));
        const std::size_t released = device_.CallsOf(L"CeRapiFreeBuffer");
        EXPECT_EQ(List(L"\\Jobs"), DeviceResult::kFailed);
        EXPECT_EQ(root_.child_count, 0);
        const bool has_buffer = c.found_null[0] == L'\0';
        EXPECT_EQ(device_.CallsOf(L"CeRapiFreeBuffer"), released + (has_buffer ? 1U : 0U));
    }
}

TEST_F(DeviceListing, EndsTheDescentWhereThePathIsFull) {
    // Folders "\a\a\a..." on the device, deeper than an ordinary path of the PC can name.
    std::wstring path = L"\\\\?\\" + device_.Root();
    for (int level = 0; level < 140; ++level) {
        path += L"\\a";
        ASSERT_TRUE(CreateDirectoryW(path.c_str(), nullptr));
    }
    // The thread has no more stack than this, so that a listing that needs more crashes.
    const UniqueThread thread(
        CreateThread(nullptr, 0x20000, ListAll, this, STACK_SIZE_PARAM_IS_A_RESERVATION, nullptr));
    WaitForSingleObject(thread.Get(), INFINITE);
    DWORD result = 1;
    GetExitCodeThread(thread.Get(), &result);
    EXPECT_EQ(static_cast<DeviceResult>(result), DeviceResult::kDone);
    // The pattern of level 128 has 258 characters, that of level 129 would have 260.
    int depth = 0;
    for (const FileNode* node = &root_; node->child_count == 1; node = &node->children[0]) {
        ++depth;
    }
    EXPECT_EQ(depth, 129);
}

}  // namespace
}  // namespace orvane
