#include "folder_device/ini_text.h"

#include <windows.h>

#include <algorithm>
#include <charconv>

#include "platform/handles.h"
#include "platform/text_case.h"

namespace folder_device {

namespace {

// Far more than anybody writes by hand; a larger file is not one of ours.
constexpr DWORD kMaxFileSize = 4 << 20;

// No file is an empty one.
std::optional<std::string> ReadBytes(const std::wstring& path) {
    const orvane::UniqueFile file(CreateFileW(path.c_str(), GENERIC_READ, FILE_SHARE_READ | FILE_SHARE_WRITE,
                                              nullptr, OPEN_EXISTING, FILE_ATTRIBUTE_NORMAL, nullptr));
    if (!file) {
        const DWORD error = GetLastError();
        const bool absent = error == ERROR_FILE_NOT_FOUND || error == ERROR_PATH_NOT_FOUND;
        return absent ? std::optional(std::string()) : std::nullopt;
    }
    LARGE_INTEGER size{};
    if (!GetFileSizeEx(file.Get(), &size) || size.QuadPart > kMaxFileSize) {
        return std::nullopt;
    }
    std::string bytes(static_cast<std::size_t>(size.QuadPart), '\0');
    DWORD read = 0;
    if (!ReadFile(file.Get(), bytes.data(), static_cast<DWORD>(bytes.size()), &read, nullptr)) {
        return std::nullopt;
    }
    bytes.resize(read);
    return bytes;
}

// UTF-16 begins with its mark or, without one, has zeros in every name.
bool IsUtf16(const std::string& bytes) {
    return bytes.starts_with("\xFF\xFE") || bytes.starts_with("\xFE\xFF") ||
           bytes.find('\0') != std::string::npos;
}

// Bytes that are not UTF-8 become U+FFFD.
std::wstring FromUtf8(std::string_view bytes) {
    const int count = static_cast<int>(bytes.size());
    std::wstring text(
        static_cast<std::size_t>(MultiByteToWideChar(CP_UTF8, 0, bytes.data(), count, nullptr, 0)), L'\0');
    MultiByteToWideChar(CP_UTF8, 0, bytes.data(), count, text.data(), static_cast<int>(text.size()));
    return text;
}

}  // namespace

std::optional<IniText> ReadIniFile(const std::wstring& path) {
    const std::optional<std::string> bytes = ReadBytes(path);
    if (!bytes || IsUtf16(*bytes)) {
        return std::nullopt;
    }
    const std::wstring text = FromUtf8(bytes->starts_with("\xEF\xBB\xBF") ? bytes->substr(3) : *bytes);
    IniText sections(1);
    for (const std::wstring_view raw : Split(text, L'\n')) {
        const std::wstring_view line = Trim(raw);
        if (line.empty() || line.front() == L';' || line.front() == L'#') {
            continue;
        }
        const std::size_t equals = line.find(L'=');
        if (line.front() == L'[' && line.back() == L']') {
            sections.push_back({std::wstring(Trim(line.substr(1, line.size() - 2))), {}});
        } else if (equals != std::wstring_view::npos) {
            sections.back().values.emplace_back(Trim(line.substr(0, equals)), Trim(line.substr(equals + 1)));
        }
    }
    return sections;
}

std::optional<std::wstring> FindValue(const IniSection& section, std::wstring_view name) {
    const auto found = std::find_if(section.values.begin(), section.values.end(), [name](const auto& value) {
        return orvane::EqualIgnoringCase(value.first, name);
    });
    return found != section.values.end() ? std::optional(found->second) : std::nullopt;
}

std::wstring_view Trim(std::wstring_view text) {
    const std::size_t first = text.find_first_not_of(L" \t\r");
    return first == std::wstring_view::npos ? std::wstring_view()
                                            : text.substr(first, text.find_last_not_of(L" \t\r") - first + 1);
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
    const std::string digits = ToUtf8(hexadecimal ? text.substr(2) : text);
    std::uint64_t number = 0;
    const char* const end = digits.data() + digits.size();
    const auto [stop, error] = std::from_chars(digits.data(), end, number, hexadecimal ? 16 : 10);
    return error == std::errc() && stop == end ? std::optional(number) : std::nullopt;
}

std::string ToUtf8(std::wstring_view text) {
    const int count = static_cast<int>(text.size());
    std::string bytes(text.size() * 3, '\0');
    bytes.resize(static_cast<std::size_t>(WideCharToMultiByte(
        CP_UTF8, 0, text.data(), count, bytes.data(), static_cast<int>(bytes.size()), nullptr, nullptr)));
    return bytes;
}

}  // namespace folder_device
