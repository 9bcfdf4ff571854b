// The program's settings: in memory, in the registry, and as the strings that are handed between dialogs.
// Used on the user-interface thread only. No failure of the store is reported: a read that fails gives the
// default, a write that fails leaves the value in memory for the rest of the run.
#pragma once

#include <windows.h>

#include <cstdint>
#include <string>

namespace orvane {

// The settings in memory. A flag is 1 for on, 0 for off.
struct SyncSettings {
    std::wstring sync_path_dt;  // PC job folder.
    std::wstring sync_path_ce;  // Device job folder; empty when no device was attached at the start.
    std::int32_t sync_qvj_files = 0;
    std::int32_t sync_tn3_files = 0;
    std::int32_t sync_rd3_files = 0;
    std::int32_t sync_pt3_files = 0;
    std::int32_t sync_ln3_files = 0;
    std::int32_t sync_jpg_files = 0;
    std::int32_t sync_bmp_files = 0;
    std::int32_t sync_all_files = 0;
    std::int32_t sync_img_files = 0;
    std::int32_t sync_xml_files = 0;
    std::int32_t sync_tp3_files = 0;
    std::int32_t sync_wkf_files = 0;
    std::int32_t sync_txt_files = 0;
    std::int32_t overwrite_old_files = 0;
    std::int32_t start_file_view = 0;
    std::int32_t overwrite_bkp = 0;
    std::int32_t overwrite_warn = 0;
};

// The settings as texts, a flag as "1" or "0"; only the exact text "1" means on. Start_File_View is not
// among them.
struct SyncSettingsBlock {
    std::wstring sync_path_dt;
    std::wstring sync_path_ce;
    std::wstring sync_qvj_files;
    std::wstring sync_tn3_files;
    std::wstring sync_rd3_files;
    std::wstring sync_pt3_files;
    std::wstring sync_ln3_files;
    std::wstring sync_jpg_files;
    std::wstring sync_bmp_files;
    std::wstring sync_all_files;
    std::wstring overwrite_old_files;
    std::wstring overwrite_bkp;
    std::wstring overwrite_warn;
    std::wstring sync_img_files;
    std::wstring sync_xml_files;
    std::wstring sync_tp3_files;
    std::wstring sync_wkf_files;
    std::wstring sync_txt_files;
};

inline bool IsOn(const std::wstring& text) {
    return text == L"1";
}

// Reads all settings of the current user and writes back a default for every one that is missing. Opens a
// device session for the device job folder, which may take as long as ConnectDevice waits: without a device
// that folder is empty and what the registry holds stays unread; with one, a stored folder that is not on the
// device gives way to the first of the three usual folders that is.
SyncSettings LoadSettings();

// Writes all settings, changed or not. Both folders are stored, and left in `settings`, with exactly one "\"
// at their end. An empty device folder is not written: it means that no device was there to read the stored
// one from, and storing it would make the device's root the job folder. (The root itself is "\".)
void SaveSettings(SyncSettings& settings);

void RefreshSettingsBlock(const SyncSettings& settings, SyncSettingsBlock& block);
// The other way round; Start_File_View, which the block leaves out, is off.
SyncSettings SettingsOf(const SyncSettingsBlock& block);

// Start_File_View as the registry holds it now.
bool ReadStartFileView();

// The entry that makes the desktop synchronization service start the program when a device connects. It
// holds the program's path or nothing; without the right to write to the local machine's registry it stays
// as it is. The path is that of the module that owns the thread's active window, or `owner` if none is
// active.
bool ReadAutoStart();
void WriteAutoStart(bool on, HWND owner);

}  // namespace orvane
