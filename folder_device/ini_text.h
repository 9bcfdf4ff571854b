// Text files of sections, the form of both folder_device.ini and the device's registry file: UTF-8, one
// "[section]" or "name=value" a line, blanks around names and values do not count, a line that begins with
// ";" or "#" is a comment. Names are compared without regard to case. And the pieces of such texts.
#pragma once

#include <cstdint>
#include <optional>
#include <string>
#include <string_view>
#include <utility>
#include <vector>

namespace folder_device {

struct IniSection {
    std::wstring name;
    std::vector<std::pair<std::wstring, std::wstring>> values;  // Name and text.

    bool operator==(const IniSection&) const = default;
};
using IniText = std::vector<IniSection>;

// The file's sections in their order. Values before the first section belong to a section without a name. No
// file has no values; nothing when there is one that cannot be read: locked, over 4 MiB, in UTF-16.
std::optional<IniText> ReadIniFile(const std::wstring& path);
// The text of the section's value of that name.
std::optional<std::wstring> FindValue(const IniSection& section, std::wstring_view name);

// Without the blanks and tabs at both ends.
std::wstring_view Trim(std::wstring_view text);
// The pieces between the separators; one empty piece for an empty text.
std::vector<std::wstring_view> Split(std::wstring_view text, wchar_t separator);
// A decimal number or, after "0x", a hexadecimal one; nothing for any other text or past 64 bits.
std::optional<std::uint64_t> ParseNumber(std::wstring_view text);
std::string ToUtf8(std::wstring_view text);

}  // namespace folder_device
