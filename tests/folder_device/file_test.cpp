#include "tests/folder_device/fixture.h"

namespace orvane::testing {
namespace {

class DeviceFile : public FolderDeviceTest {
  protected:
    void TearDown() override {
        SetFileAttributesW(device_.PcPath(L"\\locked.txt").c_str(), FILE_ATTRIBUTE_NORMAL);
    }
};

TEST_F(DeviceFile, OpensAsThePcDoes) {
    ASSERT_TRUE(WriteNew(L"\\old.txt", "old"));
    ASSERT_TRUE(WriteNew(L"\\locked.txt", "locked"));
    ASSERT_TRUE(SetFileAttributesW(device_.PcPath(L"\\locked.txt").c_str(), FILE_ATTRIBUTE_READONLY));
    ASSERT_TRUE(CeCreateDirectory(L"\\folder", nullptr));
    const struct {
        const wchar_t* path;
        DWORD access;
        DWORD creation;
        DWORD error;
    } cases[] = {
        {L"\\old.txt", GENERIC_READ, OPEN_EXISTING, 0},
        {L"\\old.txt", GENERIC_WRITE, CREATE_NEW, ERROR_FILE_EXISTS},
        {L"\\old.txt", GENERIC_READ | FILE_APPEND_DATA, OPEN_EXISTING, ERROR_INVALID_PARAMETER},
        {L"\\none.txt", GENERIC_READ, OPEN_EXISTING, ERROR_FILE_NOT_FOUND},
        {L"\\locked.txt", GENERIC_WRITE, OPEN_EXISTING, ERROR_ACCESS_DENIED},
        {L"\\locked.txt", GENERIC_READ, CREATE_ALWAYS, ERROR_ACCESS_DENIED},
        {L"\\folder", GENERIC_READ, OPEN_EXISTING, ERROR_ACCESS_DENIED},
    };
    for (const auto& [path, access, creation, error] : cases) {
        SCOPED_TRACE(::testing::PrintToString(path) + " " + std::to_string(creation));
        const HANDLE file = Open(path, access, creation);
        EXPECT_EQ(ErrorOf(file), error);
        if (file != INVALID_HANDLE_VALUE) {
            EXPECT_TRUE(CeCloseHandle(file));
        }
    }
    EXPECT_EQ(ReadTextFile(device_.PcPath(L"\\locked.txt")), "locked");
}

TEST_F(DeviceFile, SharesAsItWasOpened) {
    ASSERT_TRUE(WriteNew(L"\\a.txt", "a"));
    const HANDLE alone = Open(L"\\a.txt", GENERIC_READ, OPEN_EXISTING);
    EXPECT_EQ(ErrorOf(Open(L"\\a.txt", GENERIC_READ, OPEN_EXISTING, FILE_SHARE_READ)),
              DWORD{ERROR_SHARING_VIOLATION});
    EXPECT_TRUE(CeCloseHandle(alone));
    const HANDLE open =
        Open(L"\\a.txt", GENERIC_READ, OPEN_EXISTING, FILE_SHARE_READ | FILE_SHARE_WRITE | FILE_SHARE_DELETE);
    EXPECT_EQ(ErrorOf(CeDeleteFile(L"\\a.txt")), DWORD{ERROR_SHARING_VIOLATION});
    EXPECT_EQ(ErrorOf(CeMoveFile(L"\\a.txt", L"\\b.txt")), DWORD{ERROR_SHARING_VIOLATION});
    EXPECT_TRUE(CeCloseHandle(open));
    EXPECT_TRUE(CeMoveFile(L"\\a.txt", L"\\b.txt"));
}

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
    EXPECT_TRUE(CeCloseHandle(file));
    const HANDLE read_only = Open(L"\\a.bin", GENERIC_READ, OPEN_EXISTING);
    EXPECT_FALSE(Write(read_only, "x"));
    EXPECT_EQ(CeGetLastError(), DWORD{ERROR_ACCESS_DENIED});
}

TEST_F(DeviceFile, HandlesAreClosedOnceAndByTheirOwnCloser) {
    ASSERT_TRUE(WriteNew(L"\\a.txt", "a"));
    rapi::FindData data;
    HKEY key = nullptr;
    device_.SetRegistry("[HKCU\\Key]");
    Reconnect();
    const HANDLE file = Open(L"\\a.txt", GENERIC_READ, OPEN_EXISTING);
    const HANDLE search = CeFindFirstFile(L"\\*", &data);
    ASSERT_EQ(CeRegOpenKeyEx(HKEY_CURRENT_USER, L"Key", 0, 0, &key), 0);
    EXPECT_EQ(ErrorOf(CeCloseHandle(search)), DWORD{ERROR_INVALID_HANDLE});
    EXPECT_EQ(ErrorOf(CeFindClose(file)), DWORD{ERROR_INVALID_HANDLE});
    EXPECT_TRUE(CeCloseHandle(file));
    EXPECT_TRUE(CeFindClose(search));
    EXPECT_EQ(CeRegCloseKey(key), 0);
    EXPECT_EQ(ErrorOf(CeCloseHandle(file)), DWORD{ERROR_INVALID_HANDLE});
    EXPECT_EQ(ErrorOf(CeFindClose(search)), DWORD{ERROR_INVALID_HANDLE});
    EXPECT_EQ(CeRegCloseKey(key), ERROR_INVALID_HANDLE);
}

// How many seconds the time lies after now.
double Ahead(const FILETIME& time) {
    FILETIME now;
    GetSystemTimeAsFileTime(&now);
    return (static_cast<double>(TicksOf(time)) - static_cast<double>(TicksOf(now))) / 1e7;
}

TEST_F(DeviceFile, NewAndEmptiedFilesHaveTheDevicesTime) {
    for (const double offset : {0.0, -90000.0}) {
        SCOPED_TRACE(offset);
        const FILETIME old = UtcTime(2001, 1, 1);
        WriteTextFile(device_.PcPath(L"\\a.txt"), "old");
        const HANDLE aged = Open(L"\\a.txt", GENERIC_WRITE, OPEN_EXISTING);
        EXPECT_TRUE(CeSetFileTime(aged, &old, &old, &old));
        EXPECT_TRUE(CeCloseHandle(aged));
        device_.Set(L"CLOCK_OFFSET", std::to_wstring(static_cast<int>(offset)));
        Reconnect();
        const HANDLE file = Open(L"\\a.txt", GENERIC_READ | GENERIC_WRITE, CREATE_ALWAYS, FILE_SHARE_READ);
        FILETIME creation{};
        FILETIME last_access{};
        FILETIME last_write{};
        EXPECT_TRUE(CeGetFileTime(file, &creation, &last_access, &last_write));
        EXPECT_NEAR(Ahead(creation), offset, 5);
        EXPECT_NEAR(Ahead(last_access), offset, 5);
        EXPECT_NEAR(Ahead(last_write), offset, 5);
        ASSERT_TRUE(Write(file, "a"));
        EXPECT_TRUE(CeGetFileTime(file, nullptr, nullptr, &last_write));
        EXPECT_NEAR(Ahead(last_write), offset, 5);
        EXPECT_TRUE(CeCloseHandle(file));
        // A time that is set is a time, whatever the clock shows; later writes change nothing.
        const HANDLE stamped = Open(L"\\a.txt", GENERIC_WRITE, OPEN_EXISTING);
        EXPECT_TRUE(CeSetFileTime(stamped, nullptr, nullptr, &old));
        EXPECT_TRUE(Write(stamped, "b"));
        EXPECT_TRUE(CeCloseHandle(stamped));
        EXPECT_EQ(TicksOf(LastWriteTime(device_.PcPath(L"\\a.txt"))), TicksOf(old));
        EXPECT_TRUE(CeDeleteFile(L"\\a.txt"));
    }
}

}  // namespace
}  // namespace orvane::testing
