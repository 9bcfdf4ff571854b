#include "tests/folder_device/fixture.h"

namespace orvane::testing {
namespace {

using DeviceFile = FolderDeviceTest;

TEST_F(DeviceFile, ReadsWritesAndMovesItsPosition) {
    const HANDLE file = Open(L"\\a.bin", GENERIC_READ | GENERIC_WRITE, CREATE_NEW);
    ASSERT_TRUE(Write(file, "0123456789"));
    LONG high = -1;
    EXPECT_EQ(CeSetFilePointer(file, -4, &high, FILE_CURRENT), 6U);
    char bytes[8] = {};
    DWORD read = 99;
    EXPECT_TRUE(CeReadFile(file, bytes, sizeof(bytes), &read, nullptr));
    EXPECT_EQ(std::string(bytes, read), "6789");
    EXPECT_TRUE(CeReadFile(file, bytes, sizeof(bytes), &read, nullptr));
    EXPECT_EQ(read, 0U);
    EXPECT_EQ(CeGetFileSize(file, nullptr), 10U);
    EXPECT_EQ(CeSetFilePointer(file, -11, nullptr, FILE_END), INVALID_SET_FILE_POINTER);
    EXPECT_EQ(CeGetLastError(), DWORD{ERROR_NEGATIVE_SEEK});
}

TEST_F(DeviceFile, HandlesAreClosedOnceAndByTheirOwnCloser) {
    rapi::FindData data;
    HKEY key = nullptr;
    device_.SetRegistry("[HKCU\\Key]");
    Reconnect();
    const HANDLE file = Open(L"\\a.txt", GENERIC_WRITE, CREATE_NEW);
    const HANDLE search = CeFindFirstFile(L"\\*", &data);
    ASSERT_EQ(CeRegOpenKeyEx(HKEY_CURRENT_USER, L"Key", 0, 0, &key), 0);
    EXPECT_EQ(ErrorOf(CeCloseHandle(search)), DWORD{ERROR_INVALID_HANDLE});
    EXPECT_EQ(ErrorOf(CeFindClose(file)), DWORD{ERROR_INVALID_HANDLE});
    for (const DWORD error : {DWORD{0}, DWORD{ERROR_INVALID_HANDLE}}) {
        EXPECT_EQ(ErrorOf(CeCloseHandle(file)), error);
        EXPECT_EQ(ErrorOf(CeFindClose(search)), error);
        EXPECT_EQ(CeRegCloseKey(key), static_cast<LONG>(error));
    }
}

// How many seconds the time lies after now.
double Ahead(const FILETIME& time) {
    FILETIME now;
    GetSystemTimeAsFileTime(&now);
    return (static_cast<double>(TicksOf(time)) - static_cast<double>(TicksOf(now))) / 1e7;
}

TEST_F(DeviceFile, NewAndEmptiedFilesHaveTheDevicesTime) {
    const FILETIME old = UtcTime(2001, 1, 1);
    for (const int offset : {0, -90000}) {
        SCOPED_TRACE(offset);
        WriteTextFile(device_.PcPath(L"\\a.txt"), "old", old);
        device_.Set(L"CLOCK_OFFSET", std::to_wstring(offset));
        Reconnect();
        const HANDLE file = Open(L"\\a.txt", GENERIC_READ | GENERIC_WRITE, CREATE_ALWAYS);
        FILETIME creation{};
        FILETIME last_write{};
        EXPECT_TRUE(CeGetFileTime(file, &creation, nullptr, &last_write));
        EXPECT_NEAR(Ahead(creation), offset, 5);
        EXPECT_NEAR(Ahead(last_write), offset, 5);
        ASSERT_TRUE(Write(file, "a"));
        EXPECT_TRUE(CeGetFileTime(file, nullptr, nullptr, &last_write));
        EXPECT_NEAR(Ahead(last_write), offset, 5);
        // A time that is set is a time, whatever the clock shows; later writes change nothing.
        EXPECT_TRUE(CeSetFileTime(file, nullptr, nullptr, &old));
        EXPECT_TRUE(Write(file, "b"));
        EXPECT_TRUE(CeCloseHandle(file));
        EXPECT_EQ(TicksOf(LastWriteTime(device_.PcPath(L"\\a.txt"))), TicksOf(old));
    }
}

}  // namespace
}  // namespace orvane::testing
