// Files by handle, the storage and the registry.
#include "tests/folder_device/fixture.h"

namespace orvane::testing {
namespace {

using DeviceFile = FolderDeviceTest;

TEST_F(DeviceFile, HandlesAreClosedOnceAndByTheirOwnCloser) {
    const HANDLE file = Open(L"\\a.txt", GENERIC_WRITE, CREATE_NEW);
    EXPECT_EQ(ErrorOf(CeFindClose(file)), DWORD{ERROR_INVALID_HANDLE});
    EXPECT_EQ(ErrorOf(CeCloseHandle(file)), 0U);
    EXPECT_EQ(ErrorOf(CeCloseHandle(file)), DWORD{ERROR_INVALID_HANDLE});
    const HANDLE left_open = Open(L"\\a.txt", GENERIC_WRITE, OPEN_EXISTING);
    EXPECT_FALSE(DeleteFileW(device_.PcPath(L"\\a.txt").c_str()));
    Reconnect();  // The last session closes every handle.
    EXPECT_EQ(ErrorOf(CeCloseHandle(left_open)), DWORD{ERROR_INVALID_HANDLE});
    EXPECT_TRUE(DeleteFileW(device_.PcPath(L"\\a.txt").c_str()));
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
        for (int writes = 0; writes < 2; ++writes) {
            EXPECT_TRUE(CeGetFileTime(file, &creation, nullptr, &last_write));
            EXPECT_NEAR(Ahead(creation), offset, 5);
            EXPECT_NEAR(Ahead(last_write), offset, 5);
            ASSERT_TRUE(Write(file, "a"));
        }
        // A time that is set is a time, whatever the clock shows; later writes change nothing.
        EXPECT_TRUE(CeSetFileTime(file, nullptr, nullptr, &old));
        EXPECT_TRUE(Write(file, "b"));
        EXPECT_TRUE(CeCloseHandle(file));
        EXPECT_EQ(TicksOf(LastWriteTime(device_.PcPath(L"\\a.txt"))), TicksOf(old));
    }
}

TEST_F(DeviceFile, AFullStorageRefusesAndHasRoomAgain) {
    WriteTextFile(device_.PcPath(L"\\Jobs\\old.bin"), std::string(60, 'o'));
    device_.Set(L"CAPACITY", L"100");
    Reconnect();
    const auto room = [this] {
        ULARGE_INTEGER left{};
        EXPECT_TRUE(CeGetDiskFreeSpaceEx(L"\\Jobs", &left, nullptr, nullptr));
        return left.QuadPart;
    };
    EXPECT_EQ(room(), 40U);
    const HANDLE file = Open(L"\\new.bin", GENERIC_WRITE, CREATE_NEW);
    EXPECT_TRUE(Write(file, std::string(30, 'n')));
    EXPECT_FALSE(Write(file, "12345678901"));
    EXPECT_EQ(CeGetLastError(), DWORD{ERROR_DISK_FULL});
    EXPECT_EQ(room(), 10U);
    // Writing over what is there takes no room; a gap does.
    CeSetFilePointer(file, 0, nullptr, FILE_BEGIN);
    EXPECT_TRUE(Write(file, std::string(40, 'm')));
    CeSetFilePointer(file, 500, nullptr, FILE_BEGIN);
    EXPECT_FALSE(Write(file, "x"));
    EXPECT_TRUE(CeCloseHandle(file));
    EXPECT_EQ(ErrorOf(CeCopyFile(L"\\new.bin", L"\\copy.bin", TRUE)), DWORD{ERROR_DISK_FULL});
    EXPECT_TRUE(CeDeleteFile(L"\\Jobs\\old.bin"));
    EXPECT_EQ(room(), 60U);
    EXPECT_TRUE(CeCopyFile(L"\\new.bin", L"\\copy.bin", TRUE));
    EXPECT_EQ(room(), 20U);
    EXPECT_TRUE(CeCloseHandle(Open(L"\\copy.bin", GENERIC_WRITE, CREATE_ALWAYS)));
    EXPECT_EQ(room(), 60U);
    // What was put there past the device counts from the next session on.
    WriteTextFile(device_.PcPath(L"\\Jobs\\past.bin"), std::string(150, 'p'));
    Reconnect();
    EXPECT_EQ(room(), 0U);
}

TEST_F(DeviceFile, TheRegistryIsOneToo) {
    device_.SetRegistry(
        "\xEF\xBB\xBF; a comment\r\n[HKCU\\Software\\Maker]\r\nText = J\xC3\xB6"
        "b\r\nQuoted=\" 7\"\r\n[HKEY_LOCAL_MACHINE\\Ident]\r\n");
    Reconnect();
    HKEY key = nullptr;
    HKEY above = nullptr;
    EXPECT_EQ(CeRegOpenKeyEx(HKEY_LOCAL_MACHINE, L"Ident", 0, 0, &key), 0);
    EXPECT_EQ(CeRegOpenKeyEx(HKEY_CURRENT_USER, L"Soft", 0, 0, &key), ERROR_FILE_NOT_FOUND);
    ASSERT_EQ(CeRegOpenKeyEx(HKEY_CURRENT_USER, L"Software", 0, 0, &above), 0);
    ASSERT_EQ(CeRegOpenKeyEx(above, L"Maker", 0, 0, &key), 0);
    EXPECT_EQ(CeRegCloseKey(above), 0);
    for (const auto& [name, text] : {std::pair{L"text", L"J\u00F6b"}, {L"Quoted", L" 7"}}) {
        wchar_t buffer[64] = L"?";
        BYTE* const bytes = reinterpret_cast<BYTE*>(buffer);
        DWORD size = static_cast<DWORD>(wcslen(text) * sizeof(wchar_t));  // No room for the terminator.
        EXPECT_EQ(CeRegQueryValueEx(key, name, nullptr, nullptr, bytes, &size), ERROR_MORE_DATA);
        EXPECT_STREQ(buffer, L"?");
        EXPECT_EQ(CeRegQueryValueEx(key, name, nullptr, nullptr, bytes, &size), 0);
        EXPECT_STREQ(buffer, text);
    }
    EXPECT_EQ(CeRegQueryValueEx(key, L"None", nullptr, nullptr, nullptr, nullptr), ERROR_FILE_NOT_FOUND);
}

}  // namespace
}  // namespace orvane::testing
