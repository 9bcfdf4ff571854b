#include <cstdio>

#include "benchmark/call_timer.h"
#include "benchmark/cases.h"
#include "benchmark/json_line.h"
#include "benchmark/stopwatch.h"
#include "device/connect.h"
#include "device/device_listing.h"
#include "platform/handles.h"

namespace orvane::bench {

namespace {

constexpr int kRuns = 5;

int FoldersBelow(const FileNode& node) {
    int folders = 0;
    for (const FileNode& child : node.Children()) {
        folders += child.is_folder != 0 ? 1 + FoldersBelow(child) : 0;
    }
    return folders;
}

}  // namespace

bool RunListing() {
    InstallCallTimer();
    const UniqueEvent stop = NewManualResetEvent();
    const DeviceSession session(stop.Get());
    for (int run = 0; run < kRuns; ++run) {
        ResetCallCounts();
        FileNode root;
        const LONGLONG start = Now();
        if (ListDeviceFolder(L"\\Jobs", {}, true, root, stop.Get()) != DeviceResult::kDone) {
            std::fputs("the device was not listed\n", stderr);
            return false;
        }
        const double ms = Milliseconds(Now() - start);
        const CallCount calls = SumOf(TakeCallCounts(), CallKind::kRemoteApi);
        const int folders = 1 + FoldersBelow(root);
        JsonLine line;
        line.Add("us_per_folder", ms * 1000 / folders);
        line.Add("calls_per_folder", static_cast<double>(calls.calls) / folders);
        line.Add("outside_percent", 100 * (1 - Milliseconds(calls.ticks) / ms));
        line.Print();
    }
    return true;
}

}  // namespace orvane::bench
