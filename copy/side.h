// The two sides that files are copied between, as far as copying needs them: one interface, so that what is
// done on both is written once.
#pragma once

#include <windows.h>

#include <cstdint>
#include <string>
#include <string_view>
#include <utility>

#include "platform/paths.h"

namespace orvane {

// Whether a path of that many characters can be worked on, on either side. Who makes up a path from listed
// names asks this first: a device path that does not fit ends the process (see PathBuffer).
constexpr bool PathFits(std::size_t characters) {
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

// What a search for a path finds. A search that is refused finds nothing: who goes on from there must use
// calls that leave alone what may stand there all the same.
enum class EntryKind { kNone, kFile, kFolder };
struct FoundEntry {
    EntryKind kind = EntryKind::kNone;
    FILETIME write_time = {};
    std::wstring name = {};  // As the side writes it.
};

// When a search on the device is closed. Left to the session's end, which is near, it costs no call of its
// own.
enum class SearchEnd { kNow, kWithSession };

struct FileTimes {
    FILETIME creation;
    FILETIME last_access;
    FILETIME last_write;
};

// One side's files. On the device all calls go through the session that the caller holds on the thread; paths
// must satisfy PathFits. Without state of its own: any thread may call.
class Side {
  public:
    static const Side& Pc();
    static const Side& Device();

    Side(const Side&) = delete;
    Side& operator=(const Side&) = delete;

    // Files. Both answer null when there is none to be had; the handle is then closed with Close.
    virtual HANDLE OpenSource(const std::wstring& path) const = 0;
    // A new file in place of what has the name.
    virtual HANDLE Create(const std::wstring& path) const = 0;
    // As ReadFile and WriteFile, also in that they may do less than was wanted.
    virtual bool Read(HANDLE file, void* buffer, DWORD wanted, DWORD& read) const = 0;
    virtual bool Write(HANDLE file, const void* buffer, DWORD wanted, DWORD& written) const = 0;
    virtual bool GetTimes(HANDLE file, FileTimes& times) const = 0;
    // Null for a time that stays the system's.
    virtual bool SetTimes(HANDLE file, const FILETIME* creation, const FILETIME* last_access,
                          const FILETIME& last_write) const = 0;
    virtual bool Close(HANDLE file) const = 0;
    // Why the last call on this thread failed, a Win32 code.
    virtual DWORD LastError() const = 0;

    // Names.
    // Right after a search that found nothing: whether the side said so, and did not just refuse.
    bool SaysNothingIsThere() const;
    virtual FoundEntry Find(const std::wstring& path, SearchEnd end = SearchEnd::kNow) const = 0;
    virtual bool Delete(const std::wstring& path) const = 0;
    // Refuses where something has the new name already.
    virtual bool Move(const std::wstring& from, const std::wstring& to) const = 0;
    // In place of the file that has the new name. On the PC that is one step. The device's move does not
    // replace: there it is two, and between them no file has the name.
    virtual bool MoveOver(const std::wstring& from, const std::wstring& to) const = 0;
    // One past the last number of a backup's name.
    virtual int BackupEnd() const = 0;

  protected:
    Side() = default;
    ~Side() = default;
};

// An open file of one side; closed at the end.
class SideFile {
  public:
    SideFile(const Side& side, HANDLE file) : side_(side), file_(file) {}
    SideFile(const SideFile&) = delete;
    SideFile& operator=(const SideFile&) = delete;
    ~SideFile() { Close(); }

    explicit operator bool() const { return file_ != nullptr; }
    HANDLE Get() const { return file_; }
    // False when the side could not close it in order, so that what was written may not all be there.
    bool Close() { return file_ == nullptr || side_.Close(Release()); }
    // Gives the handle up unclosed.
    [[nodiscard]] HANDLE Release() { return std::exchange(file_, nullptr); }

  private:
    const Side& side_;
    HANDLE file_;
};

}  // namespace orvane
