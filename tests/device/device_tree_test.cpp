// The device's folders as they are listed, whole trees of them by the reader.
#include <gtest/gtest.h>

#include <algorithm>
#include <thread>

#include "device/device_listing.h"
#include "device/device_tree_reader.h"
#include "tests/support/folder_device.h"

namespace orvane {
namespace {

using Texts = std::vector<std::wstring>;

// Every entry below the node as a relative path, folders with "\" at their end, in the order of the names.
Texts PathsOf(const FileNode& node) {
    Texts paths;
    for (const FileNode& child : node.Children()) {
        paths.push_back(child.name + (child.is_folder != 0 ? L"\\" : L""));
        for (const std::wstring& below : PathsOf(child)) {
            paths.push_back(child.name + L"\\" + below);
        }
    }
    std::sort(paths.begin(), paths.end());
    return paths;
}

class DeviceTree : public ::testing::Test {
  protected:
    DeviceTree() {
        device_.StartTrace();
        testing::WriteTextFile(device_.PcPath(L"\\Jobs\\Sub\\c.qvj"), "");
    }
    ~DeviceTree() override { DestroyWindow(window_); }

    // Reads the tree. Its sessions are closed then, and the window was told unless the read was stopped.
    DeviceResult Read(const std::wstring& folder = L"\\Jobs", const Texts& extensions = {}) {
        const bool is_read = reader_.ReadDeviceTree(folder, extensions, root_, window_);
        EXPECT_EQ(is_read, reader_.Result() != DeviceResult::kFailed);
        int told = 0;
        constexpr UINT kLoaded = kDeviceTreeLoadedMessage;
        for (MSG message; PeekMessageW(&message, window_, kLoaded, kLoaded, PM_REMOVE); ++told) {
        }
        EXPECT_EQ(told, reader_.Result() == DeviceResult::kListingCancelled ? 0 : 1);
        EXPECT_EQ(device_.CallsOf(L"CeRapiInitEx"), device_.CallsOf(L"CeRapiUninit"));
        return reader_.Result();
    }
    // A fault for the sessions from now on, in place of the one before.
    void SetFault(const wchar_t* name, const wchar_t* value) {
        device_.Set(std::exchange(fault_, name), L"");
        device_.Set(name, value);
    }

    testing::FolderDevice device_;
    HWND window_ = CreateWindowW(L"STATIC", L"", 0, 0, 0, 0, 0, HWND_MESSAGE, nullptr, nullptr, nullptr);
    FileNode root_;
    DeviceTreeReader reader_;
    const wchar_t* fault_ = L"REFUSE";
};

TEST_F(DeviceTree, HoldsFoldersAndMatchingFilesWithTheirFields) {
    const FILETIME written = testing::UtcTime(2024, 3, 5);
    for (const wchar_t* name : {L"A.QVJ", L"a.qvj.bak", L"noext"}) {
        testing::WriteTextFile(device_.PcPath(L"\\Jobs\\") + name, "12345", written);
    }
    testing::MakeFolder(device_.PcPath(L"\\Jobs\\Empty.doc"));
    const Texts all = {L"A.QVJ", L"Empty.doc\\", L"Sub\\", L"Sub\\c.qvj", L"a.qvj.bak", L"noext"};
    const std::pair<Texts, Texts> cases[] = {
        {{}, all},
        {{L"tn3", L"*"}, all},
        {{L"tn3", L"Qvj"}, {L"A.QVJ", L"Empty.doc\\", L"Sub\\", L"Sub\\c.qvj"}},
        {{L""}, {L"Empty.doc\\", L"Sub\\", L"noext"}},
    };
    for (const auto& [extensions, expected] : cases) {
        EXPECT_EQ(Read(L"\\Jobs\\", extensions), DeviceResult::kDone);
        EXPECT_EQ(PathsOf(root_), expected);
    }
    for (const FileNode& node : root_.Children()) {
        EXPECT_EQ(testing::TicksOf(node.last_write_time) == testing::TicksOf(written), node.is_folder == 0);
        EXPECT_EQ(node.size_low, node.is_folder == 0 ? 5U : 0U);
    }
}

TEST_F(DeviceTree, IsReadUntilItIsStoppedOrTheDeviceRefuses) {
    for (const std::wstring& folder : {std::wstring(L"\\Missing"), L"\\" + std::wstring(259, L'a')}) {
        EXPECT_EQ(Read(folder), DeviceResult::kFailed);
        EXPECT_EQ(root_.child_count, 0);
    }
    SetFault(L"REFUSE", L"CeFindAllFiles#2=5");
    EXPECT_EQ(Read(), DeviceResult::kDone);
    EXPECT_EQ(PathsOf(root_), Texts{L"Sub\\"});
    EXPECT_TRUE(root_.children[0].unread);
    SetFault(L"VANISH", L"2");
    EXPECT_EQ(Read(), DeviceResult::kFailed);
    SetFault(L"CONNECT_RESULT", L"0x80004005");
    EXPECT_EQ(Read(), DeviceResult::kFailed);

    SetFault(L"CALL_DELAY", L"1000");
    const std::jthread signal([this] {
        Sleep(500);  // The device is busy with the first folder.
        SetEvent(reader_.StopEvent());
    });
    EXPECT_EQ(Read(), DeviceResult::kListingCancelled);
    EXPECT_EQ(PathsOf(root_), Texts{L"Sub\\"});
}

TEST_F(DeviceTree, HoldsNothingThatTheDeviceCannotMean) {
    device_.Set(L"EXTRA_ENTRIES",
                L"\\Jobs\\Sub|..|folder;\\Jobs\\Sub|.|folder;\\Jobs\\Sub|;\\Jobs\\Sub|a\\b;\\Jobs\\Sub|a/b;"
                L"\\Jobs\\Sub|c:d;\\Jobs\\Sub|long|unterminated;\\Jobs\\Sub|good.qvj|size=4294967303");
    ASSERT_EQ(Read(L"\\Jobs\\Sub"), DeviceResult::kDone);
    ASSERT_EQ(PathsOf(root_), (Texts{L"c.qvj", L"good.qvj"}));
    EXPECT_EQ(root_.children[1].Size(), 4294967303U);
    for (const auto& [fault, value] :
         {std::pair{L"FOUND_NULL", L"1"}, {L"FOUND_COUNT", L"4294967295"}, {L"FOUND_COUNT", L"3000000"}}) {
        SetFault(fault, value);
        EXPECT_EQ(Read(), DeviceResult::kFailed) << value;
        EXPECT_EQ(root_.child_count, 0);
    }
    EXPECT_EQ(device_.CallsOf(L"CeRapiFreeBuffer"), 3U) << "none for the listing without a buffer";
}

TEST_F(DeviceTree, EndsWhereThePathIsFull) {
    // Folders "\a\a\a..." on the device, deeper than an ordinary path of the PC can name.
    std::wstring path = L"\\\\?\\" + device_.Root();
    for (int level = 0; level < 140; ++level) {
        path += L"\\a";
        ASSERT_TRUE(CreateDirectoryW(path.c_str(), nullptr));
    }
    const auto read = [](void* test) -> DWORD {
        auto& self = *static_cast<std::remove_reference_t<decltype(*this)>*>(test);
        return self.reader_.ReadDeviceTree(L"\\a", {}, self.root_, nullptr);
    };
    // The thread has no more stack than this, so that a listing that needs more crashes.
    const UniqueThread thread(CreateThread(nullptr, DeviceTreeReader::kStackBytes, read, this,
                                           STACK_SIZE_PARAM_IS_A_RESERVATION, nullptr));
    WaitForSingleObject(thread.Get(), INFINITE);
    EXPECT_EQ(reader_.Result(), DeviceResult::kDone);
    // The pattern of level 128 has 258 characters, that of level 129 would have 260.
    EXPECT_EQ(PathsOf(root_).size(), 128U);
}

TEST_F(DeviceTree, ComesWithTheProductFolders) {
    // A text in the registry that fills its value, without a terminator.
    const std::string full = '"' + std::string(130, 'd');
    const std::tuple<std::string, std::wstring, std::wstring> cases[] = {
        {"DataDirectory=\\D\nLibraryDirectory=\\L", L"\\D", L"\\L"},
        {"LibraryDirectory=\\L", L"", L"\\L"},
        {"DataDirectory=" + full + "\nLibraryDirectory=" + full + "d", std::wstring(130, L'd'), L""},
        {"", L"", L""},
    };
    for (const auto& [values, data, library] : cases) {
        device_.SetRegistry("[HKEY_CURRENT_USER\\Software\\Veltrano\\Dunhallow]\n" + values);
        EXPECT_EQ(Read(), DeviceResult::kDone);
        EXPECT_EQ(reader_.DataDirectory(), data) << values;
        EXPECT_EQ(reader_.LibraryDirectory(), library) << values;
    }
}

}  // namespace
}  // namespace orvane
