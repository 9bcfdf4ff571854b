#include "folder_device/device.h"

#include <exception>

namespace folder_device {

namespace {

// Written while the DLL is loaded and unloaded only.
Device* the_device = nullptr;

}  // namespace

Device& Device::Get() {
    return *the_device;
}

void Device::ReadSettings() {
    const std::scoped_lock lock(settings_mutex_);
    if (sessions.AnyInProcess()) {
        return;
    }
    handles.CloseAll();
    std::shared_ptr<Configuration> configuration = Current();
    if (SettingTexts texts = SettingTexts::Read();
        !configuration->IsUsable() || !configuration->settings.texts.SaysTheSame(texts)) {
        configuration = std::make_shared<Configuration>(std::move(texts));
    }
    configuration->times.LookAtVolume();
    storage.Recount(configuration->settings.root, configuration->settings.capacity);
    configuration_ = std::move(configuration);
}

bool Device::OpenSession(rapi::InitRecord& record, HRESULT result, DWORD delay) {
    const std::scoped_lock lock(settings_mutex_);
    return sessions.Open(record, result, delay);
}

bool Device::CloseSession() {
    const std::scoped_lock lock(settings_mutex_);
    const bool closed = sessions.Close();
    if (closed && !sessions.AnyInProcess()) {
        handles.CloseAll();
    }
    return closed;
}

}  // namespace folder_device

// Runs under the loader lock. Nothing here waits for a thread, loads a library or takes a lock that is held
// over such a thing. At the end of the process nothing is done: the system closes what is open, and threads
// that were ended while they held a lock must not be waited for.
BOOL WINAPI DllMain(HINSTANCE /*module*/, DWORD reason, LPVOID process_ends) {
    using folder_device::the_device;
    switch (reason) {
        case DLL_PROCESS_ATTACH:
            try {
                the_device = new folder_device::Device;
            } catch (const std::exception&) {
                return FALSE;
            }
            break;
        case DLL_THREAD_DETACH:
            the_device->sessions.EndThread();
            break;
        case DLL_PROCESS_DETACH:
            if (process_ends == nullptr) {
                delete the_device;
            }
            break;
        default:
            break;
    }
    return TRUE;
}
