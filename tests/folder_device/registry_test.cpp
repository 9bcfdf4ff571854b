#include "tests/folder_device/fixture.h"

namespace orvane::testing {
namespace {

using DeviceRegistry = FolderDeviceTest;

TEST_F(DeviceRegistry, HasTheKeysAndValuesOfItsFile) {
    device_.SetRegistry(
        "\xEF\xBB\xBF; the handheld's own settings\r\n"
        "[HKCU\\Software\\Maker]\r\n"
        "DataDirectory = \\My Documents\\J\xC3\xB6"
        "bs\r\n"
        "Number=dword:0000002A\r\n"
        "Bytes=hex:01 ff\r\n"
        "Broken=hex:zz\r\n"
        "[HKEY_LOCAL_MACHINE\\Ident]\r\n");
    Reconnect();
    HKEY key = nullptr;
    EXPECT_EQ(CeRegOpenKeyEx(HKEY_LOCAL_MACHINE, L"Ident", 0, 0, &key), 0);
    EXPECT_EQ(CeRegOpenKeyEx(nullptr, L"Software", 0, 0, &key), ERROR_INVALID_HANDLE);
    EXPECT_EQ(CeRegOpenKeyEx(HKEY_CURRENT_USER, L"Soft", 0, 0, &key), ERROR_FILE_NOT_FOUND);
    HKEY above = nullptr;
    ASSERT_EQ(CeRegOpenKeyEx(HKEY_CURRENT_USER, L"Software", 0, 0, &above), 0);
    ASSERT_EQ(CeRegOpenKeyEx(above, L"Maker", 0, 0, &key), 0);
    EXPECT_EQ(CeRegCloseKey(above), 0);
    const wchar_t folder[] = L"\\My Documents\\J\u00F6bs";
    const struct {
        const wchar_t* name;
        DWORD type;
        std::string data;
    } cases[] = {
        {L"datadirectory", REG_SZ, std::string(reinterpret_cast<const char*>(folder), sizeof(folder))},
        {L"Number", REG_DWORD, std::string("\x2A\0\0\0", 4)},
        {L"Bytes", REG_BINARY, "\x01\xFF"},
    };
    for (const auto& [name, type, data] : cases) {
        SCOPED_TRACE(::testing::PrintToString(name));
        std::string buffer(64, '?');
        DWORD found_type = 99;
        BYTE* const bytes = reinterpret_cast<BYTE*>(buffer.data());
        DWORD size = static_cast<DWORD>(data.size() - 1);
        EXPECT_EQ(CeRegQueryValueEx(key, name, nullptr, &found_type, bytes, &size), ERROR_MORE_DATA);
        EXPECT_EQ(size, data.size());
        EXPECT_EQ(buffer, std::string(64, '?'));
        EXPECT_EQ(CeRegQueryValueEx(key, name, nullptr, &found_type, bytes, &size), 0);
        EXPECT_EQ(found_type, type);
        EXPECT_EQ(buffer.substr(0, size), data);
    }
    for (const wchar_t* missing : {L"None", L"Broken"}) {
        EXPECT_EQ(CeRegQueryValueEx(key, missing, nullptr, nullptr, nullptr, nullptr), ERROR_FILE_NOT_FOUND);
    }
}

}  // namespace
}  // namespace orvane::testing
