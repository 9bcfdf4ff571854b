// The device's registry, read only: a text file of sections (ini_text.h), one for each key, named by its full
// path below HKEY_CURRENT_USER or HKEY_LOCAL_MACHINE (or HKCU and HKLM), with a line for each value. Values
// are texts, REG_SZ, given out with their terminator; one in double quotes loses these and is taken as it
// stands, one with the opening quote only is kept without a terminator, as a device may. The value without a
// name is "@". A file that cannot be read is an empty registry.
//
// The functions answer the error itself and set it as the device error.
#include <algorithm>
#include <cwchar>
#include <string_view>

#include "folder_device/call.h"
#include "platform/text_case.h"

using namespace folder_device;

namespace {

struct KeyObject : Object {
    KeyObject(std::wstring key, std::shared_ptr<const IniText> text)
        : Object(std::move(key)), registry(std::move(text)) {}

    const std::shared_ptr<const IniText> registry;
};

// The long name of one of the two roots; empty for any other key.
std::wstring RootKeyName(HKEY key) {
    return key == HKEY_CURRENT_USER    ? L"HKEY_CURRENT_USER"
           : key == HKEY_LOCAL_MACHINE ? L"HKEY_LOCAL_MACHINE"
                                       : L"";
}

// The key as opened. From a root the file is read afresh; keys below an open key share what that one read.
std::shared_ptr<KeyObject> KeyOf(Call& call, HKEY key) {
    const std::wstring root = RootKeyName(key);
    if (root.empty()) {
        return call.TheDevice().handles.Find<KeyObject>(key);
    }
    IniText registry = ReadIniFile(call.TheSettings().registry_file).value_or(IniText{});
    for (IniSection& section : registry) {
        for (const HKEY known : {HKEY_CURRENT_USER, HKEY_LOCAL_MACHINE}) {
            const std::wstring_view short_name = known == HKEY_CURRENT_USER ? L"HKCU" : L"HKLM";
            if (const std::size_t end = std::min(section.name.find(L'\\'), section.name.size());
                orvane::EqualIgnoringCase(std::wstring_view(section.name).substr(0, end), short_name)) {
                section.name.replace(0, end, RootKeyName(known));
            }
        }
    }
    return std::make_shared<KeyObject>(root, std::make_shared<const IniText>(std::move(registry)));
}

// Whether the key has a section or lies above one.
bool HasKey(const IniText& registry, std::wstring_view key) {
    return std::any_of(registry.begin(), registry.end(), [key](const IniSection& section) {
        const std::wstring_view name = section.name;
        return orvane::EqualIgnoringCase(name.substr(0, key.size()), key) &&
               (name.size() == key.size() || name[key.size()] == L'\\');
    });
}

// The text with the terminator that it is kept with.
std::optional<std::wstring> FindText(const KeyObject& key, std::wstring_view name) {
    for (const IniSection& section : *key.registry) {
        if (!orvane::EqualIgnoringCase(section.name, key.path)) {
            continue;
        }
        if (const std::optional<std::wstring> text = FindValue(section, name)) {
            if (!text->starts_with(L'"')) {
                return *text + L'\0';
            }
            const bool closed = text->size() >= 2 && text->back() == L'"';
            return closed ? text->substr(1, text->size() - 2) + L'\0' : text->substr(1);
        }
    }
    return std::nullopt;
}

// Where CeRegQueryValueEx leaves what it finds; each may be null.
struct QueryResult {
    LPDWORD type;
    LPBYTE data;
    LPDWORD data_size;
};

DWORD GiveText(const std::wstring& text, const QueryResult& result) {
    const auto size = static_cast<DWORD>(text.size() * sizeof(wchar_t));
    const DWORD room = result.data_size != nullptr ? *result.data_size : 0;
    if (result.type != nullptr) {
        *result.type = REG_SZ;
    }
    if (result.data_size != nullptr) {
        *result.data_size = size;
    }
    if (result.data == nullptr) {
        return ERROR_SUCCESS;
    }
    if (room < size) {
        return ERROR_MORE_DATA;
    }
    std::copy_n(reinterpret_cast<const BYTE*>(text.c_str()), size, result.data);
    return ERROR_SUCCESS;
}

}  // namespace

// Opens a key below a root or an open key; the access asked for is not looked at, options must be 0.
LONG WINAPI CeRegOpenKeyEx(HKEY key, LPCWSTR sub_key, DWORD options, REGSAM /*access*/, PHKEY result) {
    Call call(__func__, static_cast<const void*>(key), sub_key);
    return call.Return(static_cast<LONG>(call.Run([&]() -> DWORD {
        if (result == nullptr || options != 0) {
            return ERROR_INVALID_PARAMETER;
        }
        std::shared_ptr<KeyObject> open = KeyOf(call, key);
        if (open == nullptr) {
            return ERROR_INVALID_HANDLE;
        }
        if (sub_key != nullptr && *sub_key != L'\0') {
            open = std::make_shared<KeyObject>(open->path + L"\\" + sub_key, open->registry);
            if (!HasKey(*open->registry, open->path)) {
                return ERROR_FILE_NOT_FOUND;
            }
        }
        *result = static_cast<HKEY>(call.TheDevice().handles.Add(std::move(open)));
        return ERROR_SUCCESS;
    })));
}

// A size without a buffer asks for the size; a buffer that is too small is ERROR_MORE_DATA and told the
// size, and stays as it was.
LONG WINAPI CeRegQueryValueEx(HKEY key, LPCWSTR value_name, LPDWORD reserved, LPDWORD type, LPBYTE data,
                              LPDWORD data_size) {
    Call call(__func__, static_cast<const void*>(key), value_name);
    return call.Return(static_cast<LONG>(call.Run([&]() -> DWORD {
        if (reserved != nullptr || (data != nullptr && data_size == nullptr)) {
            return ERROR_INVALID_PARAMETER;
        }
        const std::shared_ptr<KeyObject> open = KeyOf(call, key);
        if (open == nullptr) {
            return ERROR_INVALID_HANDLE;
        }
        const bool unnamed = value_name == nullptr || *value_name == L'\0';
        const std::optional<std::wstring> text = FindText(*open, unnamed ? L"@" : value_name);
        return text ? GiveText(*text, {type, data, data_size}) : static_cast<DWORD>(ERROR_FILE_NOT_FOUND);
    })));
}

// The roots may be closed and stay open.
LONG WINAPI CeRegCloseKey(HKEY key) {
    Call call(__func__, static_cast<const void*>(key));
    return call.Return(static_cast<LONG>(call.Run([&]() -> DWORD {
        return RootKeyName(key).empty() ? call.TheDevice().handles.Close<KeyObject>(key) : ERROR_SUCCESS;
    })));
}
