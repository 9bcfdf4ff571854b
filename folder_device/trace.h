// The call trace: one line per call, handed to the system at once, so that the lines of a killed process
// are there. UTF-8, "\n" at the end of a line, seven columns with tabs between:
//
//   number  thread  sessions  function  arguments  result  error
//
// The number counts the lines of the process from 1. Sessions are those of the calling thread when the call
// ends. Arguments are joined with " | ", numbers hexadecimal, a handle followed by the path that it is open
// on. The result is what the function returned, the error a Win32 code or an HRESULT, 0 after a success.
// Control characters in the arguments are written as "?".
#pragma once

#include <cstdint>
#include <mutex>
#include <string>

#include "folder_device/functions.h"
#include "folder_device/owned_handle.h"

namespace folder_device {

struct TraceEntry {
    Function function;
    std::size_t sessions;
    std::wstring arguments;
    std::uint64_t result;
    DWORD error;
};

class Trace {
  public:
    // Appends to the file at `path`, or traces nothing when it is empty. IsOpen tells whether that worked.
    explicit Trace(const std::wstring& path);

    bool IsOpen() const { return file_ != nullptr; }
    void Write(const TraceEntry& entry);

  private:
    std::mutex mutex_;
    OwnedHandle file_;
};

}  // namespace folder_device
