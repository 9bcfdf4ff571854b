#include "device/device_tree_reader.h"

#include <gtest/gtest.h>

#include <cwchar>
#include <thread>

#include "device/connect.h"
#include "tests/support/folder_device.h"
#include "tests/support/temp_folder.h"

namespace orvane {
namespace {

class DeviceTree : public ::testing::Test {
  protected:
    void SetUp() override {
        device_.StartTrace();
        testing::WriteTextFile(device_.PcPath(L"\\Jobs\\Sub\\c.qvj"), "");
        ASSERT_NE(window_, nullptr);
    }
    void TearDown() override { DestroyWindow(window_); }

    // The completion messages that came to the window since the last call.
    int TakeMessages() {
        int count = 0;
        MSG message;
        while (
            PeekMessageW(&message, window_, kDeviceTreeLoadedMessage, kDeviceTreeLoadedMessage, PM_REMOVE)) {
            EXPECT_EQ(message.wParam, 0U);
            EXPECT_EQ(message.lParam, 0);
            ++count;
        }
        return count;
    }
    // Whether every session that was opened, on whichever thread, was closed. None of them failed to open.
    bool SessionsAreClosed() const {
        return device_.CallsOf(L"CeRapiInitEx") == device_.CallsOf(L"CeRapiUninit");
    }
    // Signals the stop event while the device is busy with the first folder.
    bool ReadAndStop(bool (DeviceTreeReader::*read)(const std::wstring&, std::span<const std::wstring>,
                                                    FileNode&, HWND)) {
        std::thread signal([this] {
            Sleep(500);
            SetEvent(reader_.StopEvent());
        });
        const bool result = (reader_.*read)(L"\\Jobs", {}, root_, window_);
        signal.join();
        return result;
    }

    testing::FolderDevice device_;
    HWND window_ =
        CreateWindowExW(0, L"STATIC", nullptr, 0, 0, 0, 0, 0, HWND_MESSAGE, nullptr, nullptr, nullptr);
    FileNode root_;
    DeviceTreeReader reader_;
};

TEST_F(DeviceTree, IsReadInASessionOfItsOwn) {
    EXPECT_EQ(kDeviceTreeLoadedMessage, 0x464U);
    for (const auto read : {&DeviceTreeReader::ReadOnThread, &DeviceTreeReader::ReadDirectly}) {
        EXPECT_TRUE((reader_.*read)(L"\\Jobs", {}, root_, window_));
        EXPECT_EQ(reader_.Result(), DeviceResult::kDone);
        ASSERT_EQ(root_.child_count, 1);
        EXPECT_STREQ(root_.children[0].name, L"Sub");
        EXPECT_EQ(root_.children[0].child_count, 1);
        EXPECT_EQ(TakeMessages(), 1);
        EXPECT_TRUE(SessionsAreClosed());

        // Failures tell the window as well.
        const std::wstring too_long = L"\\" + std::wstring(259, L'a');
        for (const std::wstring& folder : {std::wstring(L"\\Missing"), too_long}) {
            EXPECT_FALSE((reader_.*read)(folder, {}, root_, window_));
            EXPECT_EQ(reader_.Result(), DeviceResult::kFailed);
            EXPECT_EQ(root_.child_count, 0);
            EXPECT_EQ(TakeMessages(), 1);
            EXPECT_TRUE(SessionsAreClosed());
        }
    }
}

TEST_F(DeviceTree, StaysEmptyWithoutAConnection) {
    ASSERT_TRUE(reader_.ReadDirectly(L"\\Jobs", {}, root_, nullptr));
    device_.Set(L"INIT_RESULT", L"0x80004005");
    EXPECT_FALSE(reader_.ReadOnThread(L"\\Jobs", {}, root_, window_));
    EXPECT_EQ(root_.child_count, 0);
    EXPECT_EQ(TakeMessages(), 1);
}

TEST_F(DeviceTree, ThatIsStoppedTellsNobodyAndCanBeReadAgain) {
    device_.Set(L"CALL_DELAY", L"1000");
    for (const auto read : {&DeviceTreeReader::ReadOnThread, &DeviceTreeReader::ReadDirectly}) {
        EXPECT_TRUE(ReadAndStop(read));
        EXPECT_EQ(reader_.Result(), DeviceResult::kListingCancelled);
        EXPECT_EQ(TakeMessages(), 0);
        EXPECT_TRUE(SessionsAreClosed());
    }
    device_.Set(L"CALL_DELAY", L"");
    EXPECT_TRUE(reader_.ReadOnThread(L"\\Jobs", {}, root_, window_));
    EXPECT_EQ(reader_.Result(), DeviceResult::kDone);
}

// The registry file's form of a text of that many characters without a terminator, and of one byte more.
std::string BareText(int characters, bool odd_byte = false) {
    std::string text = "hex(1):";
    for (int i = 0; i < characters; ++i) {
        text += "64 00 ";
    }
    return text + (odd_byte ? "64" : "");
}

TEST_F(DeviceTree, ComesWithTheProductFolders) {
    struct Case {
        const char* what;
        std::string values;
        std::wstring data;
        std::wstring library;
        bool both;
    };
    const Case cases[] = {
        {"no values", "", L"", L"", false},
        {"both", "DataDirectory=\\D\nLibraryDirectory=\\L", L"\\D", L"\\L", true},
        {"data only", "DataDirectory=\\D", L"\\D", L"", false},
        {"library only", "LibraryDirectory=\\L", L"", L"\\L", false},
        {"unterminated", "DataDirectory=" + BareText(2) + "\nLibraryDirectory=" + BareText(1, true), L"dd",
         L"d", true},
        {"full and too long", "DataDirectory=" + BareText(130) + "\nLibraryDirectory=" + BareText(131),
         std::wstring(130, L'd'), L"", false},
        {"text behind a terminator", "DataDirectory=hex(1):64 00 00 00 64 00\nLibraryDirectory=hex(1):", L"d",
         L"", true},
    };
    for (const Case& c : cases) {
        SCOPED_TRACE(c.what);
        device_.SetRegistry("[HKEY_CURRENT_USER\\Software\\Veltrano\\Dunhallow]\n" + c.values);
        EXPECT_TRUE(reader_.ReadDirectly(L"\\Jobs", {}, root_, nullptr));
        EXPECT_EQ(root_.child_count, 1);
        EXPECT_EQ(reader_.DataDirectory(), c.data);
        EXPECT_EQ(reader_.LibraryDirectory(), c.library);

        const DeviceSession session(reader_.StopEvent());
        wchar_t data[kPathBufferChars];
        wchar_t library[kPathBufferChars];
        EXPECT_EQ(ReadDeviceProductFolders(data, library), c.both);
    }
    device_.SetRegistry("");
    EXPECT_TRUE(reader_.ReadDirectly(L"\\Jobs", {}, root_, nullptr));
    EXPECT_STREQ(reader_.DataDirectory(), L"");
    EXPECT_EQ(root_.child_count, 1);
    EXPECT_TRUE(SessionsAreClosed());
}

}  // namespace
}  // namespace orvane
