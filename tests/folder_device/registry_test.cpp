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
        "Quoted=\" 7\"\r\n"
        "@=unnamed\r\n"
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
    const struct {
        const wchar_t* name;
        std::wstring text;
    } cases[] = {{L"datadirectory", L"\\My Documents\\J\u00F6bs"}, {L"Quoted", L" 7"}, {L"", L"unnamed"}};
    for (const auto& [name, text] : cases) {
        SCOPED_TRACE(::testing::PrintToString(name));
        wchar_t buffer[64] = L"?";
        BYTE* const bytes = reinterpret_cast<BYTE*>(buffer);
        DWORD type = 99;
        DWORD size = static_cast<DWORD>(text.size() * sizeof(wchar_t));  // No room for the terminator.
        EXPECT_EQ(CeRegQueryValueEx(key, name, nullptr, &type, bytes, &size), ERROR_MORE_DATA);
        EXPECT_EQ(size, (text.size() + 1) * sizeof(wchar_t));
        EXPECT_STREQ(buffer, L"?");
        EXPECT_EQ(CeRegQueryValueEx(key, name, nullptr, &type, bytes, &size), 0);
        EXPECT_EQ(type, DWORD{REG_SZ});
        EXPECT_EQ(buffer, text);
    }
    EXPECT_EQ(CeRegQueryValueEx(key, L"None", nullptr, nullptr, nullptr, nullptr), ERROR_FILE_NOT_FOUND);
}

}  // namespace
}  // namespace orvane::testing
