#include <cstdio>
#include <string>

#include "benchmark/cases.h"
#include "benchmark/json_line.h"
#include "benchmark/stopwatch.h"
#include "platform/file_time.h"
#include "platform/text_case.h"
#include "selection/copy_rules.h"
#include "selection/file_table.h"

namespace orvane::bench {

namespace {

struct Side {
    FileNode root;
    FileTable table;
    std::int32_t rows = 0;
};

std::wstring Numbered(const wchar_t* format, std::int32_t number) {
    wchar_t text[40];
    std::swprintf(text, std::size(text), format, static_cast<int>(number));
    return text;
}

// The files have the numbers from `first` on; `stride` has no divisor in common with `count`.
void FillFolder(FileNode& folder, std::int32_t first, std::int32_t count, std::int64_t stride,
                const FILETIME& time) {
    folder.is_folder = 1;
    folder.child_count = count;
    folder.children = std::make_unique<FileNode[]>(static_cast<std::size_t>(count));
    for (std::int32_t i = 0; i < count; ++i) {
        FileNode& file = folder.children[static_cast<std::size_t>(i)];
        file.name = Numbered(L"measurement %06d.qvj", first + static_cast<std::int32_t>(i * stride % count));
        file.creation_time = file.last_write_time = time;
    }
}

void FillTree(FileNode& root, std::int32_t count, std::int32_t per_folder, std::int64_t stride,
              const FILETIME& time) {
    const std::int32_t folders = count / per_folder;
    root.child_count = folders;
    root.children = std::make_unique<FileNode[]>(static_cast<std::size_t>(folders));
    for (std::int32_t i = 0; i < folders; ++i) {
        FileNode& folder = root.children[static_cast<std::size_t>(i)];
        folder.name = Numbered(L"site %05d", i);
        FillFolder(folder, i * per_folder, per_folder, stride, time);
    }
}

void Flatten(Side& side) {
    side.rows = 0;
    FlattenTree(side.table, side.rows, side.root, {}, CountEntries(0, side.root));
}

// The rows of `source` that would be copied.
std::int32_t DecideAll(const Side& source, const Side& target) {
    const FileIndex index(target.table, target.rows);
    std::int32_t due = 0;
    for (std::size_t row = 0; row < static_cast<std::size_t>(source.rows); ++row) {
        due += ShouldSkipCopy(true, source.table.write_times[row], source.table.names[row], index, nullptr)
                   ? 0
                   : 1;
    }
    return due;
}

}  // namespace

bool RunDecision(std::int32_t count, std::int32_t per_folder, int seconds_behind, int stride) {
    constexpr ULONGLONG kNoon = 133'535'304'000'000'000;  // 2024-02-29 at noon, UTC.
    const ULONGLONG behind = kNoon - static_cast<ULONGLONG>(seconds_behind) * 10'000'000;
    const auto time = [](ULONGLONG ticks) {
        return FILETIME{static_cast<DWORD>(ticks), static_cast<DWORD>(ticks >> 32)};
    };
    Side pc;
    Side device;
    FillTree(pc.root, count, per_folder, 1, time(kNoon));
    FillTree(device.root, count, per_folder, stride, time(behind));
    HashIgnoringCase(L"");  // Reads the case table: once for a program, however many rows there are.
    const LONGLONG start = Now();
    Flatten(pc);
    Flatten(device);
    const LONGLONG flat = Now();
    const std::int32_t due = DecideAll(pc, device) + DecideAll(device, pc);
    const LONGLONG end = Now();
    if (due != 0) {
        std::fputs("equal rows were found to differ\n", stderr);
        return false;
    }
    JsonLine line;
    line.Add("ms", Milliseconds(end - start));
    line.Add("flatten_ms", Milliseconds(flat - start));
    line.Add("us_per_row", Milliseconds(end - start) * 1000 / (pc.rows + device.rows));
    line.Print();
    return true;
}

}  // namespace orvane::bench
