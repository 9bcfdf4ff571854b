// The device's storage: how many bytes its files may hold and how many they do. Without a capacity nothing
// is counted and nobody waits. With one the bytes are counted each time that the settings are read, because
// the files, or the whole card, may have been changed past the device since; then they are kept up with every
// change, so that a write costs the same however many files there are.
#pragma once

#include <cstdint>
#include <mutex>
#include <optional>
#include <string>

namespace folder_device {

class StorageAccount {
  public:
    // Takes the capacity (none: unlimited) and counts the sizes of all files below `root` against it. Only
    // while no session is open.
    void Recount(const std::wstring& root, std::optional<std::uint64_t> capacity);

    bool Limited() const { return capacity_.has_value(); }
    std::uint64_t Capacity() const { return capacity_.value_or(0); }
    std::uint64_t Free();

  private:
    friend class StorageChange;

    std::uint64_t FreeLocked() const { return used_ < *capacity_ ? *capacity_ - used_ : 0; }

    std::optional<std::uint64_t> capacity_;
    std::mutex mutex_;
    std::uint64_t used_ = 0;
};

// One change of the files' sizes: while it lives, no other change is made on a limited storage.
class StorageChange {
  public:
    explicit StorageChange(StorageAccount& account)
        : account_(account), lock_(account.mutex_, std::defer_lock) {
        if (account_.Limited()) {
            lock_.lock();
        }
    }

    // Whether sizes are needed at all: an unlimited storage has room for everything.
    bool Limited() const { return lock_.owns_lock(); }
    // Whether a file may go from one size to the other.
    bool HasRoom(std::uint64_t old_size, std::uint64_t new_size) const {
        return !Limited() || new_size <= old_size || new_size - old_size <= account_.FreeLocked();
    }
    // Books that it has done so.
    void Book(std::uint64_t old_size, std::uint64_t new_size) {
        if (Limited()) {
            account_.used_ += new_size;
            account_.used_ -= old_size < account_.used_ ? old_size : account_.used_;
        }
    }

  private:
    StorageAccount& account_;
    std::unique_lock<std::mutex> lock_;
};

// The file's size; 0 for a folder and where there is nothing.
std::uint64_t FileSizeAt(const std::wstring& pc_path);

}  // namespace folder_device
