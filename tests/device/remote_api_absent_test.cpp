// A PC without the Remote API: no RAPI.DLL is on this program's PATH.
#include <gtest/gtest.h>

#include "device/clock_check.h"
#include "device/connect.h"
#include "device/device_tree_reader.h"
#include "tests/support/message_boxes.h"

namespace orvane {
namespace {

TEST(RemoteApiAbsent, OperationsFailSoftly) {
    ASSERT_EQ(LoadLibraryW(L"RAPI.DLL"), nullptr);
    const UniqueEvent cancel = NewManualResetEvent();
    EXPECT_EQ(ConnectDevice(cancel.Get()), E_NOTIMPL);
    DeviceTreeReader reader;
    FileNode root;
    EXPECT_FALSE(reader.ReadDeviceTree(L"\\", {}, root, nullptr));
    // The null handle of the missing CeCreateFile passes for a file until the next call fails.
    const testing::MessageBoxAnswerer answerer;
    bool accepted = false;
    EXPECT_EQ(CheckDeviceDateTime(nullptr, cancel.Get(), accepted), 1);
    EXPECT_FALSE(accepted);
    EXPECT_EQ(CheckDeviceDateTimeForFileView(nullptr, cancel.Get()), 1);
    EXPECT_TRUE(answerer.Seen().empty());
}

}  // namespace
}  // namespace orvane
