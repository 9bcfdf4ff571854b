// Text files of sections, the form of both folder_device.ini and the device's registry file: UTF-8, one
// "[section]" or "name=value" a line, blanks around names and values do not count, a line that begins with
// ";" or "#" is a comment. Names are compared without regard to case.
#pragma once

#include <optional>
#include <string>
#include <string_view>
#include <vector>

namespace folder_device {

struct IniValue {
    std::wstring name;
    std::wstring text;
};

struct IniSection {
    std::wstring name;
    std::vector<IniValue> values;
};

using IniText = std::vector<IniSection>;

// The file's sections in their order. Values before the first section belong to a section without a name. No
// file has no values; nothing when there is one that cannot be read: locked, over 4 MiB, in UTF-16.
std::optional<IniText> ReadIniFile(const std::wstring& path);
// The text of the section's value of that name, null when there is none.
const std::wstring* FindValue(const IniSection& section, std::wstring_view name);

}  // namespace folder_device
