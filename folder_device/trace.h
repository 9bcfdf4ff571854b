// The call trace: one line per call, handed to the system at once, so that the lines of a killed process
// are there. UTF-8, "\n" at the end of a line, seven columns with tabs between:
//
//   number  thread  sessions  function  arguments  result  error
//
// The number counts the lines of the process from 1. Sessions are those of the calling thread when the call
// ends. Arguments are joined with " | ", numbers hexadecimal, a handle followed by the path that it is open
// on. The result is what the function returned, the error a Win32 code or an HRESULT, 0 after a success.
// Control characters in the arguments are written as "?".
#pragma once

#include <windows.h>

#include <algorithm>
#include <cstdint>
#include <cstdio>
#include <mutex>
#include <string>

#include "folder_device/ini_text.h"
#include "platform/handles.h"

namespace folder_device {

// "0x" and lower-case digits.
inline std::wstring HexText(std::uint64_t number) {
    char text[20];
    return {text,
            text + std::snprintf(text, sizeof(text), "0x%llx", static_cast<unsigned long long>(number))};
}

struct TraceEntry {
    std::string_view function;
    std::size_t sessions;
    std::wstring arguments;
    std::uint64_t result;
    DWORD error;
};

class Trace {
  public:
    // Appends to the file at `path`, or traces nothing when it is empty. IsOpen tells whether that worked.
    explicit Trace(const std::wstring& path) {
        if (!path.empty()) {
            file_.Reset(CreateFileW(path.c_str(), FILE_APPEND_DATA,
                                    FILE_SHARE_READ | FILE_SHARE_WRITE | FILE_SHARE_DELETE, nullptr,
                                    OPEN_ALWAYS, FILE_ATTRIBUTE_NORMAL, nullptr));
        }
    }

    bool IsOpen() const { return static_cast<bool>(file_); }

    void Write(TraceEntry entry) {
        static std::uint64_t lines_written = 0;  // By all traces of the process: the mutex is one, too.
        static std::mutex mutex;
        std::replace_if(
            entry.arguments.begin(), entry.arguments.end(), [](wchar_t c) { return c < L' '; }, L'?');
        const std::wstring error =
            entry.error < 0x80000000U ? std::to_wstring(entry.error) : HexText(entry.error);
        const std::wstring line = L"\t" + std::to_wstring(GetCurrentThreadId()) + L"\t" +
                                  std::to_wstring(entry.sessions) + L"\t" +
                                  std::wstring(entry.function.begin(), entry.function.end()) + L"\t" +
                                  entry.arguments + L"\t" + HexText(entry.result) + L"\t" + error + L"\n";
        const std::scoped_lock lock(mutex);
        const std::string bytes = ToUtf8(std::to_wstring(++lines_written) + line);
        DWORD written = 0;
        WriteFile(file_.Get(), bytes.data(), static_cast<DWORD>(bytes.size()), &written, nullptr);
    }

  private:
    orvane::UniqueFile file_;
};

}  // namespace folder_device
