#include "settings/settings_store.h"

#include <shlobj.h>

#include <algorithm>
#include <array>

#include "device/connect.h"
#include "device/remote_api.h"
#include "platform/handles.h"
#include "platform/paths.h"
#include "platform/resources.h"

namespace orvane {

namespace {

constexpr DWORD kBufferBytes = 1020;
constexpr std::size_t kMaxCharacters = kBufferBytes / sizeof(wchar_t) - 1;

// Where ActiveSync looks for what to start when a device connects.
constexpr const wchar_t* kAutoStartKey = L"SOFTWARE\\Microsoft\\Windows CE Services\\AutoStartOnConnect";
constexpr const wchar_t* kAutoStartValue = L"ORVANE ActiveSync";
constexpr std::size_t kModuleNameChars = 512;

constexpr std::array<UINT, 3> kDeviceFolders = {IDS_DEVICE_FOLDER_1, IDS_DEVICE_FOLDER_2,
                                                IDS_DEVICE_FOLDER_3};

// A flag as the registry and the block hold it: a file type or another setting.
struct StoredFlag {
    UINT setting = 0;
    bool on_when_missing = false;
    std::size_t type = 0;                // The row of the type,
    bool SyncSettings::*flag = nullptr;  // unless this is set.

    bool Get(const SyncSettings& settings) const {
        return flag != nullptr ? settings.*flag : settings.types[type];
    }
    void Set(SyncSettings& settings, bool on) const {
        if (flag != nullptr) {
            settings.*flag = on;
        } else {
            settings.types[type] = on;
        }
    }
};

// In the order in which they are read: the other flags stand behind the bitmaps, the last of the types that
// there were when they came.
constexpr auto kReadOrder = [] {
    std::array<StoredFlag, kFileTypes.size() + kFlagSettings.size()> order{};
    auto next = order.begin();
    for (std::size_t row = 0; row < kFileTypes.size(); ++row) {
        *next++ = {kFileTypes[row].setting, kFileTypes[row].on_when_missing, row};
        if (row == RowOfType(L".bmp")) {
            for (const FlagSetting& setting : kFlagSettings) {
                *next++ = {.setting = setting.setting, .flag = setting.flag};
            }
        }
    }
    return order;
}();

// The order in which they are written and stand in the block has the backup before the warning; that the two
// orders differ is meant.
constexpr auto kWriteOrder = [] {
    auto order = kReadOrder;
    const auto find = [&order](UINT setting) {
        return std::ranges::find(order, setting, &StoredFlag::setting);
    };
    std::iter_swap(find(IDS_OVERWRITE_WARN), find(IDS_OVERWRITE_BKP));
    return order;
}();

constexpr bool IsInBlock(const StoredFlag& stored) {
    return stored.setting != IDS_START_FILE_VIEW;
}

std::wstring FlagText(bool on) {
    return on ? L"1" : L"0";
}

bool IsOn(const std::wstring& text) {
    return text == L"1";
}

bool ReadSetting(UINT name_id, std::wstring& text) {
    return RegReadString(HKEY_CURRENT_USER, ResourceString(IDS_SETTINGS_KEY), ResourceString(name_id), text);
}

void WriteSetting(UINT name_id, const std::wstring& text) {
    RegWriteString(HKEY_CURRENT_USER, ResourceString(IDS_SETTINGS_KEY), ResourceString(name_id), text);
}

std::wstring LoadPcFolder() {
    std::wstring folder;
    if (ReadSetting(IDS_SYNC_PATH_DT, folder)) {
        return folder;
    }
    std::array<wchar_t, MAX_PATH> documents{};
    if (FAILED(SHGetFolderPathW(nullptr, CSIDL_PERSONAL, nullptr, 0, documents.data()))) {
        return {};
    }
    folder = documents.data() + ResourceString(IDS_DEFAULT_PC_FOLDER);
    WriteSetting(IDS_SYNC_PATH_DT, folder);
    return folder;
}

enum class Presence { kThere, kNotThere, kUnknown };

// Whether the device says that it has a folder of that path. Needs a session. Stored folders end in "\", and
// a device's search may find nothing for a path that does: the folder is looked for by its name. The root has
// none; it always exists.
Presence LookForDeviceFolder(const std::wstring& path) {
    const std::wstring name(WithoutTrailingBackslashes(path));
    if (name.empty()) {
        return path.empty() ? Presence::kNotThere : Presence::kThere;
    }
    if (!FitsPathBuffer(name.size())) {
        return Presence::kNotThere;
    }
    rapi::FindData found{};
    // The search is left to the end of the session, which releases it.
    if (const HANDLE search = CeFindFirstFile(name.c_str(), &found); search != INVALID_HANDLE_VALUE) {
        const bool is_folder = (found.attributes & FILE_ATTRIBUTE_DIRECTORY) != 0;
        return is_folder ? Presence::kThere : Presence::kNotThere;
    }
    const DWORD error = CeGetLastError();
    // Where the call did not reach the device, the error is that of an earlier one.
    const bool absent =
        SUCCEEDED(CeRapiGetError()) &&
        (error == ERROR_FILE_NOT_FOUND || error == ERROR_PATH_NOT_FOUND || error == ERROR_NO_MORE_FILES);
    return absent ? Presence::kNotThere : Presence::kUnknown;
}

// The first of the usual folders; none when the device does not say of one before it whether it is there.
std::wstring FindUsualFolder() {
    for (const UINT candidate_id : kDeviceFolders) {
        std::wstring candidate = ResourceString(candidate_id);
        const Presence presence = LookForDeviceFolder(candidate);
        if (presence == Presence::kThere) {
            return candidate;
        }
        if (presence == Presence::kUnknown) {
            break;
        }
    }
    return {};
}

}  // namespace

std::wstring FindDeviceJobFolder(const CancelEvent& cancel) {
    const DeviceSession session(cancel);
    if (!session) {
        return {};
    }
    std::wstring stored;
    if (ReadSetting(IDS_SYNC_PATH_CE, stored) && LookForDeviceFolder(stored) != Presence::kNotThere) {
        return stored;
    }
    std::wstring usual = FindUsualFolder();
    if (!usual.empty()) {
        WriteSetting(IDS_SYNC_PATH_CE, usual);
    }
    return usual;
}

SyncSettings LoadSettings() {
    SyncSettings settings;
    settings.sync_path_dt = LoadPcFolder();
    settings.sync_path_ce = FindDeviceJobFolder(CancelEvent());
    for (const StoredFlag& stored : kReadOrder) {
        std::wstring text;
        if (!ReadSetting(stored.setting, text)) {
            text = FlagText(stored.on_when_missing);
            WriteSetting(stored.setting, text);
        }
        stored.Set(settings, IsOn(text));
    }
    return settings;
}

void SaveSettings(SyncSettings& settings) {
    const auto with_one_backslash = [](const std::wstring& folder) {
        return WithTrailingBackslash(WithoutTrailingBackslashes(folder));
    };
    settings.sync_path_dt = with_one_backslash(settings.sync_path_dt);
    WriteSetting(IDS_SYNC_PATH_DT, settings.sync_path_dt);
    if (!settings.sync_path_ce.empty()) {
        settings.sync_path_ce = with_one_backslash(settings.sync_path_ce);
        WriteSetting(IDS_SYNC_PATH_CE, settings.sync_path_ce);
    }
    for (const StoredFlag& stored : kWriteOrder) {
        WriteSetting(stored.setting, FlagText(stored.Get(settings)));
    }
}

SyncSettingsBlock RefreshSettingsBlock(const SyncSettings& settings) {
    SyncSettingsBlock block{settings.sync_path_dt, settings.sync_path_ce};
    auto text = block.begin() + 2;
    for (const StoredFlag& stored : kWriteOrder) {
        if (IsInBlock(stored)) {
            *text++ = FlagText(stored.Get(settings));
        }
    }
    return block;
}

SyncSettings SettingsOf(const SyncSettingsBlock& block) {
    SyncSettings settings{.sync_path_dt = block[0], .sync_path_ce = block[1], .types = {}};
    auto text = block.begin() + 2;
    for (const StoredFlag& stored : kWriteOrder) {
        if (IsInBlock(stored)) {
            stored.Set(settings, IsOn(*text++));
        }
    }
    return settings;
}

bool ReadStartFileView() {
    std::wstring text;
    return ReadSetting(IDS_START_FILE_VIEW, text) && IsOn(text);
}

bool ReadAutoStart() {
    std::wstring path;
    return RegReadString(HKEY_LOCAL_MACHINE, kAutoStartKey, kAutoStartValue, path) && !path.empty();
}

void WriteAutoStart(bool on, HWND owner) {
    std::array<wchar_t, kModuleNameChars> module{};
    const HWND active = GetActiveWindow();
    GetWindowModuleFileNameW(active != nullptr ? active : owner, module.data(),
                             static_cast<UINT>(module.size() - 1));
    RegWriteString(HKEY_LOCAL_MACHINE, kAutoStartKey, kAutoStartValue, on ? module.data() : L"");
}

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
