// Sessions, errors, version and foreign code.
#include <cwchar>
#include <string>

#include "folder_device/call.h"
#include "folder_device/device_path.h"

using namespace folder_device;

namespace {

// What a session's connection ends in: the setting's failure, a device that has vanished, or a root folder
// that is not there, which is a memory card that was pulled out.
HRESULT ConnectionResult(const Call& call) {
    const Settings& settings = call.TheSettings();
    Location root;
    if (FAILED(settings.connect_result)) {
        return settings.connect_result;
    }
    if (call.TheConfiguration().faults.Vanished() || Locate(settings.root, L"\\", root) != ERROR_SUCCESS) {
        return HRESULT_FROM_WIN32(ERROR_DEVICE_NOT_CONNECTED);
    }
    return S_OK;
}

// A device that has vanished and leaves its callers waiting is not found by a connection either.
DWORD ConnectDelay(const Call& call) {
    const Settings& settings = call.TheSettings();
    const bool silent = settings.vanish_delay != 0 && call.TheConfiguration().faults.Vanished();
    return silent ? INFINITE : settings.connect_delay;
}

HRESULT OpenSession(const Call& call, rapi::InitRecord* record) {
    if (record == nullptr || record->size != sizeof(rapi::InitRecord)) {
        return E_INVALIDARG;
    }
    if (!call.TheConfiguration().IsUsable()) {
        return HRESULT_FROM_WIN32(ERROR_BAD_CONFIGURATION);
    }
    const Settings& settings = call.TheSettings();
    if (FAILED(settings.init_result)) {
        return settings.init_result;
    }
    return call.TheDevice().OpenSession(*record, ConnectionResult(call), ConnectDelay(call)) ? S_OK
                                                                                             : E_OUTOFMEMORY;
}

// Where the device would look for the DLL: at its path, or by its bare name in \Windows and in the root.
DWORD FindDeviceDll(const std::wstring& root, const wchar_t* dll) {
    Location found;
    if (dll != nullptr && dll[0] != L'\0' && std::wcschr(dll, L'\\') == nullptr) {
        for (const wchar_t* folder : {L"\\Windows\\", L"\\"}) {
            if (Locate(root, (folder + std::wstring(dll)).c_str(), found) == ERROR_SUCCESS &&
                found.IsPlainFile()) {
                return ERROR_SUCCESS;
            }
        }
        return ERROR_FILE_NOT_FOUND;
    }
    const DWORD error = Locate(root, dll, found);
    return error != ERROR_SUCCESS || found.IsPlainFile() ? error : ERROR_FILE_NOT_FOUND;
}

}  // namespace

// Adds a session to the calling thread. Fails with E_INVALIDARG for a record of another size, with
// ERROR_BAD_CONFIGURATION when a setting cannot be understood or the trace cannot be written, and with
// the setting INIT_RESULT. Otherwise the record's event tells when the connection has come about or
// failed; without CONNECT_DELAY it is signalled on return.
HRESULT WINAPI CeRapiInitEx(rapi::InitRecord* record) {
    const HRESULT read = Guarded(  // Before the call looks at the settings.
        [] {
            Device::Get().ReadSettings();
            return S_OK;
        },
        static_cast<HRESULT>(E_OUTOFMEMORY));
    Call call(__func__);
    return call.RunLocal([&] { return FAILED(read) ? read : OpenSession(call, record); });
}

// Takes the thread's youngest session away, whatever became of its connection; E_FAIL when it has none.
HRESULT WINAPI CeRapiUninit() {
    Call call(__func__);
    return call.RunLocal([&] { return call.TheDevice().CloseSession() ? S_OK : E_FAIL; });
}

// S_OK when the thread's last call reached the device, else how the transport or the session failed it.
HRESULT WINAPI CeRapiGetError() {
    Call call(__func__);
    return call.Return(Errors().transport);
}

// The error of the thread's last failed call, in a session and outside.
DWORD WINAPI CeGetLastError() {
    Call call(__func__);
    return call.Return(Errors().device);
}

// Frees what CeFindAllFiles gave, in a session or outside. Null is nothing to free; E_INVALIDARG for
// anything else that is not such a buffer, so also for one that is freed already.
HRESULT WINAPI CeRapiFreeBuffer(LPVOID buffer) {
    Call call(__func__, buffer);
    return call.RunLocal(
        [&] { return buffer == nullptr || call.TheDevice().buffers.Free(buffer) ? S_OK : E_INVALIDARG; });
}

// The version of the platform that handhelds of the kind run: 5.1, platform 3 (Windows CE).
BOOL WINAPI CeGetVersionEx(rapi::OsVersionInfo* version) {
    Call call(__func__);
    return call.RunBool([&]() -> DWORD {
        if (version == nullptr || version->size != sizeof(rapi::OsVersionInfo)) {
            return ERROR_INVALID_PARAMETER;
        }
        *version = {sizeof(rapi::OsVersionInfo), 5, 1, 0, 3, L"Folder device"};
        return ERROR_SUCCESS;
    });
}

// Runs nothing, ever: code on a memory card is made for another processor, and running what a card brings
// along would open the PC to it. A DLL that is there is answered with ERROR_BAD_EXE_FORMAT, one that is not
// with ERROR_FILE_NOT_FOUND or the path's error. There is no output.
HRESULT WINAPI CeRapiInvoke(LPCWSTR dll_path, LPCWSTR function_name, DWORD input_size, BYTE* /*input*/,
                            DWORD* output_size, BYTE** output, rapi::IRAPIStream** stream,
                            DWORD /*reserved*/) {
    Call call(__func__, dll_path, function_name, input_size);
    if (output_size != nullptr) {
        *output_size = 0;
    }
    if (output != nullptr) {
        *output = nullptr;
    }
    if (stream != nullptr) {
        *stream = nullptr;
    }
    const DWORD error = call.Run([&]() -> DWORD {
        if (function_name == nullptr) {
            return ERROR_INVALID_PARAMETER;
        }
        const DWORD missing = FindDeviceDll(call.TheSettings().root, dll_path);
        return missing != ERROR_SUCCESS ? missing : ERROR_BAD_EXE_FORMAT;
    });
    return call.Return(ToHresult(error));
}
