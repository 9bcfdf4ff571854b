// Owned Windows handles. Each kind has a traits class that carries its invalid value and its closer, so
// that the type of a member says who closes what. Raw handles elsewhere in the program never own.
#pragma once

#include <windows.h>

#include <commctrl.h>

#include <utility>

namespace orvane {

// Owns one handle of the kind that `Traits` describes; move-only; closes it at the end or on Reset.
template <class Traits>
class UniqueHandle {
  public:
    using Type = typename Traits::Type;

    UniqueHandle() noexcept = default;
    explicit UniqueHandle(Type handle) noexcept : handle_(handle) {}
    UniqueHandle(UniqueHandle&& other) noexcept : handle_(other.Release()) {}
    UniqueHandle& operator=(UniqueHandle&& other) noexcept {
        if (this != &other) {
            Reset(other.Release());
        }
        return *this;
    }
    ~UniqueHandle() { Reset(); }

    Type Get() const noexcept { return handle_; }
    explicit operator bool() const noexcept { return handle_ != Traits::Invalid(); }

    // Closes the handle that is held and takes over `handle`.
    void Reset(Type handle = Traits::Invalid()) noexcept {
        if (handle_ != Traits::Invalid()) {
            Traits::Close(handle_);
        }
        handle_ = handle;
    }
    // Gives the handle up unclosed: the caller owns it from here.
    [[nodiscard]] Type Release() noexcept { return std::exchange(handle_, Traits::Invalid()); }
    // Closes the handle that is held and gives the place for an out parameter to fill.
    Type* Receive() noexcept {
        Reset();
        return &handle_;
    }

  private:
    Type handle_ = Traits::Invalid();
};

namespace handle_traits {

struct Kernel {
    using Type = HANDLE;
    static Type Invalid() noexcept { return nullptr; }
    static void Close(Type handle) noexcept { CloseHandle(handle); }
};
struct File {
    using Type = HANDLE;
    static Type Invalid() noexcept { return INVALID_HANDLE_VALUE; }
    static void Close(Type handle) noexcept { CloseHandle(handle); }
};
struct Find {
    using Type = HANDLE;
    static Type Invalid() noexcept { return INVALID_HANDLE_VALUE; }
    static void Close(Type handle) noexcept { FindClose(handle); }
};
struct RegistryKey {
    using Type = HKEY;
    static Type Invalid() noexcept { return nullptr; }
    static void Close(Type handle) noexcept { RegCloseKey(handle); }
};
struct Icon {
    using Type = HICON;
    static Type Invalid() noexcept { return nullptr; }
    static void Close(Type handle) noexcept { DestroyIcon(handle); }
};
struct Menu {
    using Type = HMENU;
    static Type Invalid() noexcept { return nullptr; }
    static void Close(Type handle) noexcept { DestroyMenu(handle); }
};
struct ImageList {
    using Type = HIMAGELIST;
    static Type Invalid() noexcept { return nullptr; }
    static void Close(Type handle) noexcept { ImageList_Destroy(handle); }
};
template <class GdiType>
struct Gdi {
    using Type = GdiType;
    static Type Invalid() noexcept { return nullptr; }
    static void Close(Type handle) noexcept { DeleteObject(handle); }
};
struct MemoryDc {
    using Type = HDC;
    static Type Invalid() noexcept { return nullptr; }
    static void Close(Type handle) noexcept { DeleteDC(handle); }
};

}  // namespace handle_traits

using UniqueEvent = UniqueHandle<handle_traits::Kernel>;
using UniqueThread = UniqueHandle<handle_traits::Kernel>;
using UniqueFile = UniqueHandle<handle_traits::File>;
using UniqueFind = UniqueHandle<handle_traits::Find>;
using UniqueRegistryKey = UniqueHandle<handle_traits::RegistryKey>;
using UniqueIcon = UniqueHandle<handle_traits::Icon>;
using UniqueMenu = UniqueHandle<handle_traits::Menu>;
using UniqueImageList = UniqueHandle<handle_traits::ImageList>;
using UniqueBrush = UniqueHandle<handle_traits::Gdi<HBRUSH>>;
using UniqueBitmap = UniqueHandle<handle_traits::Gdi<HBITMAP>>;
using UniqueMemoryDc = UniqueHandle<handle_traits::MemoryDc>;

// A new event of the kind that all cancel events are: manual-reset, not signalled, unnamed. Empty when the
// system has none left.
inline UniqueEvent NewManualResetEvent() {
    return UniqueEvent(CreateEventW(nullptr, TRUE, FALSE, nullptr));
}

// Whether the event is signalled now. No event at all counts as not signalled.
inline bool IsSignalled(HANDLE event) {
    return event != nullptr && WaitForSingleObject(event, 0) == WAIT_OBJECT_0;
}

}  // namespace orvane
