#include "device/device_listing.h"

#include <gtest/gtest.h>

#include <algorithm>
#include <thread>
#include <vector>

#include "device/connect.h"
#include "platform/handles.h"
#include "tests/support/folder_device.h"
#include "tests/support/temp_folder.h"

namespace orvane {
namespace {

using Texts = std::vector<std::wstring>;

// Every entry of the tree as a relative path, folders with "\" at their end, in the order of the names.
void Collect(const FileNode& node, const std::wstring& prefix, Texts& paths) {
    for (const FileNode& child : node.Children()) {
        const std::wstring path = prefix + child.name + (child.is_folder != 0 ? L"\\" : L"");
        paths.push_back(path);
        Collect(child, path, paths);
    }
}

Texts PathsOf(const FileNode& root) {
    Texts paths;
    Collect(root, L"", paths);
    std::sort(paths.begin(), paths.end());
    return paths;
}

class DeviceListing : public ::testing::Test {
  protected:
    void SetUp() override { device_.StartTrace(); }

    DeviceResult List(const std::wstring& folder, const Texts& extensions = {}, bool recursive = true) {
        const UniqueEvent never = NewManualResetEvent();
        const DeviceSession session(never.Get());
        EXPECT_TRUE(session);
        return ListDeviceFolder(folder, extensions, recursive, root_, cancel_.Get());
    }
    std::size_t SuccessfulListings() const {
        const auto trace = device_.Trace();
        return static_cast<std::size_t>(
            std::count_if(trace.begin(), trace.end(), [](const testing::TraceLine& line) {
                return line.function == L"CeFindAllFiles" && line.error == 0;
            }));
    }

    testing::FolderDevice device_;
    UniqueEvent cancel_ = NewManualResetEvent();
    FileNode root_;
};

TEST(MatchesExtension, ComparesWhatFollowsTheLastDot) {
    struct Case {
        const wchar_t* name;
        Texts extensions;
        bool expected;
    };
    const Case cases[] = {
        {L"a.qvj", {}, true},
        {L"noext", {}, true},
        {L"a.qvj", {L"tn3", L"qvj"}, true},
        {L"A.QVJ", {L"qvj"}, true},
        {L"a.qvj", {L"QVJ"}, true},
        {L"a.qvj.bak", {L"qvj"}, false},
        {L"a.qv", {L"qvj"}, false},
        {L".qvj", {L"qvj"}, true},
        {L"qvj", {L"qvj"}, false},
        {L"noext", {L"*"}, true},
        {L"dot.", {L"qvj"}, false},
        {L"dot.", {L""}, true},
        {L"noext", {L""}, true},
        {L"a.qvj", {L"*.asdfdfsasdf"}, false},
    };
    for (const Case& c : cases) {
        EXPECT_EQ(MatchesExtension(c.name, c.extensions), c.expected) << ::testing::PrintToString(c.name);
    }
}

TEST_F(DeviceListing, KeepsFoldersAndMatchingFilesWithTheirFields) {
    const FILETIME written = testing::UtcTime(2024, 3, 5, 9, 7, 2);
    testing::WriteTextFile(device_.PcPath(L"\\Jobs\\A.QVJ"), "12345", written);
    testing::WriteTextFile(device_.PcPath(L"\\Jobs\\b.doc"), "");
    testing::WriteTextFile(device_.PcPath(L"\\Jobs\\Sub\\c.qvj"), "");
    testing::MakeFolder(device_.PcPath(L"\\Jobs\\Empty.doc"));

    for (const wchar_t* folder : {L"\\Jobs", L"\\Jobs\\"}) {
        ASSERT_EQ(List(folder, {L"qvj"}), DeviceResult::kDone);
        EXPECT_EQ(PathsOf(root_), (Texts{L"A.QVJ", L"Empty.doc\\", L"Sub\\", L"Sub\\c.qvj"}));
    }
    const auto children = root_.Children();
    const auto file = std::find_if(children.begin(), children.end(),
                                   [](const FileNode& node) { return node.is_folder == 0; });
    ASSERT_NE(file, children.end());
    EXPECT_EQ(testing::TicksOf(file->last_write_time), testing::TicksOf(written));
    EXPECT_NE(testing::TicksOf(file->creation_time), 0U);
    EXPECT_EQ(file->size_low, 5U);
    EXPECT_EQ(file->size_high, 0U);
    EXPECT_EQ(file->child_count, 0);

    ASSERT_EQ(List(L"\\Jobs", {}, false), DeviceResult::kDone);
    EXPECT_EQ(PathsOf(root_), (Texts{L"A.QVJ", L"Empty.doc\\", L"Sub\\", L"b.doc"}));
    {
        const DeviceSession session(cancel_.Get());
        ASSERT_EQ(ListDeviceFolderFlat(L"\\Jobs", root_), DeviceResult::kDone);
    }
    EXPECT_EQ(PathsOf(root_), (Texts{L"A.QVJ", L"Empty.doc\\", L"Sub\\", L"b.doc"}));
}

TEST_F(DeviceListing, StopsWhereItIsCancelledOrRefused) {
    testing::WriteTextFile(device_.PcPath(L"\\Jobs\\Sub\\c.qvj"), "");

    device_.Set(L"REFUSE", L"CeFindAllFiles#2=5");
    EXPECT_EQ(List(L"\\Jobs"), DeviceResult::kFailed);
    EXPECT_EQ(PathsOf(root_), Texts{L"Sub\\"});
    device_.Set(L"REFUSE", L"");
    EXPECT_EQ(List(L"\\Missing"), DeviceResult::kFailed);
    EXPECT_EQ(root_.child_count, 0);

    device_.Set(L"CALL_DELAY", L"400");
    {
        // The event comes while the first folder is being listed.
        std::thread signal([this] {
            Sleep(150);
            SetEvent(cancel_.Get());
        });
        EXPECT_EQ(List(L"\\Jobs"), DeviceResult::kListingCancelled);
        signal.join();
    }
    EXPECT_EQ(PathsOf(root_), Texts{L"Sub\\"});
    const std::size_t calls = device_.CallsOf(L"CeFindAllFiles");
    EXPECT_EQ(List(L"\\Jobs"), DeviceResult::kListingCancelled);
    EXPECT_EQ(device_.CallsOf(L"CeFindAllFiles"), calls);
    // No folder was empty: the device gave a buffer with every listing that it did not refuse.
    EXPECT_EQ(device_.CallsOf(L"CeRapiFreeBuffer"), SuccessfulListings());
}

TEST_F(DeviceListing, DoesNotTrustTheDevice) {
    testing::MakeFolder(device_.PcPath(L"\\Jobs"));
    device_.Set(
        L"EXTRA_ENTRIES",
        L"\\Jobs|..|folder;\\Jobs|.|folder;\\Jobs|;\\Jobs|a\\b;\\Jobs|a/b;\\Jobs|c:d;\\Jobs|..\\up|folder;"
        L"\\Jobs|long|unterminated;\\Jobs|good.qvj|size=4294967303");
    ASSERT_EQ(List(L"\\Jobs"), DeviceResult::kDone);
    ASSERT_EQ(PathsOf(root_), Texts{L"good.qvj"});
    EXPECT_EQ(root_.children[0].size_high, 1U);
    EXPECT_EQ(root_.children[0].size_low, 7U);

    struct Case {
        const wchar_t* found_count;
        const wchar_t* found_null;
        DeviceResult expected;
    };
    const Case cases[] = {
        {L"", L"1", DeviceResult::kFailed},          {L"0", L"", DeviceResult::kDone},
        {L"0", L"1", DeviceResult::kDone},           {L"4294967295", L"", DeviceResult::kFailed},
        {L"2147483648", L"", DeviceResult::kFailed}, {L"100000000", L"", DeviceResult::kFailed},
        {L"3000000", L"", DeviceResult::kFailed}};
    for (const Case& c : cases) {
        device_.Set(L"FOUND_COUNT", c.found_count);
        device_.Set(L"FOUND_NULL", c.found_null);
        SCOPED_TRACE(::testing::PrintToString(c.found_count));
        const std::size_t released = device_.CallsOf(L"CeRapiFreeBuffer");
        EXPECT_EQ(List(L"\\Jobs"), c.expected);
        EXPECT_EQ(root_.child_count, 0);
        const bool has_buffer = c.found_null[0] == L'\0';
        EXPECT_EQ(device_.CallsOf(L"CeRapiFreeBuffer"), released + (has_buffer ? 1U : 0U));
    }
}

// Folders "\a\a\a..." on a device, deeper than an ordinary path of the PC can name.
class DeepFolders {
  public:
    DeepFolders(const testing::FolderDevice& device, int levels) : path_(L"\\\\?\\" + device.Root()) {
        for (; levels_ < levels; ++levels_) {
            path_ += L"\\a";
            EXPECT_TRUE(CreateDirectoryW(path_.c_str(), nullptr));
        }
    }
    ~DeepFolders() {
        for (; levels_ > 0; --levels_) {
            RemoveDirectoryW(path_.c_str());
            path_.resize(path_.size() - 2);
        }
    }

  private:
    std::wstring path_;
    int levels_ = 0;
};

struct DeepListing {
    FileNode root;
    DeviceResult result = DeviceResult::kFailed;
};

DWORD WINAPI ListDeep(void* parameter) {
    auto& deep = *static_cast<DeepListing*>(parameter);
    const UniqueEvent cancel = NewManualResetEvent();
    const DeviceSession session(cancel.Get());
    deep.result = ListDeviceFolder(L"\\", {}, true, deep.root, cancel.Get());
    return 0;
}

TEST_F(DeviceListing, EndsTheDescentWhereThePathIsFull) {
    const DeepFolders folders(device_, 140);
    DeepListing deep;
    // The thread has no more stack than this, so that a listing that needs more crashes.
    const UniqueThread thread(
        CreateThread(nullptr, 0x20000, ListDeep, &deep, STACK_SIZE_PARAM_IS_A_RESERVATION, nullptr));
    WaitForSingleObject(thread.Get(), INFINITE);
    EXPECT_EQ(deep.result, DeviceResult::kDone);
    // The pattern of level 128 has 258 characters, that of level 129 would have 260.
    int depth = 0;
    for (const FileNode* node = &deep.root; node->child_count == 1; node = &node->children[0]) {
        ++depth;
    }
    EXPECT_EQ(depth, 129);
}

}  // namespace
}  // namespace orvane
