#include "tests/folder_device/fixture.h"

#include <algorithm>

namespace orvane::testing {

HRESULT FolderDeviceTest::Connect() {
    rapi::InitRecord record{sizeof(rapi::InitRecord), nullptr, E_FAIL};
    const HRESULT result = CeRapiInitEx(&record);
    if (FAILED(result)) {
        return result;
    }
    // The test's longest delay is far shorter.
    EXPECT_EQ(WaitForSingleObject(record.init_event, 5000), WAIT_OBJECT_0);
    return record.init_result;
}

void FolderDeviceTest::Reconnect() {
    device_.CloseSessions();
    EXPECT_EQ(Connect(), S_OK);
}

HANDLE FolderDeviceTest::Open(const wchar_t* path, DWORD access, DWORD creation, DWORD share) {
    return CeCreateFile(path, access, share, nullptr, creation, FILE_ATTRIBUTE_NORMAL, nullptr);
}

bool FolderDeviceTest::WriteNew(const wchar_t* path, std::string_view content) {
    const HANDLE file = Open(path, GENERIC_WRITE, CREATE_NEW);
    return file != INVALID_HANDLE_VALUE && Write(file, content) && CeCloseHandle(file);
}

bool FolderDeviceTest::Write(HANDLE file, std::string_view bytes) {
    DWORD written = 0;
    return CeWriteFile(file, bytes.data(), static_cast<DWORD>(bytes.size()), &written, nullptr) &&
           written == bytes.size();
}

std::optional<std::vector<std::wstring>> FolderDeviceTest::Names(const wchar_t* pattern) {
    DWORD count = 0;
    rapi::FindData* found = nullptr;
    if (!CeFindAllFiles(pattern, rapi::kFindName, &count, &found)) {
        return std::nullopt;
    }
    std::vector<std::wstring> names;
    for (DWORD i = 0; i < count; ++i) {
        names.emplace_back(found[i].name);
    }
    std::sort(names.begin(), names.end());
    EXPECT_EQ(CeRapiFreeBuffer(found), S_OK);
    return names;
}

}  // namespace orvane::testing
