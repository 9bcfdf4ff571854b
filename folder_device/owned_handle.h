// A PC handle that is closed with its owner. Null is "none"; INVALID_HANDLE_VALUE becomes null.
#pragma once

#include <windows.h>

#include <memory>

namespace folder_device {

struct HandleCloser {
    using pointer = HANDLE;
    void operator()(HANDLE handle) const noexcept { CloseHandle(handle); }
};
using OwnedHandle = std::unique_ptr<HANDLE, HandleCloser>;

struct FindCloser {
    using pointer = HANDLE;
    void operator()(HANDLE handle) const noexcept { FindClose(handle); }
};
using OwnedFind = std::unique_ptr<HANDLE, FindCloser>;

template <class Owned>
Owned Own(HANDLE handle) noexcept {
    return Owned(handle == INVALID_HANDLE_VALUE ? nullptr : handle);
}

}  // namespace folder_device
