#include "folder_device/settings.h"

#include <memory>
#include <new>

#include "platform/paths.h"
#include "platform/text_case.h"

namespace folder_device {

namespace {

// The module that this code lies in.
HMODULE ThisDll() {
    HMODULE module = nullptr;
    GetModuleHandleExW(GET_MODULE_HANDLE_EX_FLAG_FROM_ADDRESS | GET_MODULE_HANDLE_EX_FLAG_UNCHANGED_REFCOUNT,
                       reinterpret_cast<LPCWSTR>(&ThisDll), &module);
    return module;
}

const std::wstring& DllFolder() {
    static const std::wstring folder = [] {
        std::wstring path(0x8000, L'\0');
        path.resize(GetModuleFileNameW(ThisDll(), path.data(), static_cast<DWORD>(path.size())));
        return path.substr(0, path.find_last_of(L'\\'));
    }();
    return folder;
}

constexpr std::wstring_view kEnvironmentPrefix = L"FOLDER_DEVICE_";

IniSection FromEnvironment() {
    const std::unique_ptr<wchar_t, decltype(&FreeEnvironmentStringsW)> block(GetEnvironmentStringsW(),
                                                                             &FreeEnvironmentStringsW);
    if (block == nullptr) {
        throw std::bad_alloc();
    }
    IniSection section;
    const wchar_t* variable = block.get();
    while (*variable != L'\0') {
        const std::wstring_view text = variable;
        const std::size_t equals = text.find(L'=', 1);  // The system's own variables begin with "=".
        if (equals != std::wstring_view::npos &&
            orvane::EqualIgnoringCase(text.substr(0, kEnvironmentPrefix.size()), kEnvironmentPrefix)) {
            section.values.emplace_back(
                text.substr(kEnvironmentPrefix.size(), equals - kEnvironmentPrefix.size()),
                text.substr(equals + 1));
        }
        variable += text.size() + 1;
    }
    return section;
}

std::wstring FromIni(const IniText& ini, std::wstring_view name) {
    std::wstring text;
    for (const IniSection& section : ini) {
        if (orvane::EqualIgnoringCase(section.name, L"folder_device")) {
            text = FindValue(section, name).value_or(text);
        }
    }
    return text;
}

// `Function[#n][@path]=value`, where the function may be "*" and is one of those that the DLL exports.
std::optional<CallRule> ParseRule(std::wstring_view text) {
    CallRule rule;
    const std::size_t equals = text.rfind(L'=');
    if (equals == std::wstring_view::npos) {
        return std::nullopt;
    }
    const auto value = ParseNumber(Trim(text.substr(equals + 1)));
    std::wstring_view target = text.substr(0, equals);
    if (const std::size_t at = target.find(L'@'); at != std::wstring_view::npos) {
        rule.path = Trim(target.substr(at + 1));
        target = target.substr(0, at);
    }
    if (const std::size_t hash = target.find(L'#'); hash != std::wstring_view::npos) {
        rule.nth = ParseNumber(Trim(target.substr(hash + 1))).value_or(0);
        if (rule.nth == 0) {
            return std::nullopt;
        }
        target = target.substr(0, hash);
    }
    rule.function = ToUtf8(Trim(target));
    if (rule.function == "*") {
        rule.function.clear();
    } else if (GetProcAddress(ThisDll(), rule.function.c_str()) == nullptr) {
        return std::nullopt;
    }
    rule.value = static_cast<DWORD>(value.value_or(0));
    return value && *value <= MAXDWORD ? std::optional(rule) : std::nullopt;
}

}  // namespace

std::optional<CallRule> ParseRefusal(std::wstring_view text) {
    std::optional<CallRule> rule = ParseRule(text);
    return rule && rule->value != ERROR_SUCCESS ? rule : std::nullopt;
}

std::optional<CallRule> ParseByteCount(std::wstring_view text) {
    std::optional<CallRule> rule = ParseRule(text);
    return rule && (rule->function == "CeReadFile" || rule->function == "CeWriteFile") ? rule : std::nullopt;
}

// `folder|name[|option,option]`; the name is taken with every blank.
std::optional<ExtraEntry> ParseExtraEntry(std::wstring_view piece) {
    const std::vector<std::wstring_view> parts = Split(piece, L'|');
    ExtraEntry entry;
    if (parts.size() < 2 || parts.size() > 3 || parts[1].size() >= MAX_PATH) {
        return std::nullopt;
    }
    entry.folder = Trim(parts[0]);
    entry.name = parts[1];
    if (parts.size() == 3) {
        for (const std::wstring_view raw : Split(parts[2], L',')) {
            const std::wstring_view option = Trim(raw);
            if (option == L"folder") {
                entry.is_folder = true;
            } else if (option == L"unterminated") {
                entry.unterminated = true;
            } else if (option.starts_with(L"size=") && ParseNumber(option.substr(5))) {
                entry.size = *ParseNumber(option.substr(5));
            } else {
                return std::nullopt;
            }
        }
    }
    return entry.folder.starts_with(L'\\') ? std::optional(entry) : std::nullopt;
}

SettingTexts SettingTexts::Read() {
    SettingTexts texts;
    texts.environment_ = FromEnvironment();
    texts.ini_ = ReadIniFile(DllFolder() + L"\\folder_device.ini");
    texts.understood_ = texts.ini_.has_value();  // What it would say must not be taken for unsaid.
    return texts;
}

std::wstring SettingTexts::Text(const wchar_t* name) const {
    return ini_ ? FindValue(environment_, name).value_or(FromIni(*ini_, name)) : std::wstring();
}

std::wstring SettingTexts::Path(const wchar_t* name, const wchar_t* otherwise) const {
    std::wstring path = Text(name);
    if (path.empty()) {
        path = otherwise;
    }
    if (path.empty()) {
        return path;
    }
    if (!path.starts_with(L"\\\\") && (path.size() < 2 || path[1] != L':')) {
        path = DllFolder() + L"\\" + path;
    } else if (path.size() == 2) {
        path += L'\\';  // "E:" alone would be the drive's current folder.
    }
    std::wstring full(GetFullPathNameW(path.c_str(), 0, nullptr, nullptr), L'\0');
    full.resize(GetFullPathNameW(path.c_str(), static_cast<DWORD>(full.size()), full.data(), nullptr));
    return full;
}

std::optional<std::uint64_t> SettingTexts::Number(const wchar_t* name, std::uint64_t limit) {
    const std::wstring text = Text(name);
    const auto number = ParseNumber(text);
    understood_ = understood_ && (text.empty() || (number && *number <= limit));
    return number;
}

DWORD SettingTexts::Dword(const wchar_t* name) {
    return static_cast<DWORD>(Number(name, MAXDWORD).value_or(0));
}

DWORD SettingTexts::Delay(const wchar_t* name) {
    return Text(name) == L"never" ? INFINITE : Dword(name);
}

std::int64_t SettingTexts::Seconds(const wchar_t* name) {
    // A thousand years either way keep every sum far inside a FILETIME.
    constexpr std::uint64_t kLimit = 1000ULL * 366 * 86400;
    const std::wstring whole = Text(name);
    std::wstring_view text = whole;
    if (text.empty()) {
        return 0;
    }
    const bool negative = text.front() == L'-';
    if (negative || text.front() == L'+') {
        text.remove_prefix(1);
    }
    const auto seconds = ParseNumber(text);
    if (!seconds || *seconds > kLimit) {
        understood_ = false;
        return 0;
    }
    return static_cast<std::int64_t>(*seconds) * (negative ? -10'000'000 : 10'000'000);
}

HRESULT SettingTexts::Failure(const wchar_t* name) {
    const auto result = static_cast<HRESULT>(Dword(name));
    // A success that is not S_OK would look like a fault that is set and does nothing.
    understood_ = understood_ && result <= 0;
    return result;
}

// The form that is not held to 260 characters and whose names the system takes as they stand.
std::wstring Settings::RootPath(std::wstring path) {
    if (!path.starts_with(L"\\\\")) {
        path = L"\\\\?\\" + path;
    } else if (!path.starts_with(L"\\\\?\\") && !path.starts_with(L"\\\\.\\")) {
        path = L"\\\\?\\UNC" + path.substr(1);
    }
    path.resize(orvane::WithoutTrailingBackslashes(path).size());
    return path;
}

}  // namespace folder_device
