// The settings as the tests of this room name them: by their values in the registry.
#pragma once

#include <gtest/gtest.h>

#include "platform/resources.h"
#include "settings/settings_store.h"
#include "tests/support/folder_device.h"
#include "tests/support/scratch_registry.h"

namespace orvane {

inline const std::wstring kKey = L"Software\\Veltrano\\CE Devices";

// What the registry holds, "(none)" for nothing.
inline std::wstring Stored(const std::wstring& name, HKEY root = HKEY_CURRENT_USER,
                           const std::wstring& key = kKey) {
    std::wstring text;
    return RegReadString(root, key, name, text) ? text : L"(none)";
}

inline void Store(const std::wstring& name, const std::wstring& text, HKEY root = HKEY_CURRENT_USER,
                  const std::wstring& key = kKey) {
    ASSERT_TRUE(RegWriteString(root, key, name, text));
}

// All flags: the rows of the table of types, then those of the other flags.
constexpr std::size_t kTypeCount = kFileTypes.size();
constexpr std::size_t kCount = kTypeCount + kFlagSettings.size();
using Flags = std::bitset<kCount>;

inline std::wstring ValueOf(std::size_t i) {
    return i < kTypeCount ? L"Sync_" + std::wstring(kFileTypes[i].extension.substr(1)) + L"_files"
                          : ResourceString(kFlagSettings[i - kTypeCount].setting);
}

template <class Condition>
Flags Those(Condition condition) {
    Flags flags;
    for (std::size_t i = 0; i < kCount; ++i) {
        flags[i] = condition(i);
    }
    return flags;
}

inline Flags Named(const std::vector<std::wstring>& values) {
    return Those([&](std::size_t i) { return std::ranges::find(values, ValueOf(i)) != values.end(); });
}

inline Flags StoredFlags() {
    return Those([](std::size_t i) { return Stored(ValueOf(i)) == L"1"; });
}

// The settings that are loaded when these flags are stored.
inline SyncSettings With(const Flags& flags) {
    for (std::size_t i = 0; i < kCount; ++i) {
        Store(ValueOf(i), flags[i] ? L"1" : L"0");
    }
    return LoadSettings();
}

}  // namespace orvane
