// The device's registry, read only. The functions answer the error itself and set it as the device error.
#include <algorithm>
#include <cwchar>
#include <string_view>

#include "folder_device/call.h"
#include "folder_device/entry_points.h"
#include "folder_device/registry_text.h"

using namespace folder_device;

namespace {

DWORD OpenRegistryKey(Call& call, HKEY key, LPCWSTR sub_key, HKEY& result) {
    HandleTable& handles = call.TheDevice().handles;
    std::shared_ptr<const RegistryText> registry;
    std::wstring path = RootKeyName(key);
    if (!path.empty()) {
        // Read afresh for each key that is opened from a root, kept for those below it.
        registry = std::make_shared<RegistryText>(call.TheSettings().registry_file);
    } else if (const auto open = handles.FindKind<KeyObject>(key)) {
        path = open->path;
        registry = open->registry;
    } else {
        return ERROR_INVALID_HANDLE;
    }
    const bool itself = sub_key == nullptr || *sub_key == L'\0';
    if (!itself) {
        path += L'\\';
        path += sub_key;
    }
    const bool is_root = itself && !RootKeyName(key).empty();
    if (!is_root && !registry->HasKey(path)) {
        return ERROR_FILE_NOT_FOUND;
    }
    result = static_cast<HKEY>(handles.Add(std::make_shared<KeyObject>(path, registry)));
    return ERROR_SUCCESS;
}

struct QueryResult {
    LPDWORD type;
    LPBYTE data;
    LPDWORD data_size;
};

DWORD QueryValue(Call& call, HKEY key, LPCWSTR value_name, const QueryResult& result) {
    std::wstring path = RootKeyName(key);
    std::optional<RegistryValue> value;
    const std::wstring_view name = value_name == nullptr || *value_name == L'\0' ? L"@" : value_name;
    if (const auto open = call.TheDevice().handles.FindKind<KeyObject>(key)) {
        value = open->registry->Value(open->path, name);
    } else if (!path.empty()) {
        value = RegistryText(call.TheSettings().registry_file).Value(path, name);
    } else {
        return ERROR_INVALID_HANDLE;
    }
    if (!value) {
        return ERROR_FILE_NOT_FOUND;
    }
    if (result.type != nullptr) {
        *result.type = value->type;
    }
    if (result.data_size == nullptr) {
        return ERROR_SUCCESS;
    }
    const DWORD room = *result.data_size;
    *result.data_size = static_cast<DWORD>(value->data.size());
    if (result.data == nullptr) {
        return ERROR_SUCCESS;
    }
    if (room < value->data.size()) {
        return ERROR_MORE_DATA;
    }
    std::copy(value->data.begin(), value->data.end(), result.data);
    return ERROR_SUCCESS;
}

}  // namespace

// Opens a key below a root or an open key; the access asked for is not looked at, options must be 0.
LONG WINAPI CeRegOpenKeyEx(HKEY key, LPCWSTR sub_key, DWORD options, REGSAM /*access*/, PHKEY result) {
    Call call(Function::kRegOpenKeyEx, static_cast<const void*>(key), sub_key);
    return call.Return(static_cast<LONG>(call.Run([&]() -> DWORD {
        if (result == nullptr || options != 0) {
            return ERROR_INVALID_PARAMETER;
        }
        return OpenRegistryKey(call, key, sub_key, *result);
    })));
}

// A size without a buffer asks for the size; a buffer that is too small is ERROR_MORE_DATA and told the
// size, and stays as it was.
LONG WINAPI CeRegQueryValueEx(HKEY key, LPCWSTR value_name, LPDWORD reserved, LPDWORD type, LPBYTE data,
                              LPDWORD data_size) {
    Call call(Function::kRegQueryValueEx, static_cast<const void*>(key), value_name);
    return call.Return(static_cast<LONG>(call.Run([&]() -> DWORD {
        if (reserved != nullptr || (data != nullptr && data_size == nullptr)) {
            return ERROR_INVALID_PARAMETER;
        }
        return QueryValue(call, key, value_name, {type, data, data_size});
    })));
}

// The roots may be closed and stay open.
LONG WINAPI CeRegCloseKey(HKEY key) {
    Call call(Function::kRegCloseKey, static_cast<const void*>(key));
    return call.Return(static_cast<LONG>(call.Run([&]() -> DWORD {
        return RootKeyName(key).empty() ? call.TheDevice().handles.Close<KeyObject>(key) : ERROR_SUCCESS;
    })));
}
