// The one device of a process: its configuration, its sessions, its open handles and its storage.
//
// Settings are read whenever a session opens while none is open in the process; within a session they never
// change. When the last session of the process ends, the device closes every handle that was left open. A
// thread that ends takes its sessions with it.
#pragma once

#include <windows.h>

#include <atomic>
#include <memory>
#include <mutex>

#include "folder_device/device_times.h"
#include "folder_device/faults.h"
#include "folder_device/handle_table.h"
#include "folder_device/sessions.h"
#include "folder_device/settings.h"
#include "folder_device/storage_account.h"
#include "folder_device/trace.h"

namespace folder_device {

// What the settings' texts made: it lives with its counters as long as it is usable and no text changes.
struct Configuration {
    explicit Configuration(SettingTexts texts) : settings(std::move(texts)) {}
    Configuration(const Configuration&) = delete;
    Configuration& operator=(const Configuration&) = delete;

    // Whether sessions may open: every text was read and understood and the trace, if one is wanted, is open.
    bool IsUsable() const {
        return settings.texts.Understood() && (settings.trace_file.empty() || trace.IsOpen());
    }

    const Settings settings;
    Faults faults{settings};
    DeviceTimes times{settings.root, settings.clock_offset};
    Trace trace{settings.trace_file};
};

class Device {
  public:
    static Device& Get();

    std::shared_ptr<Configuration> Current() const { return configuration_.load(); }
    // Reads the settings and counts the storage anew if no session is open in the process. Throws when memory
    // runs out, and the settings stay what they were.
    void ReadSettings();
    // As those of Sessions, in one step with what follows from them.
    bool OpenSession(rapi::InitRecord& record, HRESULT result, DWORD delay);
    bool CloseSession();

    Sessions sessions;
    HandleTable handles;
    BufferTable buffers;
    StorageAccount storage;

  private:
    std::atomic<std::shared_ptr<Configuration>> configuration_{
        std::make_shared<Configuration>(SettingTexts())};
    std::mutex settings_mutex_;  // Held while sessions are counted and what follows from it is done.
};

}  // namespace folder_device
