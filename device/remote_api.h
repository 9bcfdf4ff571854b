// The Remote API as the program calls it. RAPI.DLL is never linked: it is loaded once, at static
// initialisation, and freed at process exit; each entry point is looked up by name when it is first used and
// kept for the life of the process. Every function here forwards to the entry point of its name; when the
// library or the entry point is missing it returns the value given with it and does nothing. A missing
// library (ActiveSync is not installed) is a normal state that nothing reports.
//
// Any thread may call. A Remote API session belongs to the thread that opened it with ConnectDevice.
#pragma once

#include <windows.h>

#include "rapi/remote_api.h"

namespace orvane {

BOOL CeCloseHandle(HANDLE object);                                              // FALSE
BOOL CeCopyFile(LPCWSTR existing_file, LPCWSTR new_file, BOOL fail_if_exists);  // FALSE
BOOL CeCreateDirectory(LPCWSTR path, LPSECURITY_ATTRIBUTES security);           // FALSE
// Null, not INVALID_HANDLE_VALUE: callers that test for the latter only take it for a handle.
HANDLE CeCreateFile(LPCWSTR path, DWORD access, DWORD share_mode, LPSECURITY_ATTRIBUTES security,
                    DWORD creation, DWORD attributes, HANDLE template_file);
BOOL CeDeleteFile(LPCWSTR path);                                                                 // FALSE
BOOL CeFindAllFiles(LPCWSTR pattern, DWORD flags, LPDWORD found_count, rapi::FindData** found);  // FALSE
BOOL CeFindClose(HANDLE search);                                                                 // FALSE
// Library missing: null. Entry point missing: INVALID_HANDLE_VALUE.
HANDLE CeFindFirstFile(LPCWSTR pattern, rapi::FindData* found);
BOOL CeFindNextFile(HANDLE search, rapi::FindData* found);  // FALSE
HRESULT CeRapiFreeBuffer(LPVOID buffer);                    // E_FAIL
BOOL CeGetDiskFreeSpaceEx(LPCWSTR folder, PULARGE_INTEGER free_to_caller, PULARGE_INTEGER total,
                          PULARGE_INTEGER free);      // FALSE
HRESULT CeRapiGetError();                             // E_NOINTERFACE
DWORD CeGetFileSize(HANDLE file, LPDWORD size_high);  // 0
BOOL CeGetFileTime(HANDLE file, LPFILETIME creation, LPFILETIME last_access, LPFILETIME last_write);  // FALSE
DWORD CeGetLastError();                                                                               // 0
BOOL CeGetVersionEx(rapi::OsVersionInfo* version);                                                    // FALSE
HRESULT CeRapiInitEx(rapi::InitRecord* record);  // E_NOTIMPL
HRESULT CeRapiInvoke(LPCWSTR dll_path, LPCWSTR function_name, DWORD input_size, BYTE* input,
                     DWORD* output_size, BYTE** output, rapi::IRAPIStream** stream,
                     DWORD reserved);                      // E_NOINTERFACE
BOOL CeMoveFile(LPCWSTR existing_path, LPCWSTR new_path);  // FALSE
BOOL CeReadFile(HANDLE file, LPVOID buffer, DWORD wanted, LPDWORD read, LPOVERLAPPED overlapped);  // FALSE
LONG CeRegCloseKey(HKEY key);                                                                      // E_FAIL
LONG CeRegOpenKeyEx(HKEY key, LPCWSTR sub_key, DWORD options, REGSAM access, PHKEY result);        // E_FAIL
LONG CeRegQueryValueEx(HKEY key, LPCWSTR value_name, LPDWORD reserved, LPDWORD type, LPBYTE data,
                       LPDWORD data_size);                                              // E_FAIL
BOOL CeRemoveDirectory(LPCWSTR path);                                                   // FALSE
DWORD CeSetFilePointer(HANDLE file, LONG distance, PLONG distance_high, DWORD method);  // 0
BOOL CeSetFileTime(HANDLE file, const FILETIME* creation, const FILETIME* last_access,
                   const FILETIME* last_write);  // FALSE
HRESULT CeRapiUninit();                          // E_NOINTERFACE
BOOL CeWriteFile(HANDLE file, LPCVOID buffer, DWORD wanted, LPDWORD written,
                 LPOVERLAPPED overlapped);  // FALSE

}  // namespace orvane
