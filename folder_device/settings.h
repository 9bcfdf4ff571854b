// The settings of the folder device. Each has one name, used in the environment as FOLDER_DEVICE_<NAME> and
// in section [folder_device] of folder_device.ini beside the DLL; the environment wins. An empty text is the
// setting's default. docs/folder_device.md describes every setting for its user.
#pragma once

#include <windows.h>

#include <array>
#include <cstdint>
#include <optional>
#include <string>
#include <vector>

#include "folder_device/functions.h"

namespace folder_device {

inline constexpr std::size_t kSettingCount = 14;
// The texts of all settings, in the order of the names in settings.cpp. Two equal arrays mean the same
// configuration, so the counters of faults go on.
using SettingTexts = std::array<std::wstring, kSettingCount>;

// One refusal: `Function#n@path=error`.
struct RefuseRule {
    std::optional<Function> function;  // None: every function that reaches the device.
    std::uint64_t nth = 0;             // Counted from 1 among the calls that match; 0: every one of them.
    std::wstring path;                 // Empty: on any path.
    DWORD error = 0;                   // A Win32 code, or an HRESULT for the functions that return one.
};

// One made-up entry of a listing: `folder|name|options`.
struct ExtraEntry {
    std::wstring folder;
    std::wstring name;
    bool is_folder = false;
    bool unterminated = false;  // The name is repeated until the record's 260 characters are full.
    std::uint64_t size = 0;
};

struct Settings {
    std::wstring root;  // In the "\\?\" form, without a trailing "\".
    std::wstring registry_file;
    std::wstring trace_file;                // Empty: no trace.
    std::optional<std::uint64_t> capacity;  // Bytes.
    std::int64_t clock_offset = 0;          // 100-ns units, added to the PC's clock.
    DWORD call_delay = 0;                   // Milliseconds before each call that reaches the device.
    DWORD connect_delay = 0;                // Milliseconds; INFINITE: the connection never comes about.
    HRESULT init_result = S_OK;             // A failure here is CeRapiInitEx's own answer.
    HRESULT connect_result = S_OK;          // What the connection ends in.
    std::vector<RefuseRule> refuse;
    std::uint64_t vanish_at = 0;  // The call at which the device vanishes; 0: never.
    std::vector<ExtraEntry> extra_entries;
    std::optional<DWORD> found_count;  // What CeFindAllFiles claims to have found.
    bool found_null = false;           // CeFindAllFiles gives no buffer.
};

// Reads all texts: the environment, else the ini file in `dll_folder`. Nothing when the file is there and
// cannot be read: what it would say must not be taken for unsaid.
std::optional<SettingTexts> ReadSettingTexts(const std::wstring& dll_folder);
// Takes the texts apart. Relative paths are below `dll_folder`. Nothing when a text cannot be understood.
std::optional<Settings> ParseSettings(const SettingTexts& texts, const std::wstring& dll_folder);

}  // namespace folder_device
