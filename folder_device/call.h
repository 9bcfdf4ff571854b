// The 28 exported functions, declared with the types that the Remote API's description gives them, so that
// the compiler holds every definition to the binary interface; and the gate that every call of one passes,
// one object per call, made first and gone last. What each function accepts and refuses is told where it is
// defined.
//
// A call that reaches the device (Run) is, in this order: refused outside of a connected session of its
// thread (ERROR_NOT_CONNECTED), delayed, refused when the device has vanished
// (ERROR_DEVICE_NOT_CONNECTED), refused when a fault says so, and carried out, though its reply may be lost.
// The first and third kind are transport failures: CeRapiGetError answers them with the HRESULT of the code,
// and every other call with S_OK, also when it failed on the device. A call that stays on the PC (RunLocal)
// can only be refused by a rule that names its function. Every failure sets the thread's device error, which
// CeGetLastError gives, in a session and outside; a success leaves it alone, except where a function is known
// to set it (Note).
#pragma once

#include <windows.h>

#include <array>
#include <cstdint>
#include <exception>
#include <memory>
#include <string>
#include <string_view>
#include <type_traits>

#include "folder_device/device.h"
#include "rapi/remote_api.h"

extern "C" {
rapi::CeCloseHandle CeCloseHandle;
rapi::CeCopyFile CeCopyFile;
rapi::CeCreateDirectory CeCreateDirectory;
rapi::CeCreateFile CeCreateFile;
rapi::CeDeleteFile CeDeleteFile;
rapi::CeFindAllFiles CeFindAllFiles;
rapi::CeFindClose CeFindClose;
rapi::CeFindFirstFile CeFindFirstFile;
rapi::CeFindNextFile CeFindNextFile;
rapi::CeRapiFreeBuffer CeRapiFreeBuffer;
rapi::CeGetDiskFreeSpaceEx CeGetDiskFreeSpaceEx;
rapi::CeRapiGetError CeRapiGetError;
rapi::CeGetFileSize CeGetFileSize;
rapi::CeGetFileTime CeGetFileTime;
rapi::CeGetLastError CeGetLastError;
rapi::CeGetVersionEx CeGetVersionEx;
rapi::CeRapiInitEx CeRapiInitEx;
rapi::CeRapiInvoke CeRapiInvoke;
rapi::CeMoveFile CeMoveFile;
rapi::CeReadFile CeReadFile;
rapi::CeRegCloseKey CeRegCloseKey;
rapi::CeRegOpenKeyEx CeRegOpenKeyEx;
rapi::CeRegQueryValueEx CeRegQueryValueEx;
rapi::CeRemoveDirectory CeRemoveDirectory;
rapi::CeSetFilePointer CeSetFilePointer;
rapi::CeSetFileTime CeSetFileTime;
rapi::CeRapiUninit CeRapiUninit;
rapi::CeWriteFile CeWriteFile;
}

namespace folder_device {

// What the calling thread's last calls left behind. It has no destructor, so that it may go with the thread.
struct ThreadErrors {
    DWORD device = ERROR_SUCCESS;
    HRESULT transport = S_OK;
};
ThreadErrors& Errors();

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

    // `function` is the exported name, __func__ in the function itself.
    template <class... Arguments>
    explicit Call(const char* function, Arguments... arguments) noexcept
        : device_(Device::Get()),
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
    const DeviceTimes& Times() const { return configuration_->times; }

    // Passes the gate and carries out `body`, which answers a Win32 code. Gives that code or the gate's.
    template <class Body>
    DWORD Run(Body body) {
        error_ = Guarded(
            [&]() -> DWORD {
                const DWORD refusal = EnterDevice();
                const DWORD error = refusal != ERROR_SUCCESS ? refusal : body();
                return error != ERROR_SUCCESS ? error : fate_.lost_reply;
            },
            static_cast<DWORD>(ERROR_NOT_ENOUGH_MEMORY));
        if (error_ != ERROR_SUCCESS) {
            Errors().device = error_;
        }
        return error_;
    }
    // The whole of a call that answers TRUE or FALSE.
    template <class Body>
    BOOL RunBool(Body body) {
        return Return<BOOL>(Run(body) == ERROR_SUCCESS ? TRUE : FALSE);
    }
    // The whole of a call that answers what `body` puts into its argument or, when it fails, `failure`.
    template <class T, class Body>
    T RunFor(T failure, Body body) {
        T result = failure;
        return Return(Run([&] { return body(result); }) == ERROR_SUCCESS ? result : failure);
    }
    // The whole of a call that stays on the PC and answers an HRESULT.
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
    void Note(DWORD error) { Errors().device = error; }
    // How many of `wanted` bytes this call transfers: fewer when a fault says so.
    DWORD BytesOf(DWORD wanted) const { return wanted < fate_.byte_limit ? wanted : fate_.byte_limit; }
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

  private:
    DWORD EnterDevice();
    HRESULT EnterLocal();
    void LeaveLocal(HRESULT result);
    bool IsOnPath(const std::wstring& path) const;
    std::wstring ArgumentText() const;

    Device& device_;
    const std::shared_ptr<Configuration> configuration_;
    const std::string_view function_;
    const std::array<Argument, kMaxArguments> arguments_;
    const std::size_t argument_count_;
    std::wstring argument_text_;  // Taken before the call: it may close the handle that it names.
    Faults::Fate fate_;
    std::uint64_t result_ = 0;
    DWORD error_ = ERROR_SUCCESS;
};

// A device error as an HRESULT; a code that is one already stays as it is.
inline HRESULT ToHresult(DWORD error) {
    return error >= 0x80000000U ? static_cast<HRESULT>(error) : HRESULT_FROM_WIN32(error);
}
// The error of a call to the PC that tells by TRUE that it is done.
inline DWORD LastErrorUnless(BOOL done) {
    return done ? ERROR_SUCCESS : GetLastError();
}

}  // namespace folder_device
