#include "folder_device/settings.h"

#include <algorithm>
#include <iterator>
#include <limits>

#include "folder_device/ini_text.h"
#include "folder_device/text.h"

namespace folder_device {

namespace {

enum Setting : std::size_t {
    kRoot,
    kRegistry,
    kTrace,
    kCapacity,
    kClockOffset,
    kCallDelay,
    kConnectDelay,
    kInitResult,
    kConnectResult,
    kRefuse,
    kVanish,
    kExtraEntries,
    kFoundCount,
    kFoundNull,
};

constexpr const wchar_t* kNames[] = {L"ROOT",           L"REGISTRY",   L"TRACE",         L"CAPACITY",
                                     L"CLOCK_OFFSET",   L"CALL_DELAY", L"CONNECT_DELAY", L"INIT_RESULT",
                                     L"CONNECT_RESULT", L"REFUSE",     L"VANISH",        L"EXTRA_ENTRIES",
                                     L"FOUND_COUNT",    L"FOUND_NULL"};
static_assert(std::size(kNames) == kSettingCount);

std::optional<std::wstring> ReadEnvironment(const wchar_t* setting) {
    const std::wstring name = std::wstring(L"FOLDER_DEVICE_") + setting;
    std::wstring text;
    for (;;) {
        SetLastError(ERROR_SUCCESS);
        const DWORD size =
            GetEnvironmentVariableW(name.c_str(), text.data(), static_cast<DWORD>(text.size()));
        if (size == 0 && GetLastError() == ERROR_ENVVAR_NOT_FOUND) {
            return std::nullopt;
        }
        const bool complete = size < text.size() || size == 0;
        text.resize(size);
        if (complete) {
            return text;
        }
    }
}

bool IsAbsolute(const std::wstring& path) {
    return path.starts_with(L"\\\\") || (path.size() >= 2 && path[1] == L':');
}

std::wstring FullPath(const std::wstring& path, const std::wstring& dll_folder) {
    std::wstring from = IsAbsolute(path) ? path : dll_folder + L"\\" + path;
    if (from.size() == 2) {
        from += L'\\';  // "E:" alone would be the drive's current folder.
    }
    std::wstring full(GetFullPathNameW(from.c_str(), 0, nullptr, nullptr), L'\0');
    full.resize(GetFullPathNameW(from.c_str(), static_cast<DWORD>(full.size()), full.data(), nullptr));
    return full;
}

// The form that is not held to 260 characters and whose names the system takes as they stand.
std::wstring ExtendedPath(const std::wstring& full_path) {
    std::wstring path = full_path;
    if (path.starts_with(L"\\\\") && !path.starts_with(L"\\\\?\\") && !path.starts_with(L"\\\\.\\")) {
        path = L"\\\\?\\UNC" + path.substr(1);
    } else if (!path.starts_with(L"\\\\")) {
        path = L"\\\\?\\" + path;
    }
    while (!path.empty() && path.back() == L'\\') {
        path.pop_back();
    }
    return path;
}

// Reads one setting each into its place; `ok` tells in the end whether all texts were understood.
class Reader {
  public:
    explicit Reader(const SettingTexts& texts) : texts_(texts) {}

    void Number(Setting setting, std::uint64_t limit, std::optional<std::uint64_t>& value) {
        if (!texts_[setting].empty()) {
            const auto number = ParseNumber(texts_[setting]);
            ok_ = ok_ && number && *number <= limit;
            value = number;
        }
    }
    template <class T>
    void Number(Setting setting, T& value) {
        std::optional<std::uint64_t> number;
        Number(setting, std::numeric_limits<std::make_unsigned_t<T>>::max(), number);
        if (number) {
            value = static_cast<T>(*number);
        }
    }
    void Seconds(Setting setting, std::int64_t& ticks) {
        // A thousand years either way keep every sum far inside a FILETIME.
        constexpr std::uint64_t kLimit = 1000ULL * 366 * 86400;
        std::wstring_view text = texts_[setting];
        const bool negative = text.starts_with(L'-');
        if (negative || text.starts_with(L'+')) {
            text.remove_prefix(1);
        } else if (text.empty()) {
            return;
        }
        const auto number = ParseNumber(text);
        ok_ = ok_ && number && *number <= kLimit;
        ticks = static_cast<std::int64_t>(ok_ ? *number : 0) * (negative ? -10'000'000 : 10'000'000);
    }
    template <class Item, class Parse>
    void List(Setting setting, std::vector<Item>& items, Parse parse) {
        for (const std::wstring_view piece : Split(texts_[setting], L';')) {
            if (Trim(piece).empty()) {
                continue;
            }
            std::optional<Item> item = parse(piece);
            ok_ = ok_ && item.has_value();
            items.push_back(item.value_or(Item{}));
        }
    }
    bool Ok() const { return ok_; }

  private:
    const SettingTexts& texts_;
    bool ok_ = true;
};

// `Function[#n][@path]=error`, where the function may be "*".
std::optional<RefuseRule> ParseRefuse(std::wstring_view piece) {
    RefuseRule rule;
    const std::wstring_view text = Trim(piece);
    const std::size_t equals = text.rfind(L'=');
    if (equals == std::wstring_view::npos) {
        return std::nullopt;
    }
    const auto error = ParseNumber(Trim(text.substr(equals + 1)));
    std::wstring_view target = Trim(text.substr(0, equals));
    if (!error || *error == 0 || *error > MAXDWORD) {
        return std::nullopt;
    }
    rule.error = static_cast<DWORD>(*error);
    if (const std::size_t at = target.find(L'@'); at != std::wstring_view::npos) {
        rule.path = Trim(target.substr(at + 1));
        target = Trim(target.substr(0, at));
    }
    if (const std::size_t hash = target.find(L'#'); hash != std::wstring_view::npos) {
        const auto nth = ParseNumber(target.substr(hash + 1));
        if (!nth || *nth == 0) {
            return std::nullopt;
        }
        rule.nth = *nth;
        target = Trim(target.substr(0, hash));
    }
    rule.function = FunctionOf(target);
    return rule.function || target == L"*" ? std::optional(rule) : std::nullopt;
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

}  // namespace

std::optional<SettingTexts> ReadSettingTexts(const std::wstring& dll_folder) {
    const std::optional<IniText> ini = ReadIniFile(dll_folder + L"\\folder_device.ini");
    if (!ini) {
        return std::nullopt;
    }
    SettingTexts texts;
    for (std::size_t i = 0; i < kSettingCount; ++i) {
        for (const IniSection& section : *ini) {
            const std::wstring* text =
                EqualNoCase(section.name, L"folder_device") ? FindValue(section, kNames[i]) : nullptr;
            texts[i] = text != nullptr ? *text : texts[i];
        }
        texts[i] = ReadEnvironment(kNames[i]).value_or(texts[i]);
    }
    return texts;
}

std::optional<Settings> ParseSettings(const SettingTexts& texts, const std::wstring& dll_folder) {
    Settings settings;
    Reader reader(texts);
    settings.root = ExtendedPath(FullPath(texts[kRoot].empty() ? L"device" : texts[kRoot], dll_folder));
    settings.registry_file =
        FullPath(texts[kRegistry].empty() ? L"folder_device_registry.ini" : texts[kRegistry], dll_folder);
    if (!texts[kTrace].empty()) {
        settings.trace_file = FullPath(texts[kTrace], dll_folder);
    }
    // Half of the range, so that sums with file sizes cannot overflow.
    reader.Number(kCapacity, std::numeric_limits<std::uint64_t>::max() / 2, settings.capacity);
    reader.Seconds(kClockOffset, settings.clock_offset);
    reader.Number(kCallDelay, settings.call_delay);
    if (texts[kConnectDelay] == L"never") {
        settings.connect_delay = INFINITE;
    } else {
        reader.Number(kConnectDelay, settings.connect_delay);
    }
    reader.Number(kInitResult, settings.init_result);
    reader.Number(kConnectResult, settings.connect_result);
    reader.List(kRefuse, settings.refuse, ParseRefuse);
    reader.Number(kVanish, settings.vanish_at);
    reader.List(kExtraEntries, settings.extra_entries, ParseExtraEntry);
    std::optional<std::uint64_t> found_count;
    reader.Number(kFoundCount, MAXDWORD, found_count);
    if (found_count) {
        settings.found_count = static_cast<DWORD>(*found_count);
    }
    std::optional<std::uint64_t> found_null;
    reader.Number(kFoundNull, 1, found_null);
    settings.found_null = found_null == 1U;
    // A success that is not S_OK would look like a fault that is set and does nothing.
    if (settings.init_result > 0 || settings.connect_result > 0) {
        return std::nullopt;
    }
    return reader.Ok() ? std::optional(std::move(settings)) : std::nullopt;
}

}  // namespace folder_device
