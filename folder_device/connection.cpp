#include "folder_device/connection.h"

namespace folder_device {

struct Connection::Delayed {
    std::shared_ptr<Connection> connection;
    HRESULT result;
    DWORD delay;
    HMODULE module;  // A reference of this thread's own.
};

std::shared_ptr<Connection> Connection::Begin(rapi::InitRecord& record, HRESULT result, DWORD delay) {
    auto connection = std::make_shared<Connection>();
    connection->event_ = Own<OwnedHandle>(CreateEventW(nullptr, TRUE, FALSE, nullptr));
    if (!connection->event_) {
        return nullptr;
    }
    connection->record_ = &record;
    record.init_event = connection->event_.get();
    record.init_result = E_PENDING;
    if (delay == 0) {
        connection->Complete(result);
    } else if (delay != INFINITE) {
        connection->ended_ = Own<OwnedHandle>(CreateEventW(nullptr, TRUE, FALSE, nullptr));
        auto delayed = std::make_unique<Delayed>(Delayed{connection, result, delay, nullptr});
        if (!connection->ended_ ||
            !GetModuleHandleExW(GET_MODULE_HANDLE_EX_FLAG_FROM_ADDRESS,
                                reinterpret_cast<LPCWSTR>(&WaitAndComplete), &delayed->module)) {
            return nullptr;
        }
        const auto thread =
            Own<OwnedHandle>(CreateThread(nullptr, 0, &WaitAndComplete, delayed.get(), 0, nullptr));
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
        if (WaitForSingleObject(delayed->connection->ended_.get(), delayed->delay) == WAIT_TIMEOUT) {
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
        SetEvent(event_.get());
    }
}

void Connection::End() {
    const std::scoped_lock lock(mutex_);
    record_ = nullptr;
    event_.reset();
    up_ = false;
    if (ended_) {
        SetEvent(ended_.get());
    }
}

}  // namespace folder_device
