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

// Loads the DLL; all pointers are null when it or an entry point is not there.
struct RemoteApiTable {
    RemoteApiTable();
    ~RemoteApiTable();
    RemoteApiTable(const RemoteApiTable&) = delete;
    RemoteApiTable& operator=(const RemoteApiTable&) = delete;

    HMODULE library;
    rapi::CeCloseHandle* CeCloseHandle;
    rapi::CeCopyFile* CeCopyFile;
    rapi::CeCreateDirectory* CeCreateDirectory;
    rapi::CeCreateFile* CeCreateFile;
    rapi::CeDeleteFile* CeDeleteFile;
    rapi::CeFindAllFiles* CeFindAllFiles;
    rapi::CeFindClose* CeFindClose;
    rapi::CeFindFirstFile* CeFindFirstFile;
    rapi::CeFindNextFile* CeFindNextFile;
    rapi::CeRapiFreeBuffer* CeRapiFreeBuffer;
    rapi::CeGetDiskFreeSpaceEx* CeGetDiskFreeSpaceEx;
    rapi::CeRapiGetError* CeRapiGetError;
    rapi::CeGetFileSize* CeGetFileSize;
    rapi::CeGetFileTime* CeGetFileTime;
    rapi::CeGetLastError* CeGetLastError;
    rapi::CeGetVersionEx* CeGetVersionEx;
    rapi::CeRapiInitEx* CeRapiInitEx;
    rapi::CeRapiInvoke* CeRapiInvoke;
    rapi::CeMoveFile* CeMoveFile;
    rapi::CeReadFile* CeReadFile;
    rapi::CeRegCloseKey* CeRegCloseKey;
    rapi::CeRegOpenKeyEx* CeRegOpenKeyEx;
    rapi::CeRegQueryValueEx* CeRegQueryValueEx;
    rapi::CeRemoveDirectory* CeRemoveDirectory;
    rapi::CeSetFilePointer* CeSetFilePointer;
    rapi::CeSetFileTime* CeSetFileTime;
    rapi::CeRapiUninit* CeRapiUninit;
    rapi::CeWriteFile* CeWriteFile;
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
