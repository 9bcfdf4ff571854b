// The entry points of RAPI.DLL, bound by name as any program binds them, and a test fixture around them.
#pragma once

#include <gtest/gtest.h>
#include <windows.h>

#include <optional>
#include <string>
#include <string_view>
#include <vector>

#include "rapi/remote_api.h"
#include "tests/support/folder_device.h"

namespace orvane::testing {

// One entry point, as the pointer it is assigned to.
struct Entry {
    HMODULE library;
    const char* name;

    template <class Function>
    operator Function*() const {
        return reinterpret_cast<Function*>(reinterpret_cast<void*>(GetProcAddress(library, name)));
    }
};

// Loads the DLL; all pointers are null when it or an entry point is not there.
struct RemoteApiTable {
    RemoteApiTable() = default;
    ~RemoteApiTable() { FreeLibrary(library); }
    RemoteApiTable(const RemoteApiTable&) = delete;
    RemoteApiTable& operator=(const RemoteApiTable&) = delete;

    HMODULE library = LoadLibraryW(L"RAPI.DLL");
    rapi::CeCloseHandle* CeCloseHandle = Entry{library, "CeCloseHandle"};
    rapi::CeCopyFile* CeCopyFile = Entry{library, "CeCopyFile"};
    rapi::CeCreateDirectory* CeCreateDirectory = Entry{library, "CeCreateDirectory"};
    rapi::CeCreateFile* CeCreateFile = Entry{library, "CeCreateFile"};
    rapi::CeDeleteFile* CeDeleteFile = Entry{library, "CeDeleteFile"};
    rapi::CeFindAllFiles* CeFindAllFiles = Entry{library, "CeFindAllFiles"};
    rapi::CeFindClose* CeFindClose = Entry{library, "CeFindClose"};
    rapi::CeFindFirstFile* CeFindFirstFile = Entry{library, "CeFindFirstFile"};
    rapi::CeFindNextFile* CeFindNextFile = Entry{library, "CeFindNextFile"};
    rapi::CeRapiFreeBuffer* CeRapiFreeBuffer = Entry{library, "CeRapiFreeBuffer"};
    rapi::CeGetDiskFreeSpaceEx* CeGetDiskFreeSpaceEx = Entry{library, "CeGetDiskFreeSpaceEx"};
    rapi::CeRapiGetError* CeRapiGetError = Entry{library, "CeRapiGetError"};
    rapi::CeGetFileSize* CeGetFileSize = Entry{library, "CeGetFileSize"};
    rapi::CeGetFileTime* CeGetFileTime = Entry{library, "CeGetFileTime"};
    rapi::CeGetLastError* CeGetLastError = Entry{library, "CeGetLastError"};
    rapi::CeGetVersionEx* CeGetVersionEx = Entry{library, "CeGetVersionEx"};
    rapi::CeRapiInitEx* CeRapiInitEx = Entry{library, "CeRapiInitEx"};
    rapi::CeRapiInvoke* CeRapiInvoke = Entry{library, "CeRapiInvoke"};
    rapi::CeMoveFile* CeMoveFile = Entry{library, "CeMoveFile"};
    rapi::CeReadFile* CeReadFile = Entry{library, "CeReadFile"};
    rapi::CeRegCloseKey* CeRegCloseKey = Entry{library, "CeRegCloseKey"};
    rapi::CeRegOpenKeyEx* CeRegOpenKeyEx = Entry{library, "CeRegOpenKeyEx"};
    rapi::CeRegQueryValueEx* CeRegQueryValueEx = Entry{library, "CeRegQueryValueEx"};
    rapi::CeRemoveDirectory* CeRemoveDirectory = Entry{library, "CeRemoveDirectory"};
    rapi::CeSetFilePointer* CeSetFilePointer = Entry{library, "CeSetFilePointer"};
    rapi::CeSetFileTime* CeSetFileTime = Entry{library, "CeSetFileTime"};
    rapi::CeRapiUninit* CeRapiUninit = Entry{library, "CeRapiUninit"};
    rapi::CeWriteFile* CeWriteFile = Entry{library, "CeWriteFile"};
};

// A device with one session open on the test's thread.
class FolderDeviceTest : public ::testing::Test {
  protected:
    FolderDeviceTest() { Connect(); }

    // Opens one more session; what CeRapiInitEx and then the connection answered.
    HRESULT Connect();
    // Closes all sessions and opens one, so that changed settings are read.
    void Reconnect();

    HANDLE Open(const wchar_t* path, DWORD access, DWORD creation, DWORD share = 0);
    // Creates the file with this content through the device. False when a call failed.
    bool WriteNew(const wchar_t* path, std::string_view content);
    bool Write(HANDLE file, std::string_view bytes);
    // The names that CeFindAllFiles gives, in alphabetical order; nothing when it fails.
    std::optional<std::vector<std::wstring>> Names(const wchar_t* pattern);

    // The error of a call that must have failed; 0 for one that did not.
    DWORD ErrorOf(BOOL done) { return done ? 0 : api_.CeGetLastError(); }
    DWORD ErrorOf(HANDLE handle) { return handle != INVALID_HANDLE_VALUE ? 0 : api_.CeGetLastError(); }

    RemoteApiTable api_;
    FolderDevice device_;
};

}  // namespace orvane::testing
