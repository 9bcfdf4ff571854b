#include "tests/folder_device/fixture.h"

namespace orvane::testing {
namespace {

class DeviceRegistry : public FolderDeviceTest {
  protected:
    DeviceRegistry() {
        device_.SetRegistry(
            "\xEF\xBB\xBF; the handheld's own settings\r\n"
            "[HKCU\\Software\\Maker\\Field]\r\n"
            "DataDirectory = \\My Documents\\J\xC3\xB6"
            "bs\r\n"
            "Number=dword:0000002A\r\n"
            "Bytes=hex:01 ff\r\n"
            "Broken=hex:zz\r\n"
            "[HKEY_LOCAL_MACHINE\\Ident]\r\n"
            "Name=Unit 7\r\n");
        Reconnect();
    }

    LONG OpenKey(HKEY root, const wchar_t* path, HKEY& key) { return CeRegOpenKeyEx(root, path, 0, 0, &key); }
};

TEST_F(DeviceRegistry, KeysAreThoseOfTheFileAndThoseAbove) {
    const struct {
        HKEY root;
        const wchar_t* path;
        LONG result;
    } cases[] = {
        {HKEY_CURRENT_USER, L"Software\\Maker\\Field", 0},
        {HKEY_LOCAL_MACHINE, L"Ident", 0},
        {HKEY_CURRENT_USER, L"Software\\Mak", ERROR_FILE_NOT_FOUND},
        {nullptr, L"Software", ERROR_INVALID_HANDLE},
    };
    for (const auto& [root, path, result] : cases) {
        HKEY key = nullptr;
        EXPECT_EQ(OpenKey(root, path, key), result) << ::testing::PrintToString(path);
        EXPECT_EQ(key != nullptr, result == 0);
    }
    HKEY software = nullptr;
    HKEY field = nullptr;
    ASSERT_EQ(OpenKey(HKEY_CURRENT_USER, L"Software", software), 0);
    EXPECT_EQ(OpenKey(software, L"Maker\\Field", field), 0);
    EXPECT_EQ(CeRegCloseKey(software), 0);
    EXPECT_EQ(CeRegQueryValueEx(field, L"Number", nullptr, nullptr, nullptr, nullptr), 0);
}

TEST_F(DeviceRegistry, ValuesHaveTheirTypesAndSizes) {
    HKEY key = nullptr;
    ASSERT_EQ(OpenKey(HKEY_CURRENT_USER, L"Software\\Maker\\Field", key), 0);
    const auto text = [](std::wstring_view value) {
        return std::string(reinterpret_cast<const char*>(value.data()), (value.size() + 1) * sizeof(wchar_t));
    };
    const struct {
        const wchar_t* name;
        DWORD type;
        std::string data;
    } cases[] = {
        {L"datadirectory", REG_SZ, text(L"\\My Documents\\J\u00F6bs")},
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
