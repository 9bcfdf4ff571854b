// The paths of targets, and the names that the program makes up beside them: that of a copy in the making
// and those of backups.
#pragma once

#include <string>
#include <string_view>

#include "copy/copy_context.h"

namespace orvane {

// Whether the entry may be copied: there is a PC folder at all, both sides can hold its paths, with the name
// of a backup of the target where `with_backup` asks for one, and, on the way to the PC, the PC can hold its
// name, which must not lead into a file or folder of another name. (The device judges names of its own
// accord.) `name` is the end of both paths, below the folders that the user chose.
bool CanCopy(const EntryPaths& paths, std::wstring_view name, Direction direction, bool with_backup);

// Where the copy to that target is written until it is whole: beside it, under its name and an ending of the
// program's own; where that would be too long, under a name of a fixed length in the nearest folder above in
// which it fits, and which differs for every target. It always fits, and is always the same for one target.
std::wstring AsidePath(const std::wstring& target);
// Whether the file is such a copy. No type of file has that ending: none is ever listed as a job's file, and
// companion folders leave them out.
bool IsAside(std::wstring_view name);

// Gives the file a backup's name: the path, "." and the first number in at least three digits, from 001 on,
// that no entry has; gaps are filled again. Returns that path; empty when there is no free one that fits (on
// the device the numbers end at 999, on the PC they have no cap) or the move was refused, and the file then
// has its own name.
std::wstring MoveToBackup(const Side& side, const std::wstring& path);

}  // namespace orvane
