// The settings as the tests of this room name them, and the registry below them.
#pragma once

#include <gtest/gtest.h>

#include "platform/resources.h"
#include "settings/settings_store.h"
#include "tests/support/folder_device.h"
#include "tests/support/scratch_registry.h"

namespace orvane {

inline const std::wstring kKey = L"Software\\Veltrano\\CE Devices";

// All flags: the rows of the table of types, then those of the other flags.
constexpr std::size_t kCount = kFileTypes.size() + kFlagSettings.size();
using Flags = std::bitset<kCount>;

template <class Condition>
Flags Those(Condition condition) {
    Flags flags;
    for (std::size_t i = 0; i < kCount; ++i) {
        flags[i] = condition(i);
    }
    return flags;
}

// By their values in the registry: what stands between "Sync_" and "_files", or the whole name.
inline std::wstring ValueOf(std::size_t i) {
    return i < kFileTypes.size() ? L"Sync_" + std::wstring(kFileTypes[i].extension.substr(1)) + L"_files"
                                 : ResourceString(kFlagSettings[i - kFileTypes.size()].setting);
}

inline Flags Named(const std::vector<std::wstring>& names) {
    return Those([&](std::size_t i) { return std::ranges::find(names, ValueOf(i)) != names.end(); });
}

inline int BoxOf(std::size_t i) {
    return i < kFileTypes.size() ? kFileTypes[i].box : kFlagSettings[i - kFileTypes.size()].box;
}

inline SyncSettings With(const Flags& flags) {
    SyncSettings settings;
    for (std::size_t i = 0; i < kCount; ++i) {
        if (i < kFileTypes.size()) {
            settings.types[i] = flags[i];
        } else {
            settings.*kFlagSettings[i - kFileTypes.size()].flag = flags[i];
        }
    }
    return settings;
}

inline Flags FlagsOf(const SyncSettings& settings) {
    return Those([&](std::size_t i) {
        return i < kFileTypes.size() ? settings.types[i]
                                     : settings.*kFlagSettings[i - kFileTypes.size()].flag;
    });
}

// What the registry holds, "(none)" for nothing.
inline std::wstring Stored(const std::wstring& name, HKEY root = HKEY_CURRENT_USER,
                           const std::wstring& key = kKey) {
    std::wstring text;
    return RegReadString(root, key, name, text) ? text : L"(none)";
}

inline Flags StoredFlags() {
    return Those([](std::size_t i) { return Stored(ValueOf(i)) == L"1"; });
}

inline void Store(const std::wstring& name, const std::wstring& text, HKEY root = HKEY_CURRENT_USER,
                  const std::wstring& key = kKey) {
    ASSERT_TRUE(RegWriteString(root, key, name, text));
}

}  // namespace orvane
