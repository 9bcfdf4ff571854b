#include "folder_device/device.h"

#include <algorithm>
#include <exception>

namespace folder_device {

namespace {

// Written while the DLL is loaded and unloaded only.
Device* the_device = nullptr;

std::wstring FolderOf(HMODULE module) {
    std::wstring path(MAX_PATH, L'\0');
    for (;;) {
        const DWORD size = GetModuleFileNameW(module, path.data(), static_cast<DWORD>(path.size()));
        if (size < path.size()) {
            path.resize(size);
            return path.substr(0, path.find_last_of(L'\\'));
        }
        path.resize(path.size() * 2);
    }
}

}  // namespace

bool ThreadState::IsConnected() const {
    return std::any_of(sessions.begin(), sessions.end(),
                       [](const std::shared_ptr<Connection>& session) { return session->IsUp(); });
}

Device::Device(std::wstring dll_folder, DWORD slot)
    : dll_folder_(std::move(dll_folder)),
      slot_(slot),
      configuration_(std::make_shared<Configuration>(std::nullopt, std::nullopt)) {}

Device::~Device() {
    for (const std::unique_ptr<ThreadState>& thread : threads_) {
        for (const std::shared_ptr<Connection>& session : thread->sessions) {
            session->End();
        }
    }
    TlsFree(slot_);
}

bool Device::Start(HMODULE module) {
    const DWORD slot = TlsAlloc();
    if (slot == TLS_OUT_OF_INDEXES) {
        return false;
    }
    try {
        the_device = new Device(FolderOf(module), slot);
    } catch (const std::exception&) {
        TlsFree(slot);
        return false;
    }
    return true;
}

void Device::Stop() {
    delete the_device;
    the_device = nullptr;
}

Device& Device::Get() {
    return *the_device;
}

ThreadState& Device::Thread() {
    auto* state = static_cast<ThreadState*>(TlsGetValue(slot_));
    if (state == nullptr) {
        auto made = std::make_unique<ThreadState>();
        state = made.get();
        const std::scoped_lock lock(threads_mutex_);
        threads_.push_back(std::move(made));
        TlsSetValue(slot_, state);
    }
    return *state;
}

void Device::EndThread() {
    auto* const state = static_cast<ThreadState*>(TlsGetValue(slot_));
    if (state == nullptr) {
        return;
    }
    for (const std::shared_ptr<Connection>& session : state->sessions) {
        session->End();
    }
    open_sessions_ -= state->sessions.size();
    const std::scoped_lock lock(threads_mutex_);
    std::erase_if(threads_,
                  [state](const std::unique_ptr<ThreadState>& thread) { return thread.get() == state; });
}

void Device::ReadSettings() {
    const std::scoped_lock lock(sessions_mutex_);
    if (open_sessions_ != 0) {
        return;
    }
    handles.CloseAll();
    std::optional<SettingTexts> texts = ReadSettingTexts(dll_folder_);
    std::shared_ptr<Configuration> configuration = Current();
    if (!configuration->IsUsable() || configuration->texts != texts) {
        std::optional<Settings> settings = texts ? ParseSettings(*texts, dll_folder_) : std::nullopt;
        configuration = std::make_shared<Configuration>(std::move(texts), std::move(settings));
    }
    storage.Recount(configuration->settings.root, configuration->settings.capacity);
    configuration_ = std::move(configuration);
}

void Device::OpenSession(std::shared_ptr<Connection> connection) {
    ThreadState& thread = Thread();
    const std::scoped_lock lock(sessions_mutex_);
    thread.sessions.push_back(std::move(connection));
    ++open_sessions_;
}

bool Device::CloseSession() {
    ThreadState& thread = Thread();
    if (thread.sessions.empty()) {
        return false;
    }
    thread.sessions.back()->End();
    thread.sessions.pop_back();
    const std::scoped_lock lock(sessions_mutex_);
    if (--open_sessions_ == 0) {
        handles.CloseAll();
    }
    return true;
}

}  // namespace folder_device
