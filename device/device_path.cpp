#include "device/device_path.h"

#include <cstdlib>

#include "device/remote_api.h"
#include "platform/handles.h"

namespace orvane {

PathBuffer::PathBuffer(std::wstring_view path) {
    if (!FitsPathBuffer(path.size())) {
        std::abort();
    }
    characters_[path.copy(characters_, path.size())] = L'\0';
}

bool PcEntryExists(const std::wstring& path) {
    WIN32_FIND_DATAW found;
    return static_cast<bool>(UniqueFind(FindFirstFileW(path.c_str(), &found)));
}

bool DeviceEntryExists(const std::wstring& path) {
    rapi::FindData found;
    const HANDLE search = CeFindFirstFile(PathBuffer(path).Get(), &found);
    if (search == INVALID_HANDLE_VALUE) {
        return false;
    }
    CeFindClose(search);
    return true;
}

}  // namespace orvane
