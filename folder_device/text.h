// Text helpers: comparison as the file system compares, numbers, pieces, UTF-8.
#pragma once

#include <cstdint>
#include <optional>
#include <string>
#include <string_view>
#include <vector>

namespace folder_device {

// Equal without regard to case, by the system's own table and in no language's order.
bool EqualNoCase(std::wstring_view a, std::wstring_view b);
// `text` in the upper case that the file system compares in.
std::wstring UpperCase(std::wstring_view text);

// Without the blanks and tabs at both ends.
std::wstring_view Trim(std::wstring_view text);
// The pieces between the separators; one empty piece for an empty text.
std::vector<std::wstring_view> Split(std::wstring_view text, wchar_t separator);

// A decimal number or, after "0x", a hexadecimal one; nothing for any other text or past 64 bits.
std::optional<std::uint64_t> ParseNumber(std::wstring_view text);
// "0x" and lower-case digits.
std::wstring HexText(std::uint64_t number);

std::string ToUtf8(std::wstring_view text);
// Bytes that are not UTF-8 become U+FFFD.
std::wstring FromUtf8(std::string_view bytes);

}  // namespace folder_device
