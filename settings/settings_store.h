// The program's settings: in memory, in the registry, and as the strings that are handed between dialogs.
// Used on the user-interface thread only. No failure of the store is reported: a read that fails gives the
// default, a write that fails leaves the value in memory for the rest of the run.
#pragma once

#include <windows.h>

#include <array>
#include <string>

#include "jobs/file_types.h"

namespace orvane {

// The settings in memory.
struct SyncSettings {
    std::wstring sync_path_dt;  // PC job folder.
    std::wstring sync_path_ce;  // Device job folder; empty when no device was attached at the start.
    FileTypes types;            // Those that the user chose.
    // The hidden box "All files." of the options dialog. No filter looks at it: that nothing but the types of
    // the table is ever copied is meant.
    bool all_files = false;
    bool overwrite_old_files = false;
    bool overwrite_warn = false;
    bool overwrite_bkp = false;
    bool start_file_view = false;
};

// A setting besides folders and types, with its value in the registry and its box in the options dialog. It
// is off when the registry does not say.
struct FlagSetting {
    UINT setting;
    int box;
    bool SyncSettings::*flag;
};

inline constexpr auto kFlagSettings = std::to_array<FlagSetting>({
    {IDS_SYNC_ALL_FILES, IDC_OPTIONS_ALL_FILES, &SyncSettings::all_files},
    {IDS_OVERWRITE_OLD_FILES, IDC_OPTIONS_OVERWRITE, &SyncSettings::overwrite_old_files},
    {IDS_OVERWRITE_WARN, IDC_OPTIONS_WARN, &SyncSettings::overwrite_warn},
    {IDS_OVERWRITE_BKP, IDC_OPTIONS_BACKUP, &SyncSettings::overwrite_bkp},
    {IDS_START_FILE_VIEW, IDC_OPTIONS_START_FILE_VIEW, &SyncSettings::start_file_view},
});

// The settings as texts, to be handed to a dialog: the PC's folder, the device's, and each flag as "1" or
// "0", in the order in which flags are written. Start_File_View is not among them.
using SyncSettingsBlock = std::array<std::wstring, 2 + kFileTypes.size() + kFlagSettings.size() - 1>;

// Reads all settings of the current user and writes back a default for every one that is missing. Opens a
// device session for the device job folder, which may take as long as ConnectDevice waits: without a device
// that folder is empty and what the registry holds stays unread; with one, a stored folder that is not on the
// device gives way to the first of the three usual folders that is.
SyncSettings LoadSettings();

// Writes all settings, changed or not. Both folders are stored, and left in `settings`, with exactly one "\"
// at their end. An empty device folder is not written: it means that no device was there to read the stored
// one from, and storing it would make the device's root the job folder. (The root itself is "\".)
void SaveSettings(SyncSettings& settings);

SyncSettingsBlock RefreshSettingsBlock(const SyncSettings& settings);
// The other way round; only the exact text "1" means on, and Start_File_View, which the block leaves out, is
// off.
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
