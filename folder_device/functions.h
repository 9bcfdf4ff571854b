// The names of the entry points, for the trace and for the settings that refuse calls.
#pragma once

#include <optional>
#include <string_view>

namespace folder_device {

enum class Function {
    kCloseHandle,
    kCopyFile,
    kCreateDirectory,
    kCreateFile,
    kDeleteFile,
    kFindAllFiles,
    kFindClose,
    kFindFirstFile,
    kFindNextFile,
    kRapiFreeBuffer,
    kGetDiskFreeSpaceEx,
    kRapiGetError,
    kGetFileSize,
    kGetFileTime,
    kGetLastError,
    kGetVersionEx,
    kRapiInitEx,
    kRapiInvoke,
    kMoveFile,
    kReadFile,
    kRegCloseKey,
    kRegOpenKeyEx,
    kRegQueryValueEx,
    kRemoveDirectory,
    kSetFilePointer,
    kSetFileTime,
    kRapiUninit,
    kWriteFile,
};

// The exported name.
std::wstring_view NameOf(Function function);
// The function of that name, exactly as exported; nothing for any other text.
std::optional<Function> FunctionOf(std::wstring_view name);

}  // namespace folder_device
