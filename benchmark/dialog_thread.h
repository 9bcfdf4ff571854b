// A real dialog on a thread of its own, driven by messages as a user would drive it.
#pragma once

#include <windows.h>

#include <commctrl.h>

#include <atomic>
#include <string>
#include <thread>

#include "benchmark/call_timer.h"
#include "settings/settings_store.h"

namespace orvane::bench {

// Asks for a condition every millisecond until it holds; false when it does not within five minutes.
template <class Condition>
bool WaitUntil(Condition condition) {
    const ULONGLONG end = GetTickCount64() + 300'000;
    while (!condition()) {
        if (GetTickCount64() >= end) {
            return false;
        }
        Sleep(1);
    }
    return true;
}

// `Dialog` is a dialog of the program with an IsReady that any thread may ask: true once the dialog has been
// initialised. It is made on its thread and lives as long as its window.
template <class Dialog>
class DialogThread {
  public:
    // Returns when the dialog is ready or has ended.
    DialogThread()
        : thread_([this] {
              IgnoreWaitsOfThisThread();
              const INITCOMMONCONTROLSEX controls = {sizeof(INITCOMMONCONTROLSEX), ICC_WIN95_CLASSES};
              InitCommonControlsEx(&controls);
              Dialog dialog;
              dialog_ = &dialog;
              dialog.DoModal();
              ended_ = true;
          }) {
        WaitUntil([this] { return ended_ || (dialog_ != nullptr && Get().IsReady()); });
    }
    // Closes the dialog.
    ~DialogThread() {
        if (!ended_) {
            PostMessageW(Window(), WM_COMMAND, IDCANCEL, 0);
        }
        thread_.join();
    }
    DialogThread(const DialogThread&) = delete;
    DialogThread& operator=(const DialogThread&) = delete;

    bool HasEnded() const { return ended_; }
    HWND Window() const { return Get().Handle(); }
    HWND Item(int id) const { return GetDlgItem(Window(), id); }
    Dialog& Get() const { return *dialog_.load(); }

  private:
    std::atomic<Dialog*> dialog_{nullptr};
    std::atomic<bool> ended_{false};
    std::thread thread_;
};

// Gives this process a registry of its own with settings for the two job folders: all types take part, older
// files are overwritten, no questions.
inline void UseBenchSettings(const std::wstring& pc_folder, bool with_backup) {
    HKEY key = nullptr;
    RegDeleteTreeW(HKEY_CURRENT_USER, L"Software\\orvane_bench");
    RegCreateKeyExW(HKEY_CURRENT_USER, L"Software\\orvane_bench", 0, nullptr, REG_OPTION_NON_VOLATILE,
                    KEY_ALL_ACCESS, nullptr, &key, nullptr);
    RegOverridePredefKey(HKEY_CURRENT_USER, key);
    RegCloseKey(key);
    const auto set = [](const wchar_t* name, const std::wstring& text) {
        RegWriteString(HKEY_CURRENT_USER, L"Software\\Veltrano\\CE Devices", name, text);
    };
    set(L"SyncPath_DT", pc_folder);
    set(L"SyncPath_CE", L"\\Jobs\\");
    set(L"Sync_qvj_files", L"1");
    set(L"Overwrite_old_files", L"1");
    set(L"Overwrite_bkp", with_backup ? L"1" : L"0");
    set(L"Overwrite_warn", L"0");
    set(L"Start_File_View", L"0");
}

}  // namespace orvane::bench
