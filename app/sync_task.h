// What the synchronization dialog and its workers share.
#pragma once

#include <windows.h>

#include <string>
#include <string_view>

#include "jobs/file_types.h"
#include "platform/cancel_event.h"
#include "selection/job_table.h"
#include "ui/report_queue.h"

namespace orvane {

// Posted to the dialog when reports wait in the queue; both parameters 0.
inline constexpr UINT WM_SYNC_NOTIFY = 100;

// The commands of a report.
inline constexpr std::wstring_view kIncrementProgress = L"Increment Progress";
inline constexpr std::wstring_view kAddInfoDisplay = L"Add Info Display";
inline constexpr std::wstring_view kErrorInfoDisplay = L"Error Info Display";
inline constexpr std::wstring_view kTaskCompleteDt2Ce = L"Task Complete DT2CE";
inline constexpr std::wstring_view kTaskCompleteCe2Dt = L"Task Complete CE2DT";
// The pass has ended before it was complete.
inline constexpr std::wstring_view kTaskEnded = L"Task Ended";

// How a pass came to its end.
enum class PassEnd { kComplete, kCancelled, kDiskFull, kConnectionLost, kOutOfMemory };

// One report of a worker. The last one of each worker tells the pass's end.
struct SyncReport {
    std::wstring_view command;  // One of the constants above.
    std::wstring info_text{};
    PassEnd end = PassEnd::kComplete;
};

// One side of a synchronization: its listing and its job folder, without a trailing "\".
struct SyncSide {
    JobTable listing;
    std::wstring folder;
};

// One per dialog, reused by every synchronization. Everything but the event and the queue is filled by the
// dialog before a worker starts and only read by the worker.
struct SyncTask {
    SyncSide pc;
    SyncSide device;
    // Handed to all device and file operations of a run, looked at before each row, and signalled by
    // "Cancel". Reset by the dialog before a run, when no worker lives.
    CancelEvent cancel;
    FileTypes types;  // Those that take part.
    bool overwrite_old_files = false;
    bool overwrite_bkp = false;
    bool overwrite_warn = false;
    ui::ReportQueue<SyncReport> reports;
};

}  // namespace orvane
