#include <gtest/gtest.h>

#include <cstdint>
#include <string>

#include "device/clock_check.h"
#include "device/connect.h"
#include "device/device_tree_reader.h"
#include "device/remote_api.h"
#include "platform/handles.h"
#include "tests/support/message_boxes.h"

// A PC without the Remote API: no RAPI.DLL is on this program's PATH.

namespace orvane {
namespace {

std::uint32_t Bits(LONG value) {
    return static_cast<std::uint32_t>(value);
}

TEST(RemoteApiAbsent, EveryCallAnswersItsValue) {
    ASSERT_EQ(LoadLibraryW(L"RAPI.DLL"), nullptr);

    EXPECT_EQ(CeCloseHandle(nullptr), FALSE);
    EXPECT_EQ(CeCopyFile(nullptr, nullptr, FALSE), FALSE);
    EXPECT_EQ(CeCreateDirectory(nullptr, nullptr), FALSE);
    EXPECT_EQ(CeCreateFile(nullptr, 0, 0, nullptr, 0, 0, nullptr), nullptr);
    EXPECT_EQ(CeDeleteFile(nullptr), FALSE);
    EXPECT_EQ(CeFindAllFiles(nullptr, 0, nullptr, nullptr), FALSE);
    EXPECT_EQ(CeFindClose(nullptr), FALSE);
    EXPECT_EQ(CeFindFirstFile(nullptr, nullptr), nullptr);
    EXPECT_EQ(CeFindNextFile(nullptr, nullptr), FALSE);
    EXPECT_EQ(Bits(CeRapiFreeBuffer(nullptr)), 0x80004005U);
    EXPECT_EQ(CeGetDiskFreeSpaceEx(nullptr, nullptr, nullptr, nullptr), FALSE);
    EXPECT_EQ(Bits(CeRapiGetError()), 0x80004002U);
    EXPECT_EQ(CeGetFileSize(nullptr, nullptr), 0U);
    EXPECT_EQ(CeGetFileTime(nullptr, nullptr, nullptr, nullptr), FALSE);
    EXPECT_EQ(CeGetLastError(), 0U);
    EXPECT_EQ(CeGetVersionEx(nullptr), FALSE);
    EXPECT_EQ(Bits(CeRapiInitEx(nullptr)), 0x80004001U);
    EXPECT_EQ(Bits(CeRapiInvoke(nullptr, nullptr, 0, nullptr, nullptr, nullptr, nullptr, 0)), 0x80004002U);
    EXPECT_EQ(CeMoveFile(nullptr, nullptr), FALSE);
    EXPECT_EQ(CeReadFile(nullptr, nullptr, 0, nullptr, nullptr), FALSE);
    EXPECT_EQ(Bits(CeRegCloseKey(nullptr)), 0x80004005U);
    EXPECT_EQ(Bits(CeRegOpenKeyEx(nullptr, nullptr, 0, 0, nullptr)), 0x80004005U);
    EXPECT_EQ(Bits(CeRegQueryValueEx(nullptr, nullptr, nullptr, nullptr, nullptr, nullptr)), 0x80004005U);
    EXPECT_EQ(CeRemoveDirectory(nullptr), FALSE);
    EXPECT_EQ(CeSetFilePointer(nullptr, 0, nullptr, 0), 0U);
    EXPECT_EQ(CeSetFileTime(nullptr, nullptr, nullptr, nullptr), FALSE);
    EXPECT_EQ(Bits(CeRapiUninit()), 0x80004002U);
    EXPECT_EQ(CeWriteFile(nullptr, nullptr, 0, nullptr, nullptr), FALSE);
}

TEST(RemoteApiAbsent, OperationsFailSoftly) {
    const UniqueEvent cancel = NewManualResetEvent();
    EXPECT_EQ(Bits(ConnectDevice(cancel.Get())), 0x80004001U);

    DeviceTreeReader reader;
    FileNode root;
    root.children = std::make_unique<FileNode[]>(1);
    root.child_count = 1;
    EXPECT_FALSE(reader.ReadDeviceTree(L"\\", {}, root, nullptr));
    EXPECT_EQ(root.child_count, 0);

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
