#include <windows.h>

#include <cstdio>

#include "benchmark/cases.h"
#include "benchmark/dialog_thread.h"
#include "benchmark/json_line.h"
#include "benchmark/stopwatch.h"

namespace orvane::bench {

namespace {

constexpr int kRuns = 7;
constexpr DWORD kEndLimitMs = 10'000;

// The synchronization dialog of that process; null as long as it has none.
HWND MainWindowOf(DWORD process) {
    HWND window = FindWindowW(L"Qel_Orvanelink", nullptr);
    DWORD owner = 0;
    GetWindowThreadProcessId(window, &owner);
    return owner == process ? window : nullptr;
}

// Whether the window is in view and neither it nor a window in it has anything left to paint.
bool IsPainted(HWND window) {
    if (!IsWindowVisible(window) || GetUpdateRect(window, nullptr, FALSE)) {
        return false;
    }
    const auto go_on_if_painted = [](HWND child, LPARAM) -> BOOL {
        return !IsWindowVisible(child) || !GetUpdateRect(child, nullptr, FALSE);
    };
    return EnumChildWindows(window, go_on_if_painted, 0) != FALSE;
}

// A program of its own, ended with the object.
class Program {
  public:
    explicit Program(std::wstring command_line) {
        STARTUPINFOW startup{};
        startup.cb = sizeof startup;
        CreateProcessW(nullptr, command_line.data(), nullptr, nullptr, FALSE, 0, nullptr, nullptr, &startup,
                       &process_);
    }
    ~Program() {
        PostMessageW(MainWindowOf(process_.dwProcessId), WM_CLOSE, 0, 0);
        if (!HasEnded(kEndLimitMs)) {
            TerminateProcess(process_.hProcess, 1);
        }
        CloseHandle(process_.hThread);
        CloseHandle(process_.hProcess);
    }
    Program(const Program&) = delete;
    Program& operator=(const Program&) = delete;

    // Also true of a program that could not be started.
    bool HasEnded(DWORD limit_ms) const {
        return WaitForSingleObject(process_.hProcess, limit_ms) != WAIT_TIMEOUT;
    }
    DWORD Id() const { return process_.dwProcessId; }

  private:
    PROCESS_INFORMATION process_{};
};

}  // namespace

bool RunStart(const std::wstring& program) {
    for (int run = 0; run < kRuns; ++run) {
        const LONGLONG start = Now();
        const Program started(L'"' + program + L'"');
        bool is_painted = false;
        WaitUntil([&] {
            HWND window = MainWindowOf(started.Id());
            is_painted = window != nullptr && IsPainted(window);
            return is_painted || started.HasEnded(0);
        });
        const LONGLONG painted = Now();
        if (!is_painted) {
            std::fputs("the program did not show its window\n", stderr);
            return false;
        }
        JsonLine line;
        line.Add("painted_ms", Milliseconds(painted - start));
        line.Print();
    }
    return true;
}

}  // namespace orvane::bench
