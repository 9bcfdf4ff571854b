// The cases that can be measured. Each is one run of the bench program, so that none finds the memory of
// another, and prints lines of JSON to the standard output. False, with a line on the standard error, when
// the program does not do what is to be measured; slowness is no failure.
#pragma once

#include <cstdint>
#include <string>

namespace orvane::bench {

// Flattening two listings of `count` equal files in folders of `per_folder` and deciding all their rows in
// both directions. The device's times are `seconds_behind` the PC's, and it lists every `stride`-th file of a
// folder until it has listed all: 1 is the PC's order.
bool RunDecision(std::int32_t count, std::int32_t per_folder, int seconds_behind, int stride);

// One synchronization by the real dialog, of the PC folder and the device's "\Jobs".
bool RunSync(const std::wstring& pc_folder, bool with_backup);

// Listing the device's "\Jobs" with all that lies below.
bool RunListing();

// What a user does with the lists of the real manual view.
bool RunLists(const std::wstring& pc_folder);

// Starts of the program itself, an executable's path, until its window is painted.
bool RunStart(const std::wstring& program);

}  // namespace orvane::bench
