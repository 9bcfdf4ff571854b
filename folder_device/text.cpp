#include "folder_device/text.h"

#include <windows.h>

#include <cwchar>
#include <limits>

namespace folder_device {

bool EqualNoCase(std::wstring_view a, std::wstring_view b) {
    return a.size() == b.size() && CompareStringOrdinal(a.data(), static_cast<int>(a.size()), b.data(),
                                                        static_cast<int>(b.size()), TRUE) == CSTR_EQUAL;
}

std::wstring UpperCase(std::wstring_view text) {
    std::wstring upper(text);
    CharUpperBuffW(upper.data(), static_cast<DWORD>(upper.size()));
    return upper;
}

std::wstring_view Trim(std::wstring_view text) {
    const std::size_t first = text.find_first_not_of(L" \t\r");
    if (first == std::wstring_view::npos) {
        return {};
    }
    return text.substr(first, text.find_last_not_of(L" \t\r") - first + 1);
}

std::vector<std::wstring_view> Split(std::wstring_view text, wchar_t separator) {
    std::vector<std::wstring_view> pieces;
    for (;;) {
        const std::size_t end = text.find(separator);
        pieces.push_back(text.substr(0, end));
        if (end == std::wstring_view::npos) {
            return pieces;
        }
        text.remove_prefix(end + 1);
    }
}

std::optional<std::uint64_t> ParseNumber(std::wstring_view text) {
    const bool hexadecimal = text.starts_with(L"0x") || text.starts_with(L"0X");
    const std::uint64_t base = hexadecimal ? 16 : 10;
    if (hexadecimal) {
        text.remove_prefix(2);
    }
    if (text.empty()) {
        return std::nullopt;
    }
    std::uint64_t number = 0;
    for (const wchar_t c : text) {
        std::uint64_t digit = 99;
        if (c >= L'0' && c <= L'9') {
            digit = static_cast<std::uint64_t>(c - L'0');
        } else if (c >= L'a' && c <= L'f') {
            digit = static_cast<std::uint64_t>(c - L'a') + 10;
        } else if (c >= L'A' && c <= L'F') {
            digit = static_cast<std::uint64_t>(c - L'A') + 10;
        }
        if (digit >= base || number > (std::numeric_limits<std::uint64_t>::max() - digit) / base) {
            return std::nullopt;
        }
        number = number * base + digit;
    }
    return number;
}

std::wstring HexText(std::uint64_t number) {
    wchar_t text[20];
    std::swprintf(text, std::size(text), L"0x%llx", static_cast<unsigned long long>(number));
    return text;
}

std::string ToUtf8(std::wstring_view text) {
    const int wide = static_cast<int>(text.size());
    std::string bytes(static_cast<std::size_t>(
                          WideCharToMultiByte(CP_UTF8, 0, text.data(), wide, nullptr, 0, nullptr, nullptr)),
                      '\0');
    WideCharToMultiByte(CP_UTF8, 0, text.data(), wide, bytes.data(), static_cast<int>(bytes.size()), nullptr,
                        nullptr);
    return bytes;
}

std::wstring FromUtf8(std::string_view bytes) {
    const int count = static_cast<int>(bytes.size());
    std::wstring text(
        static_cast<std::size_t>(MultiByteToWideChar(CP_UTF8, 0, bytes.data(), count, nullptr, 0)), L'\0');
    MultiByteToWideChar(CP_UTF8, 0, bytes.data(), count, text.data(), static_cast<int>(text.size()));
    return text;
}

}  // namespace folder_device
