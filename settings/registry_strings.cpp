#include "settings/registry_strings.h"

#include <algorithm>
#include <array>

#include "platform/handles.h"

namespace orvane {

namespace {

constexpr DWORD kBufferBytes = 1020;
constexpr std::size_t kMaxCharacters = kBufferBytes / sizeof(wchar_t) - 1;

}  // namespace

bool RegReadString(HKEY root, const std::wstring& subkey, const std::wstring& name, std::wstring& text) {
    text.clear();
    UniqueRegistryKey key;
    if (RegOpenKeyExW(root, subkey.c_str(), 0, KEY_ALL_ACCESS, key.Receive()) != ERROR_SUCCESS) {
        return false;
    }
    std::array<wchar_t, kBufferBytes / sizeof(wchar_t)> buffer{};
    DWORD bytes = kBufferBytes;
    if (RegQueryValueExW(key.Get(), name.c_str(), nullptr, nullptr, reinterpret_cast<BYTE*>(buffer.data()),
                         &bytes) != ERROR_SUCCESS) {
        return false;
    }
    // A value may be stored without a terminator, our own are: the buffer's zeros end it then.
    const auto end = std::find(buffer.begin(), buffer.end(), L'\0');
    const auto length = static_cast<std::size_t>(end - buffer.begin());
    if (length > kMaxCharacters) {
        return false;
    }
    text.assign(buffer.data(), length);
    return true;
}

bool RegWriteString(HKEY root, const std::wstring& subkey, const std::wstring& name,
                    const std::wstring& text) {
    UniqueRegistryKey key;
    if (RegOpenKeyExW(root, subkey.c_str(), 0, KEY_ALL_ACCESS, key.Receive()) != ERROR_SUCCESS &&
        RegCreateKeyExW(root, subkey.c_str(), 0, nullptr, REG_OPTION_NON_VOLATILE, KEY_WRITE, nullptr,
                        key.Receive(), nullptr) != ERROR_SUCCESS) {
        return false;
    }
    RegSetValueExW(key.Get(), name.c_str(), 0, REG_SZ, reinterpret_cast<const BYTE*>(text.data()),
                   static_cast<DWORD>(text.size() * sizeof(wchar_t)));
    return true;
}

}  // namespace orvane
