// The times of the device's files. Its own clock is the PC's, set wrong by the setting CLOCK_OFFSET; the
// times that the PC's file system gives to new files are replaced by this clock's, those of written files
// where the two differ.
//
// The PC keeps times in UTC but for volumes of kind FAT, whose files have local times. These the system
// converts by the offset that is in force now, so that each of them would move by an hour when summer time
// begins and ends. The device converts by the offset that was in force at the file's date. (exFAT keeps each
// time with its offset: nothing is to be done.)
#pragma once

#include <windows.h>

#include <cstdint>
#include <map>
#include <mutex>
#include <string>

namespace folder_device {

class DeviceTimes {
  public:
    DeviceTimes(std::wstring root, std::int64_t clock_offset)
        : root_(std::move(root)), offset_(clock_offset) {}

    // Looks at what kind of volume the root is on, while no session is open: a card may have been changed.
    void LookAtVolume();

    // A time in UTC as the PC is to be given it for a file below the root, and the other way. "None" (zero)
    // and "leave it" (all bits set) stay what they are.
    FILETIME ForPc(const FILETIME& time) const;
    FILETIME FromPc(const FILETIME& shown) const;

    // Gives what was just made or emptied at `pc_path` the device's time as creation and last access: the
    // PC's file system lets a file that is made again within seconds, or emptied, keep its old creation time.
    // As last write too if the file is `written` and the clock is wrong; with the PC's own time that is right
    // already. Opens the file for its attributes only, which no share mode forbids, and by a handle of its
    // own: times set through a handle hold against later writes through that handle only.
    void StampNew(const std::wstring& pc_path, bool written) const;

    bool ClockIsWrong() const { return offset_ != 0; }
    // The device's present time, as the PC is to be given it.
    FILETIME Now() const;

  private:
    // The zone's rules in the year of the time.
    TIME_ZONE_INFORMATION RulesAt(const FILETIME& time) const;

    const std::wstring root_;
    const std::int64_t offset_;  // In 100-ns units.
    bool volume_stays_ = false;  // On a fixed disk: the question costs more than all else of a session.
    bool keeps_local_time_ = false;
    mutable std::mutex mutex_;
    mutable std::map<WORD, TIME_ZONE_INFORMATION> rules_;  // By year: the system takes its time to tell.
};

// Whether it is a time at all, neither "none" nor "leave it".
inline bool IsTime(const FILETIME& time) {
    return (time.dwLowDateTime != 0 || time.dwHighDateTime != 0) &&
           (time.dwLowDateTime != MAXDWORD || time.dwHighDateTime != MAXDWORD);
}

}  // namespace folder_device
