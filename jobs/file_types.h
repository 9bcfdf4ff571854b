// What a job folder is made of: the types of its files, and the folders that belong to job files. Pure; names
// are taken in any case.
#pragma once

#include <windows.h>

#include <algorithm>
#include <array>
#include <bitset>
#include <string_view>

#include "res/ids.h"

namespace orvane {

// A type of job file, with what belongs to it in the settings.
struct FileType {
    std::wstring_view extension;  // Four characters, in lower case.
    UINT setting;                 // The string resource that names its value in the registry.
    int box;                      // Its box in the options dialog.
    bool on_when_missing;         // Whether it takes part when the registry does not say.
};

// The one table of types. The order is that in which the settings hold them; a new type goes to the end.
inline constexpr auto kFileTypes = std::to_array<FileType>({
    {L".qvj", IDS_SYNC_QVJ_FILES, IDC_OPTIONS_QVJ, true},
    {L".tn3", IDS_SYNC_TN3_FILES, IDC_OPTIONS_TN3, false},
    {L".rd3", IDS_SYNC_RD3_FILES, IDC_OPTIONS_RD3, false},
    {L".pt3", IDS_SYNC_PT3_FILES, IDC_OPTIONS_PT3, false},
    {L".ln3", IDS_SYNC_LN3_FILES, IDC_OPTIONS_LN3, false},
    {L".jpg", IDS_SYNC_JPG_FILES, IDC_OPTIONS_JPG, false},
    {L".bmp", IDS_SYNC_BMP_FILES, IDC_OPTIONS_BMP, false},
    {L".img", IDS_SYNC_IMG_FILES, IDC_OPTIONS_IMG, false},
    {L".xml", IDS_SYNC_XML_FILES, IDC_OPTIONS_XML, false},
    {L".tp3", IDS_SYNC_TP3_FILES, IDC_OPTIONS_TP3, false},
    {L".wkf", IDS_SYNC_WKF_FILES, IDC_OPTIONS_WKF, true},
    {L".txt", IDS_SYNC_TXT_FILES, IDC_OPTIONS_TXT, false},
});

// A set of types: bit n stands for row n of the table.
using FileTypes = std::bitset<kFileTypes.size()>;

inline constexpr std::size_t kExtensionChars = 4;
static_assert(std::ranges::all_of(kFileTypes, [](const FileType& type) {
    return type.extension.size() == kExtensionChars;
}));

// The row of a type that the program knows by name; one that is not in the table does not compile.
consteval std::size_t RowOfType(std::wstring_view extension) {
    std::size_t row = 0;
    while (kFileTypes.at(row).extension != extension) {
        ++row;
    }
    return row;
}

// The types that a synchronization takes when the user chose `chosen`: ".img" files follow the bitmaps there,
// whatever was chosen for them. That is meant: their own choice is for the manual view, which takes `chosen`
// as it is.
FileTypes SynchronizedTypes(FileTypes chosen);

// Whether the last four characters of the name (the whole name if it has no more) are the extension of one of
// the types.
bool PassesExtensionFilter(std::wstring_view name, const FileTypes& types);

// The same for a name without "\" in front, of which four characters or fewer cannot carry an extension.
bool IsListedType(std::wstring_view name, const FileTypes& types);

// Whether the name is that of a ".wkf" job file. The name without its extension is then that of the companion
// folder.
bool HasCompanionFolder(std::wstring_view name);
std::wstring_view CompanionFolder(std::wstring_view name);

}  // namespace orvane
