// The settings of the folder device. Each has one name, used in the environment as FOLDER_DEVICE_<NAME> and
// in section [folder_device] of folder_device.ini beside the DLL; the environment wins. An empty text is the
// setting's default. docs/folder_device.md describes every setting for its user.
#pragma once

#include <windows.h>

#include <cstdint>
#include <limits>
#include <optional>
#include <string>
#include <vector>

#include "folder_device/ini_text.h"

namespace folder_device {

// One rule for calls: `Function#n@path=value`.
struct CallRule {
    std::string function;   // As exported. Empty: every function that reaches the device.
    std::uint64_t nth = 0;  // Counted from 1 among the calls that match; 0: every one of them.
    std::wstring path;      // Empty: on any path.
    DWORD value = 0;  // An error, or an HRESULT for the functions that return one; or a number of bytes.
};

// One made-up entry of a listing: `folder|name|options`.
struct ExtraEntry {
    std::wstring folder;
    std::wstring name;
    bool is_folder = false;
    bool unterminated = false;  // The name is repeated until the record's 260 characters are full.
    std::uint64_t size = 0;
};

// Nothing for a text that is no such rule: a value that is an error, a number of bytes for CeReadFile or
// CeWriteFile.
std::optional<CallRule> ParseRefusal(std::wstring_view text);
std::optional<CallRule> ParseByteCount(std::wstring_view text);
std::optional<ExtraEntry> ParseExtraEntry(std::wstring_view piece);

// Looks settings up by name. It keeps what the environment and the ini file say, and whether the file and
// every text that was asked for were understood.
class SettingTexts {
  public:
    // Before anything is read: all texts are empty, and that is not understood.
    SettingTexts() = default;
    // The environment and the ini file as they are now.
    static SettingTexts Read();

    bool Understood() const { return understood_; }
    // Whether the same configuration comes out of both, so that the counters of faults go on. Nothing is
    // parsed for that, as it is asked at every session.
    bool SaysTheSame(const SettingTexts& other) const {
        return environment_ == other.environment_ && ini_ == other.ini_;
    }

    std::wstring Text(const wchar_t* name) const;
    // A full path, relative ones from the folder of the DLL; empty when there is no text and no default.
    std::wstring Path(const wchar_t* name, const wchar_t* otherwise) const;
    std::optional<std::uint64_t> Number(const wchar_t* name, std::uint64_t limit);
    DWORD Dword(const wchar_t* name);
    // Milliseconds; INFINITE for "never".
    DWORD Delay(const wchar_t* name);
    // Signed seconds, in 100-ns units.
    std::int64_t Seconds(const wchar_t* name);
    // An HRESULT that is a failure, else S_OK.
    HRESULT Failure(const wchar_t* name);
    // What stands between ";", each piece as `parse` takes it.
    template <class Item>
    std::vector<Item> List(const wchar_t* name, std::optional<Item> (*parse)(std::wstring_view)) {
        std::vector<Item> items;
        const std::wstring text = Text(name);
        for (const std::wstring_view piece : Split(text, L';')) {
            if (!Trim(piece).empty()) {
                std::optional<Item> item = parse(piece);
                understood_ = understood_ && item.has_value();
                items.push_back(std::move(item).value_or(Item{}));
            }
        }
        return items;
    }

  private:
    IniSection environment_;      // The names without their common beginning.
    std::optional<IniText> ini_;  // Nothing when it could not be read.
    bool understood_ = false;
};

// All of them: what is read here is all there is. `texts` is the first, because the others come out of it.
struct Settings {
    explicit Settings(SettingTexts source) : texts(std::move(source)) {}

    SettingTexts texts;
    // In the "\\?\" form, without a trailing "\".
    std::wstring root = RootPath(texts.Path(L"ROOT", L"device"));
    std::wstring registry_file = texts.Path(L"REGISTRY", L"folder_device_registry.ini");
    std::wstring trace_file = texts.Path(L"TRACE", L"");
    // Bytes. Half of the range, so that sums with file sizes cannot overflow.
    std::optional<std::uint64_t> capacity =
        texts.Number(L"CAPACITY", std::numeric_limits<std::uint64_t>::max() / 2);
    std::int64_t clock_offset = texts.Seconds(L"CLOCK_OFFSET");
    DWORD call_delay = texts.Dword(L"CALL_DELAY");
    DWORD connect_delay = texts.Delay(L"CONNECT_DELAY");
    HRESULT init_result = texts.Failure(L"INIT_RESULT");
    HRESULT connect_result = texts.Failure(L"CONNECT_RESULT");
    std::vector<CallRule> refuse = texts.List(L"REFUSE", ParseRefusal);
    std::vector<CallRule> lose_reply = texts.List(L"LOSE_REPLY", ParseRefusal);
    std::vector<CallRule> fall_short = texts.List(L"SHORT", ParseByteCount);
    // Numbers of calls that reach the device, counted from 1; 0: no such call.
    DWORD fail_call = texts.Dword(L"FAIL_CALL");
    DWORD lose_call = texts.Dword(L"LOSE_CALL");
    DWORD end_process = texts.Dword(L"END_PROCESS");
    DWORD vanish = texts.Dword(L"VANISH");
    DWORD vanish_delay = texts.Dword(L"VANISH_DELAY");
    std::vector<ExtraEntry> extra_entries = texts.List(L"EXTRA_ENTRIES", ParseExtraEntry);
    std::optional<std::uint64_t> found_count = texts.Number(L"FOUND_COUNT", MAXDWORD);
    bool found_null = texts.Number(L"FOUND_NULL", 1) == 1U;

  private:
    static std::wstring RootPath(std::wstring full_path);
};

}  // namespace folder_device
