#include "copy/target_path.h"

#include <windows.h>

#include <cwchar>

#include "platform/handles.h"
#include "platform/text_case.h"

namespace orvane {

namespace {

constexpr std::wstring_view kAsideEnding = L".orvane-part";
// The longest name that file systems take for one component of a path.
constexpr std::size_t kMaxNameChars = 255;
// "." and three digits.
constexpr std::size_t kBackupSuffixChars = 4;

std::wstring_view LastName(std::wstring_view path) {
    return path.substr(path.rfind(L'\\') + 1);
}

// Whether the last component of the path is the short name ("LONGNA~1.QVJ") that the PC's file system has
// given to an entry of another name. To open such a path is to open that other file.
bool IsShortNameOfAnother(const std::wstring& pc_path) {
    const std::wstring_view name = LastName(pc_path);
    if (name.find(L'~') == std::wstring_view::npos) {
        return false;
    }
    WIN32_FIND_DATAW found;
    const UniqueFind search(FindFirstFileW(pc_path.c_str(), &found));
    return search && !EqualIgnoringCase(found.cFileName, name);
}

// Whether the entry, or a folder on the way to it from the PC folder, goes by such a short name.
bool LeadsThroughShortName(const std::wstring& pc_path, std::wstring_view name) {
    if (name.find(L'~') == std::wstring_view::npos) {
        return false;
    }
    for (std::size_t end = pc_path.size() - name.size(); end != std::wstring::npos;) {
        end = pc_path.find(L'\\', end + 1);
        if (IsShortNameOfAnother(pc_path.substr(0, end))) {
            return true;
        }
    }
    return false;
}

bool CanHold(std::wstring_view folder, std::wstring_view name) {
    return PathFits(folder.size() + 1 + name.size());
}

// A name of a fixed length for the target, the same in any case.
std::wstring HashedName(const std::wstring& target) {
    wchar_t digits[17] = {};
    std::swprintf(digits, std::size(digits), L"%016llx",
                  static_cast<unsigned long long>(HashIgnoringCase(target)));
    return digits + std::wstring(kAsideEnding);
}

std::wstring BackupName(const std::wstring& path, int number) {
    const std::wstring digits = std::to_wstring(number);
    const std::size_t zeros = digits.size() < 3 ? 3 - digits.size() : 0;
    return path + L"." + std::wstring(zeros, L'0') + digits;
}

}  // namespace

bool CanCopy(const EntryPaths& paths, std::wstring_view name, Direction direction, bool with_backup) {
    const std::size_t target = paths.Target(direction).size() + (with_backup ? kBackupSuffixChars : 0);
    const std::wstring_view pc_folder = std::wstring_view(paths.pc).substr(0, paths.pc.size() - name.size());
    return IsPcFolderNamed(pc_folder) && PathFits(paths.Source(direction).size()) && PathFits(target) &&
           (direction == Direction::kPcToDevice ||
            (IsSafePcRelativePath(name) && !LeadsThroughShortName(paths.pc, name)));
}

std::wstring AsidePath(const std::wstring& target) {
    std::wstring beside = target + std::wstring(kAsideEnding);
    if (PathFits(beside.size()) && LastName(beside).size() <= kMaxNameChars) {
        return beside;
    }
    const std::wstring name = HashedName(target);
    std::wstring_view folder = ParentPath(target);
    while (!CanHold(folder, name)) {
        folder = ParentPath(folder);
    }
    return JoinPath(folder, name);
}

bool IsAside(std::wstring_view name) {
    return name.size() > kAsideEnding.size() &&
           EqualIgnoringCase(name.substr(name.size() - kAsideEnding.size()), kAsideEnding);
}

std::wstring MoveToBackup(const Side& side, const std::wstring& path) {
    for (int number = 1; number < side.BackupEnd(); ++number) {
        std::wstring backup = BackupName(path, number);
        if (!PathFits(backup.size())) {
            break;
        }
        if (side.Find(backup).kind == EntryKind::kNone) {
            if (side.Move(path, backup)) {
                return backup;
            }
            side.Move(backup, path);  // Should only the answer have been lost, the file gets its name back.
            break;
        }
    }
    return {};
}

}  // namespace orvane
