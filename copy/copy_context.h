// What is copied, which way, and under which conditions.
#pragma once

#include <windows.h>

#include <cstdint>
#include <optional>
#include <string>
#include <string_view>

#include "copy/side.h"
#include "device/connect.h"
#include "platform/cancel_event.h"

namespace orvane {

// Which way files are copied. The numbers are those of the manual view's pages, whose files go that way.
enum class Direction { kPcToDevice = 0, kDeviceToPc = 1 };

// What becomes of an old file that a copy replaces: gone, or kept as path.001, path.002, ...
enum class OldFile { kReplaced, kKept };

// Whom a copy is for, which settles how the target is dated. A pass and a companion folder give it the
// source's listed write time and leave the other times to the system; the manual view gives it all three
// times of the source.
enum class Purpose { kPass, kCompanion, kManualView };

struct CopyContext {
    Direction direction;
    Purpose purpose;
    Session session;  // Whose the copy works in.
    OldFile old_file;
    const CancelEvent& cancel;  // The caller's.

    const Side& Source() const { return direction == Direction::kPcToDevice ? Side::Pc() : Side::Device(); }
    const Side& Target() const { return direction == Direction::kPcToDevice ? Side::Device() : Side::Pc(); }
};

// Where an entry lies, or is to lie, on the two sides.
struct EntryPaths {
    std::wstring pc;
    std::wstring device;

    const std::wstring& Source(Direction direction) const {
        return direction == Direction::kPcToDevice ? pc : device;
    }
    const std::wstring& Target(Direction direction) const {
        return direction == Direction::kPcToDevice ? device : pc;
    }
    // Each side's folder followed by the name; one of the two brings the "\" between them.
    EntryPaths operator+(std::wstring_view name) const {
        return {std::wstring(pc).append(name), std::wstring(device).append(name)};
    }
};

// A file that is to be copied, as the listings showed it.
struct FileToCopy {
    EntryPaths paths;
    FILETIME write_time;                  // Of the source.
    std::uint64_t size;                   // Of the source, in bytes; of a PC file the open handle's counts.
    std::optional<FILETIME> target_time;  // Write time of the target; nothing if there was none.
};

}  // namespace orvane
