// The gate that every call of an entry point passes, one object per call, made first and gone last.
//
// A call that reaches the device (Run) is, in this order: refused outside of a connected session of its
// thread (ERROR_NOT_CONNECTED), delayed, refused when the device has vanished
// (ERROR_DEVICE_NOT_CONNECTED), refused when a rule says so, and carried out. The first and third kind are
// transport failures: CeRapiGetError answers them with the HRESULT of the code, and every other call with
// S_OK, also when it failed on the device. A call that stays on the PC (RunLocal) can only be refused by a
// rule that names its function. Every failure sets the thread's device error, which CeGetLastError gives, in
// a session and outside; a success leaves it alone, except where a function is known to set it (Note).
#pragma once

#include <windows.h>

#include <array>
#include <cstdint>
#include <exception>
#include <memory>
#include <string>
#include <type_traits>

#include "folder_device/device.h"
#include "folder_device/functions.h"

namespace folder_device {

// One argument, as the trace shows it and as rules for paths look at it.
struct Argument {
    Argument() = default;
    Argument(const wchar_t* path) : text(path), kind(Kind::kText) {}
    Argument(const void* handle) : number(reinterpret_cast<std::uintptr_t>(handle)), kind(Kind::kHandle) {}
    Argument(DWORD value) : number(value) {}
    Argument(LONG value) : Argument(static_cast<DWORD>(value)) {}

    enum class Kind { kText, kHandle, kNumber };
    const wchar_t* text = nullptr;
    std::uintptr_t number = 0;
    Kind kind = Kind::kNumber;
};

// Gives what `body` answers or, when memory or another means of the system has run out, `exhausted`. Nothing
// but std::exception is thrown in the DLL, and nothing may leave it.
template <class Body, class Result>
Result Guarded(Body body, Result exhausted) noexcept {
    try {
        return body();
    } catch (const std::exception&) {
        return exhausted;
    }
}

class Call {
  public:
    static constexpr std::size_t kMaxArguments = 5;

    template <class... Arguments>
    explicit Call(Function function, Arguments... arguments) noexcept
        : device_(Device::Get()),
          thread_(*Guarded([this] { return &device_.Thread(); }, &spare_thread_)),
          configuration_(device_.Current()),
          function_(function),
          arguments_{Argument(arguments)...},
          argument_count_(sizeof...(arguments)) {
        static_assert(sizeof...(arguments) <= kMaxArguments);
        if (configuration_->trace.IsOpen()) {
            argument_text_ = Guarded([this] { return ArgumentText(); }, std::wstring(L"?"));
        }
    }
    ~Call();
    Call(const Call&) = delete;
    Call& operator=(const Call&) = delete;

    Device& TheDevice() const { return device_; }
    const Settings& TheSettings() const { return configuration_->settings; }
    Configuration& TheConfiguration() const { return *configuration_; }
    ThreadState& TheThread() const { return thread_; }

    // Passes the gate and carries out `body`, which answers a Win32 code. Gives that code or the gate's.
    template <class Body>
    DWORD Run(Body body) {
        error_ = Guarded(
            [&]() -> DWORD {
                const DWORD refusal = EnterDevice();
                return refusal != ERROR_SUCCESS ? refusal : body();
            },
            static_cast<DWORD>(ERROR_NOT_ENOUGH_MEMORY));
        if (error_ != ERROR_SUCCESS) {
            thread_.last_error = error_;
        }
        return error_;
    }
    // The same for a call that stays on the PC and answers an HRESULT.
    template <class Body>
    HRESULT RunLocal(Body body) {
        const HRESULT result = Guarded(
            [&]() -> HRESULT {
                const HRESULT refusal = EnterLocal();
                return FAILED(refusal) ? refusal : body();
            },
            static_cast<HRESULT>(E_OUTOFMEMORY));
        LeaveLocal(result);
        return result;
    }
    // Sets the device error of a call that succeeds.
    void Note(DWORD error) { thread_.last_error = error; }
    // Passes the function's result through, for the trace.
    template <class T>
    T Return(T result) {
        if constexpr (std::is_pointer_v<T>) {
            result_ = reinterpret_cast<std::uintptr_t>(result);
        } else {
            result_ = static_cast<std::make_unsigned_t<T>>(result);
        }
        return result;
    }
    // The whole of a call that answers TRUE or FALSE.
    template <class Body>
    BOOL RunBool(Body body) {
        return Return<BOOL>(Run(body) == ERROR_SUCCESS ? TRUE : FALSE);
    }

  private:
    DWORD EnterDevice();
    HRESULT EnterLocal();
    void LeaveLocal(HRESULT result);
    DWORD Refusal(bool reaches_device);
    bool IsOnPath(const std::wstring& path) const;
    std::wstring ArgumentText() const;

    Device& device_;
    ThreadState spare_thread_;  // Without a session, for a thread whose state found no memory.
    ThreadState& thread_;
    const std::shared_ptr<Configuration> configuration_;
    const Function function_;
    const std::array<Argument, kMaxArguments> arguments_;
    const std::size_t argument_count_;
    std::wstring argument_text_;  // Taken before the call: it may close the handle that it names.
    std::uint64_t result_ = 0;
    DWORD error_ = ERROR_SUCCESS;
};

// A device error as an HRESULT; a code that is one already stays as it is.
inline HRESULT ToHresult(DWORD error) {
    return error >= 0x80000000U ? static_cast<HRESULT>(error) : HRESULT_FROM_WIN32(error);
}

}  // namespace folder_device
