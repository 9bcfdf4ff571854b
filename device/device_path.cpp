#include "device/device_path.h"

#include <cstdlib>

#include "device/remote_api.h"
#include "platform/handles.h"
#include "platform/text_case.h"

namespace orvane {

PathBuffer::PathBuffer(std::wstring_view path) {
    if (!FitsPathBuffer(path.size())) {
        std::abort();
    }
    characters_[path.copy(characters_, path.size())] = L'\0';
}

namespace {

EntryKind KindOf(DWORD attributes) {
    return (attributes & FILE_ATTRIBUTE_DIRECTORY) != 0 ? EntryKind::kFolder : EntryKind::kFile;
}

}  // namespace

EntryKind PcEntry(const std::wstring& path) {
    WIN32_FIND_DATAW found;
    const UniqueFind search(FindFirstFileW(path.c_str(), &found));
    return search ? KindOf(found.dwFileAttributes) : EntryKind::kNone;
}

EntryKind DeviceEntry(const std::wstring& path) {
    rapi::FindData found{};
    const HANDLE search = CeFindFirstFile(PathBuffer(path).Get(), &found);
    if (search == INVALID_HANDLE_VALUE) {
        return EntryKind::kNone;
    }
    CeFindClose(search);
    return KindOf(found.attributes);
}

bool IsShortNameOfAnother(const std::wstring& pc_path) {
    const std::wstring_view name = std::wstring_view(pc_path).substr(pc_path.rfind(L'\\') + 1);
    if (name.find(L'~') == std::wstring_view::npos) {
        return false;
    }
    WIN32_FIND_DATAW found;
    const UniqueFind search(FindFirstFileW(pc_path.c_str(), &found));
    return search && !EqualIgnoringCase(found.cFileName, name);
}

}  // namespace orvane
