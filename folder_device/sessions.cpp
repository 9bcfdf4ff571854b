#include "folder_device/sessions.h"

#include <algorithm>

namespace folder_device {

struct Connection::Delayed {
    std::shared_ptr<Connection> connection;
    HRESULT result;
    DWORD delay;
    HMODULE module;  // A reference of this thread's own.
};

std::shared_ptr<Connection> Connection::Begin(rapi::InitRecord& record, HRESULT result, DWORD delay) {
    auto connection = std::make_shared<Connection>();
    connection->event_ = orvane::NewManualResetEvent();
    if (!connection->event_) {
        return nullptr;
    }
    connection->record_ = &record;
    record.init_event = connection->event_.Get();
    record.init_result = E_PENDING;
    if (delay == 0) {
        connection->Complete(result);
    } else if (delay != INFINITE) {
        connection->ended_ = orvane::NewManualResetEvent();
        auto delayed = std::make_unique<Delayed>(Delayed{connection, result, delay, nullptr});
        if (!connection->ended_ ||
            !GetModuleHandleExW(GET_MODULE_HANDLE_EX_FLAG_FROM_ADDRESS,
                                reinterpret_cast<LPCWSTR>(&WaitAndComplete), &delayed->module)) {
            return nullptr;
        }
        const orvane::UniqueThread thread(
            CreateThread(nullptr, 0, &WaitAndComplete, delayed.get(), 0, nullptr));
        if (!thread) {
            FreeLibrary(delayed->module);
            return nullptr;
        }
        static_cast<void>(delayed.release());  // The thread's own now.
    }
    return connection;
}

DWORD WINAPI Connection::WaitAndComplete(void* parameter) {
    HMODULE module = nullptr;
    {
        const std::unique_ptr<Delayed> delayed(static_cast<Delayed*>(parameter));
        module = delayed->module;
        // Ends after the delay at the latest.
        if (WaitForSingleObject(delayed->connection->ended_.Get(), delayed->delay) == WAIT_TIMEOUT) {
            delayed->connection->Complete(delayed->result);
        }
    }
    FreeLibraryAndExitThread(module, 0);
}

void Connection::Complete(HRESULT result) {
    const std::scoped_lock lock(mutex_);
    if (record_ != nullptr) {
        record_->init_result = result;
        up_ = SUCCEEDED(result);
        SetEvent(event_.Get());
    }
}

void Connection::End() {
    const std::scoped_lock lock(mutex_);
    record_ = nullptr;
    event_.Reset();
    up_ = false;
    if (ended_) {
        SetEvent(ended_.Get());
    }
}

void Sessions::Open(std::shared_ptr<Connection> connection) {
    const std::scoped_lock lock(mutex_);
    sessions_.push_back({GetCurrentThreadId(), std::move(connection)});
}

bool Sessions::Close() {
    const std::scoped_lock lock(mutex_);
    const auto youngest =
        std::find_if(sessions_.rbegin(), sessions_.rend(),
                     [thread = GetCurrentThreadId()](const Session& s) { return s.thread == thread; });
    if (youngest == sessions_.rend()) {
        return false;
    }
    youngest->connection->End();
    sessions_.erase(std::next(youngest).base());
    return true;
}

void Sessions::EndThread() {
    while (Close()) {
    }
}

std::size_t Sessions::Count() const {
    const std::scoped_lock lock(mutex_);
    return static_cast<std::size_t>(
        std::count_if(sessions_.begin(), sessions_.end(),
                      [thread = GetCurrentThreadId()](const Session& s) { return s.thread == thread; }));
}

bool Sessions::IsConnected() const {
    const std::scoped_lock lock(mutex_);
    return std::any_of(sessions_.begin(), sessions_.end(), [thread = GetCurrentThreadId()](const Session& s) {
        return s.thread == thread && s.connection->IsUp();
    });
}

bool Sessions::AnyInProcess() const {
    const std::scoped_lock lock(mutex_);
    return !sessions_.empty();
}

void Sessions::EndAll() {
    const std::scoped_lock lock(mutex_);
    for (const Session& session : sessions_) {
        session.connection->End();
    }
    sessions_.clear();
}

}  // namespace folder_device
