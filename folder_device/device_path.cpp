#include "folder_device/device_path.h"

#include <cwchar>

#include "folder_device/ini_text.h"
#include "platform/handles.h"
#include "platform/paths.h"
#include "platform/text_case.h"

namespace folder_device {

namespace {

constexpr std::size_t kMaxNameLength = 255;

// Whether the surrogates go in pairs: no other text can be told in UTF-8.
bool IsWellFormed(std::wstring_view name) {
    return WideCharToMultiByte(CP_UTF8, WC_ERR_INVALID_CHARS, name.data(), static_cast<int>(name.size()),
                               nullptr, 0, nullptr, nullptr) != 0;
}

DWORD CheckSyntax(std::wstring_view path) {
    if (path.size() >= MAX_PATH) {
        return ERROR_FILENAME_EXCED_RANGE;
    }
    if (!path.starts_with(L'\\')) {
        return ERROR_INVALID_NAME;
    }
    if (path.size() == 1) {
        return ERROR_SUCCESS;
    }
    for (const std::wstring_view name : Split(path.substr(1), L'\\')) {
        if (name.size() > kMaxNameLength) {
            return ERROR_FILENAME_EXCED_RANGE;
        }
        if (!IsDeviceName(name)) {
            return ERROR_INVALID_NAME;
        }
    }
    return ERROR_SUCCESS;
}

// Whether what stands at `pc_path` has its last name as its own. The PC also finds files by the shortened
// names that it gives to long ones; these always hold a "~", so that other names cost nothing here.
bool HasThatName(const std::wstring& pc_path) {
    const std::wstring_view name = std::wstring_view(pc_path).substr(pc_path.rfind(L'\\') + 1);
    if (name.find(L'~') == std::wstring_view::npos) {
        return true;
    }
    WIN32_FIND_DATAW entry;
    const orvane::UniqueFind search(
        FindFirstFileExW(pc_path.c_str(), FindExInfoBasic, &entry, FindExSearchNameMatch, nullptr, 0));
    return search && orvane::EqualIgnoringCase(entry.cFileName, name);
}

// What is refused of an existing place: a link, and one that only a shortened name leads to.
DWORD CheckExisting(const std::wstring& pc_path, DWORD attributes) {
    if ((attributes & FILE_ATTRIBUTE_REPARSE_POINT) != 0) {
        return ERROR_ACCESS_DENIED;
    }
    return HasThatName(pc_path) ? ERROR_SUCCESS : ERROR_INVALID_NAME;
}

}  // namespace

bool IsDeviceName(std::wstring_view name) {
    return name.size() <= kMaxNameLength && orvane::IsSafePcName(name) && IsWellFormed(name);
}

DWORD Locate(const std::wstring& root, const wchar_t* path, Location& location) {
    if (path == nullptr) {
        return ERROR_INVALID_PARAMETER;
    }
    const std::wstring_view text(path, wcsnlen(path, MAX_PATH));
    if (const DWORD error = CheckSyntax(text); error != ERROR_SUCCESS) {
        return error;
    }
    location.device_path = text;
    location.pc_path = root + location.device_path;
    if (location.IsRoot()) {
        location.attributes = GetFileAttributesW(location.pc_path.c_str());
        return location.IsFolder() ? ERROR_SUCCESS : ERROR_PATH_NOT_FOUND;
    }
    for (std::size_t end = location.device_path.find(L'\\', 1); end != std::wstring::npos;
         end = location.device_path.find(L'\\', end + 1)) {
        const std::wstring folder = root + location.device_path.substr(0, end);
        const DWORD attributes = GetFileAttributesW(folder.c_str());
        if (attributes == INVALID_FILE_ATTRIBUTES || (attributes & FILE_ATTRIBUTE_DIRECTORY) == 0) {
            return ERROR_PATH_NOT_FOUND;
        }
        if (const DWORD error = CheckExisting(folder, attributes); error != ERROR_SUCCESS) {
            return error;
        }
    }
    location.attributes = GetFileAttributesW(location.pc_path.c_str());
    if (location.Exists()) {
        return CheckExisting(location.pc_path, location.attributes);
    }
    const DWORD error = GetLastError();
    return error == ERROR_FILE_NOT_FOUND ? ERROR_SUCCESS : error;
}

}  // namespace folder_device
