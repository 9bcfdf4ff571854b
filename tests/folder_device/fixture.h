// A test fixture for the folder device, which is called through the program's own Remote API.
#pragma once

#include <gtest/gtest.h>
#include <windows.h>

#include <optional>
#include <string>
#include <string_view>
#include <vector>

#include "device/remote_api.h"
#include "tests/support/folder_device.h"

namespace orvane::testing {

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
    DWORD ErrorOf(BOOL done) { return done ? 0 : CeGetLastError(); }
    DWORD ErrorOf(HANDLE handle) { return handle != INVALID_HANDLE_VALUE ? 0 : CeGetLastError(); }

    FolderDevice device_;
};

}  // namespace orvane::testing
