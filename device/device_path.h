// Paths on their way into a device operation: whether they fit, whether something stands there.
#pragma once

#include <string>
#include <string_view>

#include "platform/paths.h"

namespace orvane {

// What a backup adds to a device path: "." and three digits.
inline constexpr std::size_t kDeviceBackupSuffixChars = 4;

// Whether a device path of that many characters can be worked on, together with the name of its backup when
// one is asked for. Who makes up a path from listed names asks this first: a path that is handed to a device
// operation and does not fit ends the process (see PathBuffer).
constexpr bool DevicePathFits(std::size_t characters, bool with_backup = false) {
    return FitsPathBuffer(characters + (with_backup ? kDeviceBackupSuffixChars : 0));
}

// Whether the PC can hold a path of that many characters.
constexpr bool PcPathFits(std::size_t characters) {
    return FitsPathBuffer(characters);
}

// A terminated copy of a path in a buffer of kPathBufferChars, which is what the Remote API is given. The
// last line of defence: a path that does not fit ends the process rather than be cut and mean another file.
class PathBuffer {
  public:
    explicit PathBuffer(std::wstring_view path);
    const wchar_t* Get() const { return characters_; }

  private:
    wchar_t characters_[kPathBufferChars];
};

// What a search for a path finds.
enum class EntryKind { kNone, kFile, kFolder };
EntryKind PcEntry(const std::wstring& path);
// The same on the device, in the caller's session.
EntryKind DeviceEntry(const std::wstring& path);

// Whether the last component of the path is the short name ("LONGNA~1.QVJ") that the PC's file system has
// given to an entry of another name. To open such a path is to open that other file.
bool IsShortNameOfAnother(const std::wstring& pc_path);

}  // namespace orvane
