#include "device/device_tree_reader.h"

#include <gtest/gtest.h>

#include <thread>

#include "tests/support/folder_device.h"
#include "tests/support/temp_folder.h"

namespace orvane {
namespace {

class DeviceTree : public ::testing::Test {
  protected:
    void SetUp() override {
        device_.StartTrace();
        testing::WriteTextFile(device_.PcPath(L"\\Jobs\\Sub\\c.qvj"), "");
    }
    void TearDown() override { DestroyWindow(window_); }

    // The completion messages that came to the window since the last call.
    int TakeMessages() {
        int count = 0;
        constexpr UINT kLoaded = kDeviceTreeLoadedMessage;
        for (MSG message; PeekMessageW(&message, window_, kLoaded, kLoaded, PM_REMOVE); ++count) {
        }
        return count;
    }
    // On whichever thread.
    bool SessionsAreClosed() const {
        return device_.CallsOf(L"CeRapiInitEx") == device_.CallsOf(L"CeRapiUninit");
    }

    testing::FolderDevice device_;
    HWND window_ =
        CreateWindowExW(0, L"STATIC", nullptr, 0, 0, 0, 0, 0, HWND_MESSAGE, nullptr, nullptr, nullptr);
    FileNode root_;
    DeviceTreeReader reader_;
};

TEST_F(DeviceTree, IsReadInASessionOfItsOwn) {
    EXPECT_TRUE(reader_.ReadDeviceTree(L"\\Jobs", {}, root_, window_));
    EXPECT_EQ(reader_.Result(), DeviceResult::kDone);
    ASSERT_EQ(root_.child_count, 1);
    EXPECT_EQ(root_.children[0].child_count, 1);
    EXPECT_EQ(TakeMessages(), 1);
    EXPECT_TRUE(SessionsAreClosed());

    // Failures tell the window as well.
    for (const std::wstring& folder : {std::wstring(L"\\Missing"), L"\\" + std::wstring(259, L'a')}) {
        EXPECT_FALSE(reader_.ReadDeviceTree(folder, {}, root_, window_));
        EXPECT_EQ(reader_.Result(), DeviceResult::kFailed);
        EXPECT_EQ(root_.child_count, 0);
        EXPECT_EQ(TakeMessages(), 1);
        EXPECT_TRUE(SessionsAreClosed());
    }
    device_.Set(L"INIT_RESULT", L"0x80004005");
    EXPECT_FALSE(reader_.ReadDeviceTree(L"\\Jobs", {}, root_, window_));
    EXPECT_EQ(TakeMessages(), 1);
}

TEST_F(DeviceTree, ThatIsStoppedTellsNobodyAndCanBeReadAgain) {
    device_.Set(L"CALL_DELAY", L"1000");
    std::jthread signal([this] {
        Sleep(500);  // The device is busy with the first folder.
        SetEvent(reader_.StopEvent());
    });
    EXPECT_TRUE(reader_.ReadDeviceTree(L"\\Jobs", {}, root_, window_));
    signal.join();
    EXPECT_EQ(reader_.Result(), DeviceResult::kListingCancelled);
    EXPECT_EQ(TakeMessages(), 0);
    EXPECT_TRUE(SessionsAreClosed());
    device_.Set(L"CALL_DELAY", L"");
    ResetEvent(reader_.StopEvent());
    EXPECT_TRUE(reader_.ReadDeviceTree(L"\\Jobs", {}, root_, nullptr));
    EXPECT_EQ(reader_.Result(), DeviceResult::kDone);
}

TEST_F(DeviceTree, ComesWithTheProductFolders) {
    // A text in the registry that fills its value, without a terminator.
    const std::string full = '"' + std::string(130, 'd');
    const struct {
        std::string values;
        std::wstring data;
        std::wstring library;
    } cases[] = {
        {"DataDirectory=\\D\nLibraryDirectory=\\L", L"\\D", L"\\L"},
        {"LibraryDirectory=\\L", L"", L"\\L"},
        {"DataDirectory=" + full + "\nLibraryDirectory=" + full + "d", std::wstring(130, L'd'), L""},
        {"DataDirectory=\"d\nLibraryDirectory=\"", L"d", L""},
        {"", L"", L""},
    };
    for (const auto& c : cases) {
        SCOPED_TRACE(c.values);
        device_.SetRegistry("[HKEY_CURRENT_USER\\Software\\Veltrano\\Dunhallow]\n" + c.values);
        EXPECT_TRUE(reader_.ReadDeviceTree(L"\\Jobs", {}, root_, nullptr));
        EXPECT_EQ(root_.child_count, 1);
        EXPECT_EQ(reader_.DataDirectory(), c.data);
        EXPECT_EQ(reader_.LibraryDirectory(), c.library);
    }
    EXPECT_TRUE(SessionsAreClosed());
}

}  // namespace
}  // namespace orvane
