#include "folder_device/handle_table.h"

namespace folder_device {

HANDLE HandleTable::Add(std::shared_ptr<Object> object) {
    const std::scoped_lock lock(mutex_);
    next_ += 4;
    objects_.emplace(next_, std::move(object));
    return reinterpret_cast<HANDLE>(next_);
}

std::shared_ptr<Object> HandleTable::Find(HANDLE handle) {
    const std::scoped_lock lock(mutex_);
    const auto found = objects_.find(reinterpret_cast<std::uintptr_t>(handle));
    return found == objects_.end() ? nullptr : found->second;
}

bool HandleTable::Remove(HANDLE handle) {
    std::shared_ptr<Object> removed;  // Ends after the lock: closing a file takes its time.
    const std::scoped_lock lock(mutex_);
    const auto found = objects_.find(reinterpret_cast<std::uintptr_t>(handle));
    if (found == objects_.end()) {
        return false;
    }
    removed = std::move(found->second);
    objects_.erase(found);
    return true;
}

void HandleTable::CloseAll() {
    std::unordered_map<std::uintptr_t, std::shared_ptr<Object>> closed;
    const std::scoped_lock lock(mutex_);
    closed.swap(objects_);
}

rapi::FindData* BufferTable::Add(std::vector<rapi::FindData> records) {
    rapi::FindData* const buffer = records.data();
    const std::scoped_lock lock(mutex_);
    buffers_.emplace(buffer, std::move(records));
    return buffer;
}

bool BufferTable::Free(const void* buffer) {
    const std::scoped_lock lock(mutex_);
    return buffers_.erase(buffer) != 0;
}

}  // namespace folder_device
