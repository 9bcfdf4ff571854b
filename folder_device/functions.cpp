#include "folder_device/functions.h"

#include <algorithm>
#include <iterator>

namespace folder_device {

namespace {

// In the order of the enumeration.
constexpr std::wstring_view kNames[] = {
    L"CeCloseHandle",    L"CeCopyFile",       L"CeCreateDirectory",    L"CeCreateFile",
    L"CeDeleteFile",     L"CeFindAllFiles",   L"CeFindClose",          L"CeFindFirstFile",
    L"CeFindNextFile",   L"CeRapiFreeBuffer", L"CeGetDiskFreeSpaceEx", L"CeRapiGetError",
    L"CeGetFileSize",    L"CeGetFileTime",    L"CeGetLastError",       L"CeGetVersionEx",
    L"CeRapiInitEx",     L"CeRapiInvoke",     L"CeMoveFile",           L"CeReadFile",
    L"CeRegCloseKey",    L"CeRegOpenKeyEx",   L"CeRegQueryValueEx",    L"CeRemoveDirectory",
    L"CeSetFilePointer", L"CeSetFileTime",    L"CeRapiUninit",         L"CeWriteFile"};
static_assert(std::size(kNames) == static_cast<std::size_t>(Function::kWriteFile) + 1);

}  // namespace

std::wstring_view NameOf(Function function) {
    return kNames[static_cast<std::size_t>(function)];
}

std::optional<Function> FunctionOf(std::wstring_view name) {
    const auto* found = std::find(std::begin(kNames), std::end(kNames), name);
    if (found == std::end(kNames)) {
        return std::nullopt;
    }
    return static_cast<Function>(found - std::begin(kNames));
}

}  // namespace folder_device
