// What the user chose in the PC folder chooser.
#pragma once

#include <cstddef>
#include <string>
#include <string_view>

namespace orvane {

// PC paths without "\" at their end: of a drive's root only "C:" is left.
struct ChosenFolder {
    std::wstring folder;     // What was chosen.
    std::wstring directory;  // The folder part of the file path that the file dialog answered.
};

// `field`: the text of the current-directory field when OK was pressed. `file_path` and `name_offset`: the
// file path that the file dialog answered, and where in it the file's name begins. The field's text is what
// counts, unless the system has abbreviated it with "...".
ChosenFolder ChosenFolderOf(std::wstring_view field, std::wstring_view file_path, std::size_t name_offset);

}  // namespace orvane
