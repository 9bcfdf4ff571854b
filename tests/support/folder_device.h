// The folder device as tests use it: an empty device of its own for one test, with faults on demand.
//
// The device is the RAPI.DLL of the build, found on the PATH and shared with whatever else in the process
// loads it by that name. It reads its settings when a session opens while none is open in the process: a
// test changes them with Set between sessions, and they hold from the next session on; all counters of
// calls start anew with every change. A session that is left open on another thread would hold the old ones.
#pragma once

#include <windows.h>

#include <cstdint>
#include <set>
#include <string>
#include <string_view>
#include <vector>

#include "rapi/remote_api.h"
#include "tests/support/temp_folder.h"

namespace orvane::testing {

// One call as the device traced it.
struct TraceLine {
    std::uint64_t number = 0;  // From 1, in the order of the calls' ends.
    DWORD thread = 0;
    std::size_t sessions = 0;  // Of that thread, when the call ended.
    std::wstring function;     // "CeCreateFile".
    std::vector<std::wstring> arguments;
    DWORD error = 0;  // A Win32 code or an HRESULT, 0 after a success.
};

class FolderDevice {
  public:
    // Closes what sessions the calling thread has left, gives the device an empty root folder and no other
    // setting, and has it read them. The destructor does the same without a root and removes the folder.
    FolderDevice();
    ~FolderDevice();

    // Sets FOLDER_DEVICE_<name> (see docs/folder_device.md), for the next session.
    void Set(const std::wstring& name, const std::wstring& value);
    void Clear(const std::wstring& name);
    // Gives the device a registry, as a file's text in UTF-8.
    void SetRegistry(std::string_view text);
    // Has every call traced, from the next session on.
    void StartTrace();
    // All lines of the trace so far.
    std::vector<TraceLine> Trace() const;
    // How often the function was called since the trace began.
    std::size_t CallsOf(std::wstring_view function) const;

    // The root folder on the PC, without a trailing "\".
    const std::wstring& Root() const { return root_.Path(); }
    // The PC's path of a device path, which begins with "\".
    std::wstring PcPath(std::wstring_view device_path) const;

    // Closes the calling thread's open sessions and tells how many there were.
    int CloseSessions();

  private:
    void HaveSettingsRead();

    std::set<std::wstring> set_;  // The settings that are set.
    TempFolder root_;
    TempFolder aside_;  // Holds the registry and the trace, which are no files of the device.
    HMODULE library_;
    rapi::CeRapiInitEx* init_;
    rapi::CeRapiUninit* uninit_;
};

}  // namespace orvane::testing
