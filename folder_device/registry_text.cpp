#include "folder_device/registry_text.h"

#include <algorithm>

#include "folder_device/text.h"

namespace folder_device {

namespace {

struct Root {
    HKEY key;
    std::wstring_view name;
    std::wstring_view short_name;
};

const Root kRoots[] = {{HKEY_CLASSES_ROOT, L"HKEY_CLASSES_ROOT", L"HKCR"},
                       {HKEY_CURRENT_USER, L"HKEY_CURRENT_USER", L"HKCU"},
                       {HKEY_LOCAL_MACHINE, L"HKEY_LOCAL_MACHINE", L"HKLM"},
                       {HKEY_USERS, L"HKEY_USERS", L"HKU"}};

std::wstring WithLongRoot(const std::wstring& key) {
    const std::size_t end = key.find(L'\\');
    for (const Root& root : kRoots) {
        if (EqualNoCase(key.substr(0, end), root.short_name)) {
            return std::wstring(root.name) + (end == std::wstring::npos ? L"" : key.substr(end));
        }
    }
    return key;
}

template <class T>
std::vector<BYTE> BytesOf(const T* items, std::size_t count) {
    const auto* bytes = reinterpret_cast<const BYTE*>(items);
    return {bytes, bytes + count * sizeof(T)};
}

std::optional<RegistryValue> ParseBytes(DWORD type, std::wstring_view text) {
    RegistryValue value{type, {}};
    for (const std::wstring_view piece : Split(text, L' ')) {
        if (piece.empty()) {
            continue;
        }
        const auto byte = ParseNumber(L"0x" + std::wstring(piece));
        if (!byte || *byte > 0xFF) {
            return std::nullopt;
        }
        value.data.push_back(static_cast<BYTE>(*byte));
    }
    return value;
}

std::optional<RegistryValue> ParseValue(const std::wstring& text) {
    if (text.starts_with(L"dword:")) {
        const auto number = ParseNumber(L"0x" + text.substr(6));
        if (!number || *number > MAXDWORD) {
            return std::nullopt;
        }
        const auto data = static_cast<DWORD>(*number);
        return RegistryValue{REG_DWORD, BytesOf(&data, 1)};
    }
    if (text.starts_with(L"hex:")) {
        return ParseBytes(REG_BINARY, std::wstring_view(text).substr(4));
    }
    if (const std::size_t end = text.find(L"):"); text.starts_with(L"hex(") && end != std::wstring::npos) {
        const auto type = ParseNumber(text.substr(4, end - 4));
        if (!type || *type > MAXDWORD) {
            return std::nullopt;
        }
        return ParseBytes(static_cast<DWORD>(*type), std::wstring_view(text).substr(end + 2));
    }
    const bool quoted = text.size() >= 2 && text.front() == L'"' && text.back() == L'"';
    const std::wstring plain = quoted ? text.substr(1, text.size() - 2) : text;
    return RegistryValue{REG_SZ, BytesOf(plain.c_str(), plain.size() + 1)};
}

}  // namespace

RegistryText::RegistryText(const std::wstring& file) : sections_(ReadIniFile(file).value_or(IniText{})) {
    for (IniSection& section : sections_) {
        section.name = WithLongRoot(section.name);
    }
}

bool RegistryText::HasKey(std::wstring_view key) const {
    return std::any_of(sections_.begin(), sections_.end(), [key](const IniSection& section) {
        const std::wstring_view name = section.name;
        return EqualNoCase(name.substr(0, key.size()), key) &&
               (name.size() == key.size() || name[key.size()] == L'\\');
    });
}

std::optional<RegistryValue> RegistryText::Value(std::wstring_view key, std::wstring_view name) const {
    for (const IniSection& section : sections_) {
        const std::wstring* text = EqualNoCase(section.name, key) ? FindValue(section, name) : nullptr;
        if (text != nullptr) {
            return ParseValue(*text);
        }
    }
    return std::nullopt;
}

std::wstring RootKeyName(HKEY key) {
    for (const Root& root : kRoots) {
        if (root.key == key) {
            return std::wstring(root.name);
        }
    }
    return {};
}

}  // namespace folder_device
