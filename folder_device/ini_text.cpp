#include "folder_device/ini_text.h"

#include "folder_device/owned_handle.h"
#include "folder_device/text.h"

namespace folder_device {

namespace {

// Far more than anybody writes by hand; a larger file is not one of ours.
constexpr DWORD kMaxFileSize = 4 << 20;

// No file is an empty one.
std::optional<std::string> ReadBytes(const std::wstring& path) {
    const auto file =
        Own<OwnedHandle>(CreateFileW(path.c_str(), GENERIC_READ, FILE_SHARE_READ | FILE_SHARE_WRITE, nullptr,
                                     OPEN_EXISTING, FILE_ATTRIBUTE_NORMAL, nullptr));
    if (!file) {
        const DWORD error = GetLastError();
        const bool absent = error == ERROR_FILE_NOT_FOUND || error == ERROR_PATH_NOT_FOUND;
        return absent ? std::optional(std::string()) : std::nullopt;
    }
    LARGE_INTEGER size{};
    if (!GetFileSizeEx(file.get(), &size) || size.QuadPart > kMaxFileSize) {
        return std::nullopt;
    }
    std::string bytes(static_cast<std::size_t>(size.QuadPart), '\0');
    DWORD read = 0;
    if (!ReadFile(file.get(), bytes.data(), static_cast<DWORD>(bytes.size()), &read, nullptr)) {
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
        if (line.front() == L'[' && line.back() == L']') {
            sections.push_back({std::wstring(Trim(line.substr(1, line.size() - 2))), {}});
            continue;
        }
        const std::size_t equals = line.find(L'=');
        if (equals != std::wstring_view::npos) {
            sections.back().values.push_back(
                {std::wstring(Trim(line.substr(0, equals))), std::wstring(Trim(line.substr(equals + 1)))});
        }
    }
    return sections;
}

const std::wstring* FindValue(const IniSection& section, std::wstring_view name) {
    for (const IniValue& value : section.values) {
        if (EqualNoCase(value.name, name)) {
            return &value.text;
        }
    }
    return nullptr;
}

}  // namespace folder_device
