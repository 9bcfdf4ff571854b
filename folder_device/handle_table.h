// What the device's handles stand for. A handle is a number of our own that is never used twice in a
// process: a handle closed already, one of another kind and any handle of the PC are recognised and refused.
// All members may be called from any thread; an object lives until its handle is closed and the last call
// that works on it has returned.
#pragma once

#include <windows.h>

#include <cstdint>
#include <memory>
#include <mutex>
#include <string>
#include <unordered_map>
#include <vector>

#include "rapi/remote_api.h"

namespace folder_device {

// What is open. The kinds (files, searches, keys) are known to those who open them only.
struct Object {
    explicit Object(std::wstring opened_path) : path(std::move(opened_path)) {}
    Object(const Object&) = delete;
    Object& operator=(const Object&) = delete;
    virtual ~Object() = default;

    const std::wstring path;  // Device path, pattern or key that was opened.
    std::mutex mutex;         // Guards what the kinds change after they are made.
};

class HandleTable {
  public:
    HANDLE Add(std::shared_ptr<Object> object) {
        const std::scoped_lock lock(mutex_);
        next_ += 4;
        objects_.emplace(next_, std::move(object));
        return reinterpret_cast<HANDLE>(next_);
    }
    // The object of that kind; null for a number that is not an open handle of such a one.
    template <class Kind = Object>
    std::shared_ptr<Kind> Find(HANDLE handle) {
        const std::scoped_lock lock(mutex_);
        const auto found = objects_.find(reinterpret_cast<std::uintptr_t>(handle));
        return found == objects_.end() ? nullptr : std::dynamic_pointer_cast<Kind>(found->second);
    }
    // Closes the handle if it is open and of that kind; 0 or ERROR_INVALID_HANDLE.
    template <class Kind>
    DWORD Close(HANDLE handle) {
        const std::shared_ptr<Kind> closed = Find<Kind>(handle);  // Ends after the lock: closing takes time.
        const std::scoped_lock lock(mutex_);
        return closed != nullptr && objects_.erase(reinterpret_cast<std::uintptr_t>(handle)) != 0
                   ? ERROR_SUCCESS
                   : ERROR_INVALID_HANDLE;
    }
    void CloseAll() {
        std::unordered_map<std::uintptr_t, std::shared_ptr<Object>> closed;
        const std::scoped_lock lock(mutex_);
        closed.swap(objects_);
    }

  private:
    std::mutex mutex_;
    std::unordered_map<std::uintptr_t, std::shared_ptr<Object>> objects_;
    // Far from the small numbers that the PC's own handles are.
    std::uintptr_t next_ = 0x7A000000;
};

// The buffers that CeFindAllFiles has given out. They outlive sessions: only CeRapiFreeBuffer frees them.
class BufferTable {
  public:
    // Takes the records over and gives their address.
    rapi::FindData* Add(std::vector<rapi::FindData> records) {
        rapi::FindData* const buffer = records.data();
        const std::scoped_lock lock(mutex_);
        buffers_.emplace(buffer, std::move(records));
        return buffer;
    }
    // False for an address that was not given out or is freed already.
    bool Free(const void* buffer) {
        const std::scoped_lock lock(mutex_);
        return buffers_.erase(buffer) != 0;
    }

  private:
    std::mutex mutex_;
    std::unordered_map<const void*, std::vector<rapi::FindData>> buffers_;
};

}  // namespace folder_device
