// The binary interface of the Windows CE Remote API as RAPI.DLL offers it to 64-bit PC programs: types,
// flags and the signatures of the 28 entry points that are in use. Sources: the platform's public
// documentation of each function. Both sides of the DLL boundary include this header: the program that
// calls and the folder device that answers. It holds declarations only.
#pragma once

#include <windows.h>

#include <cstddef>

namespace rapi {

// In and out of CeRapiInitEx. `size` is 24 on entry; the event is signalled when the connection stands or
// has failed, `init_result` then tells which.
struct InitRecord {
    DWORD size;
    HANDLE init_event;
    HRESULT init_result;
};
static_assert(sizeof(InitRecord) == 24 && offsetof(InitRecord, init_event) == 8 &&
              offsetof(InitRecord, init_result) == 16);

// One directory entry. Unlike the PC's own find data it carries the object identifier before the name.
struct FindData {
    DWORD attributes;
    FILETIME creation_time;
    FILETIME last_access_time;
    FILETIME last_write_time;
    DWORD size_high;
    DWORD size_low;
    DWORD object_id;
    WCHAR name[MAX_PATH];
};
static_assert(sizeof(FindData) == 560 && offsetof(FindData, object_id) == 36 &&
              offsetof(FindData, name) == 40);

struct OsVersionInfo {
    DWORD size;
    DWORD major_version;
    DWORD minor_version;
    DWORD build_number;
    DWORD platform_id;
    WCHAR csd_version[128];
};
static_assert(sizeof(OsVersionInfo) == 276);

// Flags of CeFindAllFiles: the fields that are wanted.
inline constexpr DWORD kFindAttributes = 0x01;
inline constexpr DWORD kFindCreationTime = 0x02;
inline constexpr DWORD kFindLastAccessTime = 0x04;
inline constexpr DWORD kFindLastWriteTime = 0x08;
inline constexpr DWORD kFindSizeHigh = 0x10;
inline constexpr DWORD kFindSizeLow = 0x20;
inline constexpr DWORD kFindObjectId = 0x40;
inline constexpr DWORD kFindName = 0x80;

struct IRAPIStream;  // Only its pointer crosses the boundary, and only as null.

// The entry points, as function types named like the exported names.
using CeCloseHandle = BOOL WINAPI(HANDLE object);
using CeCopyFile = BOOL WINAPI(LPCWSTR existing_file, LPCWSTR new_file, BOOL fail_if_exists);
using CeCreateDirectory = BOOL WINAPI(LPCWSTR path, LPSECURITY_ATTRIBUTES security);
using CeCreateFile = HANDLE WINAPI(LPCWSTR path, DWORD access, DWORD share_mode,
                                   LPSECURITY_ATTRIBUTES security, DWORD creation, DWORD attributes,
                                   HANDLE template_file);
using CeDeleteFile = BOOL WINAPI(LPCWSTR path);
using CeFindAllFiles = BOOL WINAPI(LPCWSTR pattern, DWORD flags, LPDWORD found_count, FindData** found);
using CeFindClose = BOOL WINAPI(HANDLE search);
using CeFindFirstFile = HANDLE WINAPI(LPCWSTR pattern, FindData* found);
using CeFindNextFile = BOOL WINAPI(HANDLE search, FindData* found);
using CeRapiFreeBuffer = HRESULT WINAPI(LPVOID buffer);
using CeGetDiskFreeSpaceEx = BOOL WINAPI(LPCWSTR folder, PULARGE_INTEGER free_to_caller,
                                         PULARGE_INTEGER total, PULARGE_INTEGER free);
using CeRapiGetError = HRESULT WINAPI();
using CeGetFileSize = DWORD WINAPI(HANDLE file, LPDWORD size_high);
using CeGetFileTime = BOOL WINAPI(HANDLE file, LPFILETIME creation, LPFILETIME last_access,
                                  LPFILETIME last_write);
using CeGetLastError = DWORD WINAPI();
using CeGetVersionEx = BOOL WINAPI(OsVersionInfo* version);
using CeRapiInitEx = HRESULT WINAPI(InitRecord* record);
using CeRapiInvoke = HRESULT WINAPI(LPCWSTR dll_path, LPCWSTR function_name, DWORD input_size, BYTE* input,
                                    DWORD* output_size, BYTE** output, IRAPIStream** stream, DWORD reserved);
using CeMoveFile = BOOL WINAPI(LPCWSTR existing_path, LPCWSTR new_path);
using CeReadFile = BOOL WINAPI(HANDLE file, LPVOID buffer, DWORD wanted, LPDWORD read,
                               LPOVERLAPPED overlapped);
using CeRegCloseKey = LONG WINAPI(HKEY key);
using CeRegOpenKeyEx = LONG WINAPI(HKEY key, LPCWSTR sub_key, DWORD options, REGSAM access, PHKEY result);
using CeRegQueryValueEx = LONG WINAPI(HKEY key, LPCWSTR value_name, LPDWORD reserved, LPDWORD type,
                                      LPBYTE data, LPDWORD data_size);
using CeRemoveDirectory = BOOL WINAPI(LPCWSTR path);
using CeSetFilePointer = DWORD WINAPI(HANDLE file, LONG distance, PLONG distance_high, DWORD method);
using CeSetFileTime = BOOL WINAPI(HANDLE file, const FILETIME* creation, const FILETIME* last_access,
                                  const FILETIME* last_write);
using CeRapiUninit = HRESULT WINAPI();
using CeWriteFile = BOOL WINAPI(HANDLE file, LPCVOID buffer, DWORD wanted, LPDWORD written,
                                LPOVERLAPPED overlapped);

}  // namespace rapi
