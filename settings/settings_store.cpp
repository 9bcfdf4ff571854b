#include "settings/settings_store.h"

#include <shlobj.h>

#include <array>

#include "device/connect.h"
#include "device/remote_api.h"
#include "platform/handles.h"
#include "platform/paths.h"
#include "platform/resources.h"
#include "res/ids.h"
#include "settings/registry_strings.h"

namespace orvane {

namespace {

// Where ActiveSync looks for what to start when a device connects.
constexpr const wchar_t* kAutoStartKey = L"SOFTWARE\\Microsoft\\Windows CE Services\\AutoStartOnConnect";
constexpr const wchar_t* kAutoStartValue = L"ORVANE ActiveSync";
constexpr std::size_t kModuleNameChars = 512;

constexpr std::array<UINT, 3> kDeviceFolders = {IDS_DEVICE_FOLDER_1, IDS_DEVICE_FOLDER_2,
                                                IDS_DEVICE_FOLDER_3};

struct FlagSetting {
    UINT name_id;
    bool on_when_missing;
    std::int32_t SyncSettings::*flag;
    std::wstring SyncSettingsBlock::*text;  // Null for the one that the block leaves out.
};

using S = SyncSettings;
using B = SyncSettingsBlock;

// In the order in which they are written.
constexpr std::array<FlagSetting, 17> kFlags = {{
    {IDS_SYNC_QVJ_FILES, true, &S::sync_qvj_files, &B::sync_qvj_files},
    {IDS_SYNC_TN3_FILES, false, &S::sync_tn3_files, &B::sync_tn3_files},
    {IDS_SYNC_RD3_FILES, false, &S::sync_rd3_files, &B::sync_rd3_files},
    {IDS_SYNC_PT3_FILES, false, &S::sync_pt3_files, &B::sync_pt3_files},
    {IDS_SYNC_LN3_FILES, false, &S::sync_ln3_files, &B::sync_ln3_files},
    {IDS_SYNC_JPG_FILES, false, &S::sync_jpg_files, &B::sync_jpg_files},
    {IDS_SYNC_BMP_FILES, false, &S::sync_bmp_files, &B::sync_bmp_files},
    {IDS_SYNC_ALL_FILES, false, &S::sync_all_files, &B::sync_all_files},
    {IDS_OVERWRITE_OLD_FILES, false, &S::overwrite_old_files, &B::overwrite_old_files},
    {IDS_OVERWRITE_BKP, false, &S::overwrite_bkp, &B::overwrite_bkp},
    {IDS_OVERWRITE_WARN, false, &S::overwrite_warn, &B::overwrite_warn},
    {IDS_START_FILE_VIEW, false, &S::start_file_view, nullptr},
    {IDS_SYNC_IMG_FILES, false, &S::sync_img_files, &B::sync_img_files},
    {IDS_SYNC_XML_FILES, false, &S::sync_xml_files, &B::sync_xml_files},
    {IDS_SYNC_TP3_FILES, false, &S::sync_tp3_files, &B::sync_tp3_files},
    {IDS_SYNC_WKF_FILES, true, &S::sync_wkf_files, &B::sync_wkf_files},
    {IDS_SYNC_TXT_FILES, false, &S::sync_txt_files, &B::sync_txt_files},
}};

// The order in which they are read has the backup and the warning the other way round.
constexpr std::array<std::size_t, kFlags.size()> kReadOrder = {0,  1, 2,  3,  4,  5,  6,  7, 8,
                                                               10, 9, 11, 12, 13, 14, 15, 16};

std::wstring FlagText(std::int32_t flag) {
    return flag == 1 ? L"1" : L"0";
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

// Needs a session. Stored folders end in "\", and a device's search may find nothing for a path that does:
// the folder is looked for by its name. The root has none; it always exists.
bool IsDeviceFolder(const std::wstring& path) {
    const std::wstring name(WithoutTrailingBackslashes(path));
    if (name.empty()) {
        return !path.empty();
    }
    if (!FitsPathBuffer(name.size())) {
        return false;
    }
    rapi::FindData found{};
    // The search is left to the end of the session, which releases it.
    const HANDLE search = CeFindFirstFile(name.c_str(), &found);
    return search != INVALID_HANDLE_VALUE && (found.attributes & FILE_ATTRIBUTE_DIRECTORY) != 0;
}

std::wstring FindDeviceFolder() {
    std::wstring stored;
    if (ReadSetting(IDS_SYNC_PATH_CE, stored) && IsDeviceFolder(stored)) {
        return stored;
    }
    for (const UINT candidate_id : kDeviceFolders) {
        std::wstring candidate = ResourceString(candidate_id);
        if (IsDeviceFolder(candidate)) {
            WriteSetting(IDS_SYNC_PATH_CE, candidate);
            return candidate;
        }
    }
    return {};
}

std::wstring LoadDeviceFolder() {
    const UniqueEvent cancel = NewManualResetEvent();
    const DeviceSession session(cancel.Get());
    return session ? FindDeviceFolder() : std::wstring();
}

}  // namespace

SyncSettings LoadSettings() {
    SyncSettings settings;
    settings.sync_path_dt = LoadPcFolder();
    settings.sync_path_ce = LoadDeviceFolder();
    for (const std::size_t index : kReadOrder) {
        const FlagSetting& setting = kFlags[index];
        std::wstring text;
        if (!ReadSetting(setting.name_id, text)) {
            text = setting.on_when_missing ? L"1" : L"0";
            WriteSetting(setting.name_id, text);
        }
        settings.*setting.flag = IsOn(text) ? 1 : 0;
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
    for (const FlagSetting& setting : kFlags) {
        WriteSetting(setting.name_id, FlagText(settings.*setting.flag));
    }
}

void RefreshSettingsBlock(const SyncSettings& settings, SyncSettingsBlock& block) {
    block.sync_path_dt = settings.sync_path_dt;
    block.sync_path_ce = settings.sync_path_ce;
    for (const FlagSetting& setting : kFlags) {
        if (setting.text != nullptr) {
            block.*setting.text = FlagText(settings.*setting.flag);
        }
    }
}

SyncSettings SettingsOf(const SyncSettingsBlock& block) {
    SyncSettings settings;
    settings.sync_path_dt = block.sync_path_dt;
    settings.sync_path_ce = block.sync_path_ce;
    for (const FlagSetting& setting : kFlags) {
        settings.*setting.flag = setting.text != nullptr && IsOn(block.*setting.text) ? 1 : 0;
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

}  // namespace orvane
