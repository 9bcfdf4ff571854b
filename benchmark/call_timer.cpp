#include "benchmark/call_timer.h"

#include <intrin.h>

#include <atomic>
#include <cstring>

#include "benchmark/stopwatch.h"
#include "rapi/remote_api.h"

namespace orvane::bench {

namespace {

// A thread-local flag would take a lock of the run-time, and such locks wait by the very functions that look
// at it.
std::atomic<DWORD> thread_without_waits{0};

struct Sum {
    std::atomic<std::uint64_t> calls{0};
    std::atomic<std::uint64_t> cycles{0};
};

// When the sums began, by both clocks.
std::uint64_t begun_at_cycle = 0;
LONGLONG begun_at = 0;

// What stands in a function's place. `Id` makes functions of one type different.
template <class Function, int Id>
struct Timed;

template <class Result, class... Arguments, int Id>
struct Timed<Result WINAPI(Arguments...), Id> {
    static inline void* original = nullptr;
    static inline Sum sum{};

    template <bool IsWait>
    static Result WINAPI Call(Arguments... arguments) {
        class Watch {
          public:
            Watch() = default;
            Watch(const Watch&) = delete;
            Watch& operator=(const Watch&) = delete;
            ~Watch() {
                sum.cycles += __rdtsc() - start_;
                ++sum.calls;
            }

          private:
            const std::uint64_t start_ = __rdtsc();
        };
        const auto function = reinterpret_cast<Result(WINAPI*)(Arguments...)>(original);
        if (IsWait && GetCurrentThreadId() == thread_without_waits) {
            return function(arguments...);
        }
        const Watch watch;
        return function(arguments...);
    }
};

struct Hook {
    const char* name;
    CallKind kind;
    void* replacement;
    void** original;
    Sum* sum;
};

template <class Function, int Id, bool IsWait>
Hook MakeHook(const char* name, CallKind kind) {
    using Watched = Timed<Function, Id>;
    return {name, kind, reinterpret_cast<void*>(&Watched::template Call<IsWait>), &Watched::original,
            &Watched::sum};
}

#define ORVANE_RAPI(name) MakeHook<rapi::name, __COUNTER__, false>(#name, CallKind::kRemoteApi)
#define ORVANE_FILE(name) MakeHook<decltype(::name), __COUNTER__, false>(#name, CallKind::kPcFile)
#define ORVANE_WAIT(name) MakeHook<decltype(::name), __COUNTER__, true>(#name, CallKind::kWait)

const Hook kHooks[] = {
    ORVANE_RAPI(CeCloseHandle),       ORVANE_RAPI(CeCreateDirectory),
    ORVANE_RAPI(CeCreateFile),        ORVANE_RAPI(CeDeleteFile),
    ORVANE_RAPI(CeFindAllFiles),      ORVANE_RAPI(CeFindClose),
    ORVANE_RAPI(CeFindFirstFile),     ORVANE_RAPI(CeGetFileTime),
    ORVANE_RAPI(CeGetLastError),      ORVANE_RAPI(CeMoveFile),
    ORVANE_RAPI(CeRapiFreeBuffer),    ORVANE_RAPI(CeRapiInitEx),
    ORVANE_RAPI(CeRapiUninit),        ORVANE_RAPI(CeReadFile),
    ORVANE_RAPI(CeRegCloseKey),       ORVANE_RAPI(CeRegOpenKeyEx),
    ORVANE_RAPI(CeRegQueryValueEx),   ORVANE_RAPI(CeSetFileTime),
    ORVANE_RAPI(CeWriteFile),         ORVANE_FILE(CloseHandle),
    ORVANE_FILE(CreateDirectoryW),    ORVANE_FILE(CreateFileW),
    ORVANE_FILE(DeleteFileW),         ORVANE_FILE(FindClose),
    ORVANE_FILE(FindFirstFileW),      ORVANE_FILE(FindNextFileW),
    ORVANE_FILE(FlushFileBuffers),    ORVANE_FILE(GetFileAttributesW),
    ORVANE_FILE(GetFileSizeEx),       ORVANE_FILE(GetFileTime),
    ORVANE_FILE(MoveFileExW),         ORVANE_FILE(ReadFile),
    ORVANE_FILE(SetFileTime),         ORVANE_FILE(WriteFile),
    ORVANE_WAIT(WaitForSingleObject), ORVANE_WAIT(MsgWaitForMultipleObjects),
};

const Hook* HookOf(const char* name) {
    for (const Hook& hook : kHooks) {
        if (std::strcmp(hook.name, name) == 0) {
            return &hook;
        }
    }
    return nullptr;
}

FARPROC(WINAPI* get_proc_address)(HMODULE, LPCSTR);

FARPROC WINAPI TimedGetProcAddress(HMODULE module, LPCSTR name) {
    const FARPROC found = get_proc_address(module, name);
    // A small number in place of a name is an ordinal.
    const Hook* hook = reinterpret_cast<ULONG_PTR>(name) > 0xFFFF ? HookOf(name) : nullptr;
    if (found == nullptr || hook == nullptr || hook->kind != CallKind::kRemoteApi) {
        return found;
    }
    *hook->original = reinterpret_cast<void*>(found);
    return reinterpret_cast<FARPROC>(hook->replacement);
}

// Puts `replacement` into an entry of the import table and gives what was there.
void* Replace(ULONGLONG& entry, void* replacement) {
    DWORD protection = 0;
    VirtualProtect(&entry, sizeof entry, PAGE_READWRITE, &protection);
    void* const original = reinterpret_cast<void*>(entry);
    entry = reinterpret_cast<ULONGLONG>(replacement);
    VirtualProtect(&entry, sizeof entry, protection, &protection);
    return original;
}

void HookEntry(const char* name, ULONGLONG& entry) {
    if (std::strcmp(name, "GetProcAddress") == 0) {
        void* const original = Replace(entry, reinterpret_cast<void*>(&TimedGetProcAddress));
        get_proc_address = reinterpret_cast<FARPROC(WINAPI*)(HMODULE, LPCSTR)>(original);
    } else if (const Hook* hook = HookOf(name)) {
        *hook->original = reinterpret_cast<void*>(entry);  // The replacement may be called at once.
        Replace(entry, hook->replacement);
    }
}

}  // namespace

void InstallCallTimer() {
    auto* const base = reinterpret_cast<BYTE*>(GetModuleHandleW(nullptr));
    const auto* dos = reinterpret_cast<const IMAGE_DOS_HEADER*>(base);
    const auto* nt = reinterpret_cast<const IMAGE_NT_HEADERS*>(base + dos->e_lfanew);
    const auto& directory = nt->OptionalHeader.DataDirectory[IMAGE_DIRECTORY_ENTRY_IMPORT];
    const auto* import = reinterpret_cast<const IMAGE_IMPORT_DESCRIPTOR*>(base + directory.VirtualAddress);
    for (; import->Name != 0; ++import) {
        const auto* names = reinterpret_cast<const ULONGLONG*>(base + import->OriginalFirstThunk);
        auto* entries = reinterpret_cast<ULONGLONG*>(base + import->FirstThunk);
        for (; *names != 0; ++names, ++entries) {
            if ((*names & IMAGE_ORDINAL_FLAG64) == 0) {
                HookEntry(reinterpret_cast<const IMAGE_IMPORT_BY_NAME*>(base + *names)->Name, *entries);
            }
        }
    }
}

void IgnoreWaitsOfThisThread() {
    thread_without_waits = GetCurrentThreadId();
}

CallCounts TakeCallCounts() {
    const double ticks_per_cycle =
        static_cast<double>(Now() - begun_at) / static_cast<double>(__rdtsc() - begun_at_cycle);
    CallCounts counts;
    for (const Hook& hook : kHooks) {
        if (hook.sum->calls != 0) {
            const double ticks = static_cast<double>(hook.sum->cycles) * ticks_per_cycle;
            counts[hook.name] = {hook.kind, hook.sum->calls, static_cast<LONGLONG>(ticks)};
        }
    }
    return counts;
}

void ResetCallCounts() {
    for (const Hook& hook : kHooks) {
        hook.sum->calls = 0;
        hook.sum->cycles = 0;
    }
    begun_at = Now();
    begun_at_cycle = __rdtsc();
}

CallCount SumOf(const CallCounts& counts, CallKind kind) {
    CallCount sum{kind, 0, 0};
    for (const auto& [name, count] : counts) {
        if (count.kind == kind) {
            sum.calls += count.calls;
            sum.ticks += count.ticks;
        }
    }
    return sum;
}

}  // namespace orvane::bench
