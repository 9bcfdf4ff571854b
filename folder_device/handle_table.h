// What the device's handles stand for. A handle is a number of our own that is never used twice in a
// process: a handle closed already, one of another kind and any handle of the PC are recognised and refused.
// All members may be called from any thread; an object lives until its handle is closed and the last call
// that works on it has returned.
#pragma once

#include <windows.h>

#include <cstdint>
#include <memory>
#include <mutex>
#include <optional>
#include <string>
#include <unordered_map>
#include <vector>

#include "folder_device/owned_handle.h"
#include "folder_device/registry_text.h"
#include "rapi/remote_api.h"

namespace folder_device {

struct Object {
    explicit Object(std::wstring opened_path) : path(std::move(opened_path)) {}
    Object(const Object&) = delete;
    Object& operator=(const Object&) = delete;
    virtual ~Object() = default;

    const std::wstring path;  // Device path, pattern or key that was opened.
    std::mutex mutex;         // Guards what the kinds below change after they are made.
};

struct FileObject : Object {
    FileObject(std::wstring opened_path, OwnedHandle opened_file, DWORD granted_access)
        : Object(std::move(opened_path)), file(std::move(opened_file)), access(granted_access) {}

    const OwnedHandle file;
    const DWORD access;
    // Set through this handle, and then kept against later writes through it.
    std::optional<FILETIME> explicit_last_write;
};

struct SearchObject : Object {
    SearchObject(std::wstring pattern, std::vector<rapi::FindData> entries)
        : Object(std::move(pattern)), found(std::move(entries)) {}

    const std::vector<rapi::FindData> found;
    std::size_t next = 1;  // CeFindFirstFile gave out the first.
};

struct KeyObject : Object {
    KeyObject(std::wstring key, std::shared_ptr<const RegistryText> text)
        : Object(std::move(key)), registry(std::move(text)) {}

    const std::shared_ptr<const RegistryText> registry;
};

class HandleTable {
  public:
    HANDLE Add(std::shared_ptr<Object> object);
    // The object of any kind; null for a number that is not an open handle.
    std::shared_ptr<Object> Find(HANDLE handle);
    // The object of that kind, else null.
    template <class Kind>
    std::shared_ptr<Kind> FindKind(HANDLE handle) {
        return std::dynamic_pointer_cast<Kind>(Find(handle));
    }
    // Closes the handle if it is open and of that kind; 0 or ERROR_INVALID_HANDLE.
    template <class Kind>
    DWORD Close(HANDLE handle) {
        const std::shared_ptr<Kind> object = FindKind<Kind>(handle);
        return object != nullptr && Remove(handle) ? ERROR_SUCCESS : ERROR_INVALID_HANDLE;
    }
    void CloseAll();

  private:
    bool Remove(HANDLE handle);

    std::mutex mutex_;
    std::unordered_map<std::uintptr_t, std::shared_ptr<Object>> objects_;
    // Far from the small numbers that the PC's own handles are.
    std::uintptr_t next_ = 0x7A000000;
};

// The buffers that CeFindAllFiles has given out. They outlive sessions: only CeRapiFreeBuffer frees them.
class BufferTable {
  public:
    // Takes the records over and gives their address.
    rapi::FindData* Add(std::vector<rapi::FindData> records);
    // False for an address that was not given out or is freed already.
    bool Free(const void* buffer);

  private:
    std::mutex mutex_;
    std::unordered_map<const void*, std::vector<rapi::FindData>> buffers_;
};

}  // namespace folder_device
