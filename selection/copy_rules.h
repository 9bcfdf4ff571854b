// What would be copied: the rules that the synchronization passes and the manual view share.
#pragma once

#include <windows.h>

#include <cstdint>
#include <functional>
#include <string>
#include <string_view>

#include "selection/file_table.h"

namespace orvane {

// Two files of the same local date whose times of day differ by fewer seconds than this are the same
// version when it is decided what to copy. The manual view's replace check has a bound of its own, 11; that
// the two differ is meant.
inline constexpr int kSameVersionSeconds = 10;
inline constexpr int kSameVersionSecondsReplaceCheck = 11;

// Whether two write times count as the same version: equal local dates, and times of day that differ by less
// than `bound_seconds`. Two seconds across midnight are two versions.
bool IsSameVersion(const FILETIME& a, const FILETIME& b, int bound_seconds);

// Whether the source may replace that target: replacing is allowed, and it is newer and not the same version.
bool Replaces(bool overwrite, const FILETIME& source_write_time, const FILETIME& target_write_time);

// Whether the source file is left alone: `target` has a file of its name that may not be overwritten
// (`overwrite` off), has an equal time, is the same version, is newer, or is one that the user keeps.
// `ask_replace`, empty when the user wants no warning, is called with the name only for a target that would
// be replaced, and answers whether to replace it.
bool ShouldSkipCopy(bool overwrite, const FILETIME& source_write_time, std::wstring_view name,
                    const FileIndex& target, const std::function<bool(std::wstring_view)>& ask_replace);

// The question whether the target may be replaced, in the user's language. The display texts are paths with
// the side behind them.
std::wstring ReplaceQuestion(std::wstring_view target_display, std::wstring_view source_display);

}  // namespace orvane
