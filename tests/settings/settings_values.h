// The settings as the tests of this room name them, and the registry below them.
#pragma once

#include <gtest/gtest.h>

#include <array>

#include "settings/registry_strings.h"
#include "settings/settings_store.h"
#include "tests/support/folder_device.h"
#include "tests/support/scratch_registry.h"

namespace orvane {

inline const std::wstring kKey = L"Software\\Veltrano\\CE Devices";

struct Flag {
    const wchar_t* name;
    const wchar_t* value;  // In the registry.
    int box;               // In the options dialog.
    std::int32_t SyncSettings::*flag;
};
// In the order of the block; Start_File_View is not in it.
constexpr std::array<Flag, 17> kFlags = {
    {{L"qvj", L"Sync_qvj_files", 1021, &SyncSettings::sync_qvj_files},
     {L"tn3", L"Sync_tn3_files", 1022, &SyncSettings::sync_tn3_files},
     {L"rd3", L"Sync_rd3_files", 1023, &SyncSettings::sync_rd3_files},
     {L"pt3", L"Sync_pt3_files", 1024, &SyncSettings::sync_pt3_files},
     {L"ln3", L"Sync_ln3_files", 1025, &SyncSettings::sync_ln3_files},
     {L"jpg", L"Sync_jpg_files", 1027, &SyncSettings::sync_jpg_files},
     {L"bmp", L"Sync_bmp_files", 1029, &SyncSettings::sync_bmp_files},
     {L"all", L"Sync_all_files", 1026, &SyncSettings::sync_all_files},
     {L"old", L"Overwrite_old_files", 1038, &SyncSettings::overwrite_old_files},
     {L"bkp", L"Overwrite_bkp", 1039, &SyncSettings::overwrite_bkp},
     {L"warn", L"Overwrite_warn", 1040, &SyncSettings::overwrite_warn},
     {L"img", L"Sync_img_files", 1028, &SyncSettings::sync_img_files},
     {L"xml", L"Sync_xml_files", 1030, &SyncSettings::sync_xml_files},
     {L"tp3", L"Sync_tp3_files", 1031, &SyncSettings::sync_tp3_files},
     {L"wkf", L"Sync_wkf_files", 1032, &SyncSettings::sync_wkf_files},
     {L"txt", L"Sync_txt_files", 1033, &SyncSettings::sync_txt_files},
     {L"view", L"Start_File_View", 1041, &SyncSettings::start_file_view}}};

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

}  // namespace orvane
