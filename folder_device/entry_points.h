// The 28 exported functions, declared with the types that the Remote API's description gives them, so that
// the compiler holds every definition to the binary interface. What each of them accepts and refuses is
// told where it is defined; the rules that all of them share stand in call.h.
#pragma once

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
