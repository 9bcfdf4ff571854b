#include "device/remote_api.h"

#include <atomic>

namespace orvane {

namespace {

constinit std::atomic<HMODULE> library{nullptr};
constinit std::atomic<int> running_calls{0};

// Owns the library from static initialisation to process exit.
class LibraryOwner {
  public:
    LibraryOwner() {
        // Takes the current directory out of the search: only the program's folder, the system's folders
        // and the PATH may give the library.
        SetDllDirectoryW(L"");
        library = LoadLibraryW(L"RAPI.DLL");
    }
    LibraryOwner(const LibraryOwner&) = delete;
    LibraryOwner& operator=(const LibraryOwner&) = delete;
    // The process may end while a worker is still busy on the device. A call that begins from here on finds
    // no library; one that is running keeps it, and the system takes both away with the process.
    ~LibraryOwner() {
        const HMODULE module = library.exchange(nullptr);
        if (module != nullptr && running_calls == 0) {
            FreeLibrary(module);
        }
    }
};

const LibraryOwner library_owner;

class RunningCall {
  public:
    RunningCall() { ++running_calls; }
    RunningCall(const RunningCall&) = delete;
    RunningCall& operator=(const RunningCall&) = delete;
    ~RunningCall() { --running_calls; }
};

// One entry point: its exported name and its address, null until the first call that finds it. Two threads
// may look it up at the same time and store the same address twice.
template <class Function>
class EntryPoint;

template <class Result, class... Arguments>
class EntryPoint<Result WINAPI(Arguments...)> {
  public:
    constexpr EntryPoint(const char* name, Result without_library, Result without_entry_point)
        : name_(name), without_library_(without_library), without_entry_point_(without_entry_point) {}
    constexpr EntryPoint(const char* name, Result unavailable) : EntryPoint(name, unavailable, unavailable) {}

    Result operator()(Arguments... arguments) {
        const RunningCall call;
        const HMODULE module = library;
        if (module == nullptr) {
            return without_library_;
        }
        void* address = address_;
        if (address == nullptr) {
            address = reinterpret_cast<void*>(GetProcAddress(module, name_));
            if (address == nullptr) {
                return without_entry_point_;
            }
            address_ = address;
        }
        return reinterpret_cast<Result(WINAPI*)(Arguments...)>(address)(arguments...);
    }

  private:
    const char* name_;
    Result without_library_;
    Result without_entry_point_;
    std::atomic<void*> address_{nullptr};
};

}  // namespace

BOOL CeCloseHandle(HANDLE object) {
    static constinit EntryPoint<rapi::CeCloseHandle> entry("CeCloseHandle", FALSE);
    return entry(object);
}

BOOL CeCopyFile(LPCWSTR existing_file, LPCWSTR new_file, BOOL fail_if_exists) {
    static constinit EntryPoint<rapi::CeCopyFile> entry("CeCopyFile", FALSE);
    return entry(existing_file, new_file, fail_if_exists);
}

BOOL CeCreateDirectory(LPCWSTR path, LPSECURITY_ATTRIBUTES security) {
    static constinit EntryPoint<rapi::CeCreateDirectory> entry("CeCreateDirectory", FALSE);
    return entry(path, security);
}

HANDLE CeCreateFile(LPCWSTR path, DWORD access, DWORD share_mode, LPSECURITY_ATTRIBUTES security,
                    DWORD creation, DWORD attributes, HANDLE template_file) {
    // Null is meant, although the entry point itself reports failure with INVALID_HANDLE_VALUE.
    static constinit EntryPoint<rapi::CeCreateFile> entry("CeCreateFile", nullptr);
    return entry(path, access, share_mode, security, creation, attributes, template_file);
}

BOOL CeDeleteFile(LPCWSTR path) {
    static constinit EntryPoint<rapi::CeDeleteFile> entry("CeDeleteFile", FALSE);
    return entry(path);
}

BOOL CeFindAllFiles(LPCWSTR pattern, DWORD flags, LPDWORD found_count, rapi::FindData** found) {
    static constinit EntryPoint<rapi::CeFindAllFiles> entry("CeFindAllFiles", FALSE);
    return entry(pattern, flags, found_count, found);
}

BOOL CeFindClose(HANDLE search) {
    static constinit EntryPoint<rapi::CeFindClose> entry("CeFindClose", FALSE);
    return entry(search);
}

HANDLE CeFindFirstFile(LPCWSTR pattern, rapi::FindData* found) {
    // The two values differ on purpose. The second is INVALID_HANDLE_VALUE, which is no constant expression.
    static EntryPoint<rapi::CeFindFirstFile> entry("CeFindFirstFile", nullptr, INVALID_HANDLE_VALUE);
    return entry(pattern, found);
}

BOOL CeFindNextFile(HANDLE search, rapi::FindData* found) {
    static constinit EntryPoint<rapi::CeFindNextFile> entry("CeFindNextFile", FALSE);
    return entry(search, found);
}

HRESULT CeRapiFreeBuffer(LPVOID buffer) {
    static constinit EntryPoint<rapi::CeRapiFreeBuffer> entry("CeRapiFreeBuffer", E_FAIL);
    return entry(buffer);
}

BOOL CeGetDiskFreeSpaceEx(LPCWSTR folder, PULARGE_INTEGER free_to_caller, PULARGE_INTEGER total,
                          PULARGE_INTEGER free) {
    static constinit EntryPoint<rapi::CeGetDiskFreeSpaceEx> entry("CeGetDiskFreeSpaceEx", FALSE);
    return entry(folder, free_to_caller, total, free);
}

HRESULT CeRapiGetError() {
    static constinit EntryPoint<rapi::CeRapiGetError> entry("CeRapiGetError", E_NOINTERFACE);
    return entry();
}

DWORD CeGetFileSize(HANDLE file, LPDWORD size_high) {
    static constinit EntryPoint<rapi::CeGetFileSize> entry("CeGetFileSize", 0);
    return entry(file, size_high);
}

BOOL CeGetFileTime(HANDLE file, LPFILETIME creation, LPFILETIME last_access, LPFILETIME last_write) {
    static constinit EntryPoint<rapi::CeGetFileTime> entry("CeGetFileTime", FALSE);
    return entry(file, creation, last_access, last_write);
}

DWORD CeGetLastError() {
    static constinit EntryPoint<rapi::CeGetLastError> entry("CeGetLastError", 0);
    return entry();
}

BOOL CeGetVersionEx(rapi::OsVersionInfo* version) {
    static constinit EntryPoint<rapi::CeGetVersionEx> entry("CeGetVersionEx", FALSE);
    return entry(version);
}

HRESULT CeRapiInitEx(rapi::InitRecord* record) {
    static constinit EntryPoint<rapi::CeRapiInitEx> entry("CeRapiInitEx", E_NOTIMPL);
    return entry(record);
}

HRESULT CeRapiInvoke(LPCWSTR dll_path, LPCWSTR function_name, DWORD input_size, BYTE* input,
                     DWORD* output_size, BYTE** output, rapi::IRAPIStream** stream, DWORD reserved) {
    static constinit EntryPoint<rapi::CeRapiInvoke> entry("CeRapiInvoke", E_NOINTERFACE);
    return entry(dll_path, function_name, input_size, input, output_size, output, stream, reserved);
}

BOOL CeMoveFile(LPCWSTR existing_path, LPCWSTR new_path) {
    static constinit EntryPoint<rapi::CeMoveFile> entry("CeMoveFile", FALSE);
    return entry(existing_path, new_path);
}

BOOL CeReadFile(HANDLE file, LPVOID buffer, DWORD wanted, LPDWORD read, LPOVERLAPPED overlapped) {
    static constinit EntryPoint<rapi::CeReadFile> entry("CeReadFile", FALSE);
    return entry(file, buffer, wanted, read, overlapped);
}

LONG CeRegCloseKey(HKEY key) {
    static constinit EntryPoint<rapi::CeRegCloseKey> entry("CeRegCloseKey", E_FAIL);
    return entry(key);
}

LONG CeRegOpenKeyEx(HKEY key, LPCWSTR sub_key, DWORD options, REGSAM access, PHKEY result) {
    static constinit EntryPoint<rapi::CeRegOpenKeyEx> entry("CeRegOpenKeyEx", E_FAIL);
    return entry(key, sub_key, options, access, result);
}

LONG CeRegQueryValueEx(HKEY key, LPCWSTR value_name, LPDWORD reserved, LPDWORD type, LPBYTE data,
                       LPDWORD data_size) {
    static constinit EntryPoint<rapi::CeRegQueryValueEx> entry("CeRegQueryValueEx", E_FAIL);
    return entry(key, value_name, reserved, type, data, data_size);
}

BOOL CeRemoveDirectory(LPCWSTR path) {
    static constinit EntryPoint<rapi::CeRemoveDirectory> entry("CeRemoveDirectory", FALSE);
    return entry(path);
}

DWORD CeSetFilePointer(HANDLE file, LONG distance, PLONG distance_high, DWORD method) {
    static constinit EntryPoint<rapi::CeSetFilePointer> entry("CeSetFilePointer", 0);
    return entry(file, distance, distance_high, method);
}

BOOL CeSetFileTime(HANDLE file, const FILETIME* creation, const FILETIME* last_access,
                   const FILETIME* last_write) {
    static constinit EntryPoint<rapi::CeSetFileTime> entry("CeSetFileTime", FALSE);
    return entry(file, creation, last_access, last_write);
}

HRESULT CeRapiUninit() {
    static constinit EntryPoint<rapi::CeRapiUninit> entry("CeRapiUninit", E_NOINTERFACE);
    return entry();
}

BOOL CeWriteFile(HANDLE file, LPCVOID buffer, DWORD wanted, LPDWORD written, LPOVERLAPPED overlapped) {
    static constinit EntryPoint<rapi::CeWriteFile> entry("CeWriteFile", FALSE);
    return entry(file, buffer, wanted, written, overlapped);
}

}  // namespace orvane
