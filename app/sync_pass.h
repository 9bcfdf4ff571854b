// The two passes of a synchronization, each a thread procedure for a worker.
#pragma once

#include <windows.h>

namespace orvane {

// Copy what is due from the PC to the device, and from the device to the PC. The parameter is the SyncTask,
// which must outlive the worker. The result is always 0: what happens is told by reports, the last of them
// "Task Complete DT2CE" or "Task Complete CE2DT", or "Task Ended" when the pass is not complete.
DWORD WINAPI SyncThreadDT2CE(void* task) noexcept;
DWORD WINAPI SyncThreadCE2DT(void* task) noexcept;

// The stack that a worker starts with, in bytes; the system extends it.
inline constexpr SIZE_T kSyncThreadStack = 0x10000;

}  // namespace orvane
