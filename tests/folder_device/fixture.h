// A test fixture for the folder device, which is called through the program's own Remote API.
#pragma once

#include <gtest/gtest.h>
#include <windows.h>

#include <algorithm>
#include <optional>
#include <string>
#include <string_view>
#include <vector>

#include "device/remote_api.h"
#include "tests/support/folder_device.h"

namespace orvane::testing {

using StringList = std::vector<std::wstring>;

// A device with one session open on the test's thread.
class FolderDeviceTest : public ::testing::Test {
  protected:
    FolderDeviceTest() { Connect(); }

    // Opens one more session; what CeRapiInitEx and then the connection answered.
    HRESULT Connect() {
        rapi::InitRecord record{sizeof(rapi::InitRecord), nullptr, E_FAIL};
        const HRESULT result = CeRapiInitEx(&record);
        if (FAILED(result)) {
            return result;
        }
        EXPECT_EQ(WaitForSingleObject(record.init_event, 5000), WAIT_OBJECT_0);
        return record.init_result;
    }
    // Closes all sessions and opens one, so that changed settings are read.
    void Reconnect() {
        device_.CloseSessions();
        EXPECT_EQ(Connect(), S_OK);
    }
    HANDLE Open(const std::wstring& path, DWORD access, DWORD creation, DWORD share = 0) {
        return CeCreateFile(path.c_str(), access, share, nullptr, creation, FILE_ATTRIBUTE_NORMAL, nullptr);
    }
    // Creates the file with this content through the device. False when a call failed.
    bool WriteNew(const std::wstring& path, std::string_view content) {
        const HANDLE file = Open(path, GENERIC_WRITE, CREATE_NEW);
        return file != INVALID_HANDLE_VALUE && Write(file, content) && CeCloseHandle(file);
    }
    bool Write(HANDLE file, std::string_view bytes) {
        DWORD written = 0;
        return CeWriteFile(file, bytes.data(), static_cast<DWORD>(bytes.size()), &written, nullptr) &&
               written == bytes.size();
    }
    // The names that CeFindAllFiles gives, in alphabetical order; nothing when it fails.
    std::optional<StringList> Names(const std::wstring& pattern) {
        DWORD count = 0;
        rapi::FindData* found = nullptr;
        if (!CeFindAllFiles(pattern.c_str(), rapi::kFindName, &count, &found)) {
            return std::nullopt;
        }
        StringList names;
        std::for_each(found, found + count, [&](const auto& entry) { names.push_back(entry.name); });
        std::sort(names.begin(), names.end());
        EXPECT_EQ(CeRapiFreeBuffer(found), S_OK);
        return names;
    }
    // The error of a call that must have failed; 0 for one that did not.
    DWORD ErrorOf(BOOL done) { return done ? 0 : CeGetLastError(); }
    DWORD ErrorOf(HANDLE handle) { return handle != INVALID_HANDLE_VALUE ? 0 : CeGetLastError(); }

    FolderDevice device_;
};

}  // namespace orvane::testing
