// The program's settings: in memory, in the registry, and as the strings that are handed between dialogs.
// Used on the user-interface thread only. No failure of the store is reported: a read that fails gives the
// default, a write that fails leaves the value in memory for the rest of the run.
#pragma once

#include <windows.h>

#include <array>
#include <string>

#include "jobs/file_types.h"
#include "platform/cancel_event.h"
#include "platform/paths.h"

namespace orvane {

// What can be typed of a folder so that it is found again: one "\" comes to its end, and with that a value of
// the registry holds 509 characters and the device's buffer one less than its length.
inline constexpr std::size_t kMaxPcFolderChars = 508;
inline constexpr std::size_t kMaxDeviceFolderChars = kPathBufferChars - 2;

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

// The device job folder: the stored one, or the first of the three usual ones that is on the device, which is
// stored then. The stored folder gives way only when the device answers that it has no such folder; where it
// answers anything else, or the call does not reach it, the stored folder stands. Empty when no device
// session can be opened, or when neither is there: no device folder is meant then, never all of the device,
// which is "\". May take as long as ConnectDevice waits.
std::wstring FindDeviceJobFolder(const CancelEvent& cancel);

// Reads all settings of the current user and writes back a default for every one that is missing. The device
// job folder comes from FindDeviceJobFolder, and with it the time that it takes.
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

// Reads a value as text, whatever its type, of at most 509 characters. False, with an empty text, when the
// key cannot be opened with full access or the value is missing or longer.
bool RegReadString(HKEY root, const std::wstring& subkey, const std::wstring& name, std::wstring& text);

// Writes a REG_SZ value without a terminator of its own, creating the key when it cannot be opened. False
// when there is no key to write to; whether the value itself could be stored is not told.
bool RegWriteString(HKEY root, const std::wstring& subkey, const std::wstring& name,
                    const std::wstring& text);

}  // namespace orvane
