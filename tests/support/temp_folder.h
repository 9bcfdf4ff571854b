// A folder of its own for one test, and the few file operations that tests need.
#pragma once

#include <windows.h>

#include <optional>
#include <string>
#include <string_view>
#include <vector>

namespace orvane::testing {

// Creates an empty folder below the user's temporary folder and removes it, with all it holds, at the end.
class TempFolder {
  public:
    TempFolder();
    ~TempFolder();
    TempFolder(const TempFolder&) = delete;
    TempFolder& operator=(const TempFolder&) = delete;

    // The folder's absolute path, without a trailing "\".
    const std::wstring& Path() const { return path_; }
    // The path of `relative` (no leading "\") in the folder.
    std::wstring operator/(std::wstring_view relative) const;

  private:
    std::wstring path_;
};

// Creates the folder with every missing parent.
void MakeFolder(const std::wstring& path);
// Writes the file, creating its folder where that is missing; with a last-write time if one is given.
void WriteTextFile(const std::wstring& path, std::string_view content,
                   std::optional<FILETIME> last_write = std::nullopt);
// Makes a link of the test system's own at `path` that leads to `target`. False where there are none.
bool MakeLink(const std::wstring& path, const std::wstring& target);
// The file's content; nothing when it cannot be opened.
std::optional<std::string> ReadTextFile(const std::wstring& path);
bool Exists(const std::wstring& path);
// The file's last-write time, 0 when it cannot be had.
FILETIME LastWriteTime(const std::wstring& path);
// Every file and folder below `folder`, as relative paths with "\" between, folders with "\" at their end,
// in the order of their names.
std::vector<std::wstring> ListTree(const std::wstring& folder);

// 100-ns units since 1601, in and out of a FILETIME.
FILETIME FileTimeOf(ULONGLONG ticks);
ULONGLONG TicksOf(const FILETIME& time);
// The file time of a calendar time in UTC.
FILETIME UtcTime(int year, int month, int day, int hour = 0, int minute = 0, int second = 0);
FILETIME AddSeconds(const FILETIME& time, int seconds);

}  // namespace orvane::testing
