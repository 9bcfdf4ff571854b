#include "browse/chosen_folder.h"

#include <algorithm>

#include "platform/paths.h"
#include "platform/text_case.h"

namespace orvane {

namespace {

// From the last "\" on; the whole path when there is none.
std::wstring_view LastComponent(std::wstring_view path) {
    const std::size_t cut = path.rfind(L'\\');
    return cut == std::wstring_view::npos ? path : path.substr(cut);
}

std::wstring ExpandAbbreviation(std::wstring_view field, std::wstring_view directory) {
    const std::size_t cut = directory.rfind(L'\\');
    if (cut == std::wstring_view::npos || EqualIgnoringCase(LastComponent(field), LastComponent(directory))) {
        return std::wstring(directory);
    }
    return std::wstring(directory).append(field.substr(std::min(cut, field.size())));
}

}  // namespace

ChosenFolder ChosenFolderOf(std::wstring_view field, std::wstring_view file_path, std::size_t name_offset) {
    const std::wstring_view directory = file_path.substr(0, name_offset > 0 ? name_offset - 1 : 0);
    const bool is_abbreviated = field.find(L"...") != std::wstring_view::npos;
    return {is_abbreviated ? ExpandAbbreviation(field, directory)
                           : std::wstring(WithoutTrailingBackslashes(field)),
            std::wstring(directory)};
}

}  // namespace orvane
