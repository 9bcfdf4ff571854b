// Counts and times the calls that the program makes of the Remote API and of the PC's files.
//
// The program calls both through this executable's import table: PC functions directly, entry points of
// RAPI.DLL after it has asked GetProcAddress for them. Replacing entries of that table puts a stopwatch
// around each call without any change to the program; calls that the folder device or the system make for
// their own part pass other tables and are not counted twice. The stopwatches count the processor's cycles,
// whose rate has to be constant: a look at the performance counter can be a call of the system, which would
// be seen in the times of tens of thousands of calls.
#pragma once

#include <windows.h>

#include <cstdint>
#include <map>
#include <string>

namespace orvane::bench {

enum class CallKind {
    kRemoteApi,
    kPcFile,
    kWait,  // Waiting for a session to stand, looking whether an operation is cancelled.
};

struct CallCount {
    CallKind kind{};
    std::uint64_t calls = 0;
    LONGLONG ticks = 0;
};
using CallCounts = std::map<std::string, CallCount>;  // By function name.

// Puts the stopwatches in place; before the program's first Remote API call.
void InstallCallTimer();

// Leaves out the waits of the calling thread, the only one: a window's thread waits for work.
void IgnoreWaitsOfThisThread();

// The sums since the last reset. Calls that are under way count from their end.
CallCounts TakeCallCounts();
void ResetCallCounts();

// The sum over all functions of a kind.
CallCount SumOf(const CallCounts& counts, CallKind kind);

}  // namespace orvane::bench
