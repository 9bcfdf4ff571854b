// The one device of a process: its configuration, its sessions, its open handles and its storage.
//
// Sessions belong to threads. Settings are read whenever a session opens while none is open in the process;
// within a session they never change. When the last session of the process ends, the device closes every
// handle that was left open. A thread that ends takes its sessions with it.
#pragma once

#include <windows.h>

#include <atomic>
#include <memory>
#include <mutex>
#include <string>
#include <vector>

#include "folder_device/connection.h"
#include "folder_device/faults.h"
#include "folder_device/handle_table.h"
#include "folder_device/settings.h"
#include "folder_device/storage_account.h"
#include "folder_device/trace.h"

namespace folder_device {

// What the settings' texts made: it lives with its counters as long as it is usable and no text
// changes.
struct Configuration {
    // No texts: they could not be read. Nothing parsed: they could not be understood.
    explicit Configuration(std::optional<SettingTexts> setting_texts, std::optional<Settings> parsed)
        : texts(std::move(setting_texts)),
          understood(parsed.has_value()),
          settings(std::move(parsed).value_or(Settings{})),
          faults(settings),
          trace(settings.trace_file) {}

    // Whether sessions may open: every text was read and understood and the trace, if one is wanted, is open.
    bool IsUsable() const { return understood && (settings.trace_file.empty() || trace.IsOpen()); }

    const std::optional<SettingTexts> texts;
    const bool understood;
    const Settings settings;
    Faults faults;
    Trace trace;
};

// One thread's view of the device. Only that thread uses it.
struct ThreadState {
    DWORD last_error = ERROR_SUCCESS;
    HRESULT rapi_error = S_OK;
    std::vector<std::shared_ptr<Connection>> sessions;

    bool IsConnected() const;
};

class Device {
  public:
    // Made when the DLL is loaded, gone when it is unloaded. `module` tells where the DLL lies.
    static bool Start(HMODULE module);
    static void Stop();
    static Device& Get();

    // The calling thread's state, made on its first call.
    ThreadState& Thread();
    // The calling thread ends. Takes no lock that is held over anything but memory.
    void EndThread();

    std::shared_ptr<Configuration> Current() const { return configuration_.load(); }
    // Reads the settings and counts the storage anew if no session is open in the process. Throws when memory
    // runs out, and the settings stay what they were.
    void ReadSettings();
    // Adds a session to the calling thread, and takes the last one away: false when it has none.
    void OpenSession(std::shared_ptr<Connection> connection);
    bool CloseSession();

    HandleTable handles;
    BufferTable buffers;
    StorageAccount storage;

  private:
    explicit Device(std::wstring dll_folder, DWORD slot);
    ~Device();

    const std::wstring dll_folder_;
    const DWORD slot_;  // Holds the address of each thread's state.
    std::atomic<std::shared_ptr<Configuration>> configuration_;
    std::mutex sessions_mutex_;
    std::atomic<std::size_t> open_sessions_{0};  // Grows under the mutex only; a thread's end just lowers it.
    std::mutex threads_mutex_;
    std::vector<std::unique_ptr<ThreadState>> threads_;
};

}  // namespace folder_device
