#include "tests/support/temp_folder.h"

#include <gtest/gtest.h>

#include <algorithm>
#include <atomic>
#include <chrono>
#include <filesystem>
#include <fstream>
#include <iterator>

#include "platform/file_time.h"
#include "platform/handles.h"

namespace orvane::testing {

namespace fs = std::filesystem;

namespace {

// Removes the folder, given in the "\\?\" form: only so do paths beyond 260 characters and names such as
// "a." go, on which the standard library's removal fails or never ends.
void RemoveTree(const std::wstring& folder) {
    WIN32_FIND_DATAW entry;
    const HANDLE search = FindFirstFileW((folder + L"\\*").c_str(), &entry);
    if (search != INVALID_HANDLE_VALUE) {
        do {
            const std::wstring_view name = entry.cFileName;
            const std::wstring path = folder + L"\\" + entry.cFileName;
            const bool is_link = (entry.dwFileAttributes & FILE_ATTRIBUTE_REPARSE_POINT) != 0;
            if ((entry.dwFileAttributes & FILE_ATTRIBUTE_DIRECTORY) == 0) {
                SetFileAttributesW(path.c_str(), FILE_ATTRIBUTE_NORMAL);
                DeleteFileW(path.c_str());
            } else if (is_link) {
                RemoveDirectoryW(path.c_str());
            } else if (name != L"." && name != L"..") {
                RemoveTree(path);
            }
        } while (FindNextFileW(search, &entry));
        FindClose(search);
    }
    RemoveDirectoryW(folder.c_str());
}

}  // namespace

TempFolder::TempFolder() {
    // Never a name that was there before: what an ended test program has left under it might only now go
    // away. Process ids come again, the time does not.
    static std::atomic<int> count{0};
    static const std::wstring run =
        std::to_wstring(GetCurrentProcessId()) + L"_" +
        std::to_wstring(std::chrono::system_clock::now().time_since_epoch().count()) + L"_";
    path_ = fs::temp_directory_path() / (L"orvane_test_" + run + std::to_wstring(++count));
    EXPECT_TRUE(fs::create_directories(path_));
}

TempFolder::~TempFolder() {
    RemoveTree(L"\\\\?\\" + path_);
}

std::wstring TempFolder::operator/(std::wstring_view relative) const {
    return path_ + L"\\" + std::wstring(relative);
}

void MakeFolder(const std::wstring& path) {
    fs::create_directories(path);
}

void WriteTextFile(const std::wstring& path, std::string_view content, std::optional<FILETIME> last_write) {
    fs::create_directories(fs::path(path).parent_path());
    const UniqueFile file(
        CreateFileW(path.c_str(), GENERIC_WRITE, 0, nullptr, CREATE_ALWAYS, FILE_ATTRIBUTE_NORMAL, nullptr));
    DWORD written = 0;
    EXPECT_TRUE(WriteFile(file.Get(), content.data(), static_cast<DWORD>(content.size()), &written, nullptr));
    EXPECT_TRUE(!last_write || SetFileTime(file.Get(), nullptr, nullptr, &*last_write));
}

bool MakeLink(const std::wstring& path, const std::wstring& target) {
    using UnixName = char*(CDECL*)(const wchar_t*);  // Wine's own: the path as the host system has it.
    const auto unix_name = reinterpret_cast<UnixName>(
        reinterpret_cast<void*>(GetProcAddress(GetModuleHandleW(L"kernel32"), "wine_get_unix_file_name")));
    if (unix_name == nullptr) {
        return false;
    }
    std::wstring command = L"ln -s";
    for (const std::wstring& each : {target, path}) {
        char* name = unix_name(each.c_str());
        command += L" \"" + std::filesystem::path(name).wstring() + L"\"";
        HeapFree(GetProcessHeap(), 0, name);
    }
    STARTUPINFOW start{};
    start.cb = sizeof(start);
    PROCESS_INFORMATION process{};
    if (!CreateProcessW(L"\\\\?\\unix\\bin\\ln", command.data(), nullptr, nullptr, FALSE, 0, nullptr, nullptr,
                        &start, &process)) {
        return false;
    }
    WaitForSingleObject(process.hProcess, INFINITE);
    CloseHandle(process.hThread);
    CloseHandle(process.hProcess);
    return true;
}

std::optional<std::string> ReadTextFile(const std::wstring& path) {
    std::ifstream file(fs::path(path), std::ios::binary);
    return file ? std::optional(std::string(std::istreambuf_iterator<char>(file), {})) : std::nullopt;
}

bool Exists(const std::wstring& path) {
    return GetFileAttributesW(path.c_str()) != INVALID_FILE_ATTRIBUTES;
}

FILETIME LastWriteTime(const std::wstring& path) {
    WIN32_FILE_ATTRIBUTE_DATA data{};
    GetFileAttributesExW(path.c_str(), GetFileExInfoStandard, &data);
    return data.ftLastWriteTime;
}

std::vector<std::wstring> ListTree(const std::wstring& folder) {
    std::vector<std::wstring> names;
    std::error_code missing;
    for (const auto& entry : fs::recursive_directory_iterator(folder, missing)) {
        std::wstring name = entry.path().wstring().substr(folder.size() + 1);
        names.push_back(entry.is_directory() ? name + L"\\" : name);
    }
    std::sort(names.begin(), names.end());
    return names;
}

FILETIME FileTimeOf(ULONGLONG ticks) {
    return LaterBy({}, static_cast<std::int64_t>(ticks));
}

ULONGLONG TicksOf(const FILETIME& time) {
    return static_cast<ULONGLONG>(FileTimeTicks(time));
}

FILETIME UtcTime(int year, int month, int day, int hour, int minute, int second) {
    const auto word = [](int value) { return static_cast<WORD>(value); };
    const SYSTEMTIME fields{word(year), word(month), 0, word(day), word(hour), word(minute), word(second), 0};
    FILETIME time{};
    EXPECT_TRUE(SystemTimeToFileTime(&fields, &time));
    return time;
}

FILETIME AddSeconds(const FILETIME& time, int seconds) {
    return LaterBy(time, seconds * 10'000'000LL);
}

}  // namespace orvane::testing
