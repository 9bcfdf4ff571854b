#include <gtest/gtest.h>

#include "device/clock_check.h"
#include "device/connect.h"
#include "device/device_tree_reader.h"
#include "device/remote_api.h"
#include "platform/handles.h"

// A PC without the Remote API: no RAPI.DLL is on this program's PATH.

namespace orvane {
namespace {

TEST(RemoteApiAbsent, OperationsFailSoftly) {
    ASSERT_EQ(LoadLibraryW(L"RAPI.DLL"), nullptr);
    const UniqueEvent cancel = NewManualResetEvent();
    EXPECT_EQ(ConnectDevice(cancel.Get()), E_NOTIMPL);
    // No failure of a missing call may look like one of the device's own.
    EXPECT_EQ(CeRapiUninit(), E_NOINTERFACE);
    EXPECT_EQ(CeRapiGetError(), E_NOINTERFACE);
    EXPECT_EQ(CeRapiFreeBuffer(nullptr), E_FAIL);
    EXPECT_EQ(CeRegOpenKeyEx(nullptr, nullptr, 0, 0, nullptr), E_FAIL);

    DeviceTreeReader reader;
    FileNode root;
    root.children = std::make_unique<FileNode[]>(1);
    root.child_count = 1;
    EXPECT_FALSE(reader.ReadOnThread(L"\\", {}, root, nullptr));
    EXPECT_EQ(root.child_count, 0);

    // The null handle of the missing CeCreateFile passes for a file until the next call fails.
    bool accepted = false;
    EXPECT_EQ(CheckDeviceDateTime(nullptr, cancel.Get(), accepted), 1);
    EXPECT_FALSE(accepted);
}

}  // namespace
}  // namespace orvane
