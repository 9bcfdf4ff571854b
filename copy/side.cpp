#include "copy/side.h"

#include <climits>
#include <cstdlib>
#include <iterator>

#include "device/remote_api.h"
#include "platform/handles.h"

namespace orvane {

PathBuffer::PathBuffer(std::wstring_view path) {
    if (!FitsPathBuffer(path.size())) {
        std::abort();
    }
    characters_[path.copy(characters_, path.size())] = L'\0';
}

namespace {

EntryKind KindOf(DWORD attributes) {
    return (attributes & FILE_ATTRIBUTE_DIRECTORY) != 0 ? EntryKind::kFolder : EntryKind::kFile;
}

// The one thing that a failed CreateFileW and a CeCreateFile without an entry point have in common.
HANDLE OrNull(HANDLE file) {
    return file == INVALID_HANDLE_VALUE ? nullptr : file;
}

class PcSide final : public Side {
  public:
    HANDLE OpenSource(const std::wstring& path) const override {
        return OrNull(CreateFileW(path.c_str(), GENERIC_READ, 0, nullptr, OPEN_EXISTING,
                                  FILE_ATTRIBUTE_NORMAL, nullptr));
    }
    HANDLE Create(const std::wstring& path) const override {
        const auto create = [&path](DWORD creation) {
            return OrNull(CreateFileW(path.c_str(), GENERIC_WRITE, 0, nullptr, creation,
                                      FILE_ATTRIBUTE_NORMAL, nullptr));
        };
        // Only what an ended copy has left is emptied: a file system may write out what was emptied, be it
        // nothing, as soon as it is closed (ext4, below Wine and file servers).
        const HANDLE file = create(CREATE_NEW);
        return file != nullptr || GetLastError() != ERROR_FILE_EXISTS ? file : create(CREATE_ALWAYS);
    }
    bool Read(HANDLE file, void* buffer, DWORD wanted, DWORD& read) const override {
        return ReadFile(file, buffer, wanted, &read, nullptr) != FALSE;
    }
    bool Write(HANDLE file, const void* buffer, DWORD wanted, DWORD& written) const override {
        return WriteFile(file, buffer, wanted, &written, nullptr) != FALSE;
    }
    bool GetTimes(HANDLE file, FileTimes& times) const override {
        return GetFileTime(file, &times.creation, &times.last_access, &times.last_write) != FALSE;
    }
    bool SetTimes(HANDLE file, const FILETIME* creation, const FILETIME* last_access,
                  const FILETIME& last_write) const override {
        return SetFileTime(file, creation, last_access, &last_write) != FALSE;
    }
    bool Close(HANDLE file) const override { return CloseHandle(file) != FALSE; }
    DWORD LastError() const override { return GetLastError(); }

    FoundEntry Find(const std::wstring& path, SearchEnd /*end*/) const override {
        WIN32_FIND_DATAW found;
        const UniqueFind search(FindFirstFileW(path.c_str(), &found));
        return search ? FoundEntry{.kind = KindOf(found.dwFileAttributes),
                                   .write_time = found.ftLastWriteTime,
                                   .name = found.cFileName}
                      : FoundEntry{};
    }
    bool Delete(const std::wstring& path) const override { return DeleteFileW(path.c_str()) != FALSE; }
    bool Move(const std::wstring& from, const std::wstring& to) const override {
        return MoveFileExW(from.c_str(), to.c_str(), 0) != FALSE;
    }
    bool MoveOver(const std::wstring& from, const std::wstring& to) const override {
        return MoveFileExW(from.c_str(), to.c_str(), MOVEFILE_REPLACE_EXISTING) != FALSE;
    }
    int BackupEnd() const override { return INT_MAX; }
};

class DeviceSide final : public Side {
  public:
    HANDLE OpenSource(const std::wstring& path) const override {
        return OrNull(CeCreateFile(PathBuffer(path).Get(), GENERIC_READ, FILE_SHARE_READ, nullptr,
                                   OPEN_EXISTING, FILE_ATTRIBUTE_NORMAL, nullptr));
    }
    HANDLE Create(const std::wstring& path) const override {
        return OrNull(CeCreateFile(PathBuffer(path).Get(), GENERIC_WRITE, FILE_SHARE_READ, nullptr,
                                   CREATE_ALWAYS, FILE_ATTRIBUTE_NORMAL, nullptr));
    }
    bool Read(HANDLE file, void* buffer, DWORD wanted, DWORD& read) const override {
        return CeReadFile(file, buffer, wanted, &read, nullptr) != FALSE;
    }
    bool Write(HANDLE file, const void* buffer, DWORD wanted, DWORD& written) const override {
        return CeWriteFile(file, buffer, wanted, &written, nullptr) != FALSE;
    }
    bool GetTimes(HANDLE file, FileTimes& times) const override {
        return CeGetFileTime(file, &times.creation, &times.last_access, &times.last_write) != FALSE;
    }
    bool SetTimes(HANDLE file, const FILETIME* creation, const FILETIME* last_access,
                  const FILETIME& last_write) const override {
        return CeSetFileTime(file, creation, last_access, &last_write) != FALSE;
    }
    bool Close(HANDLE file) const override { return CeCloseHandle(file) != FALSE; }
    DWORD LastError() const override { return CeGetLastError(); }

    FoundEntry Find(const std::wstring& path, SearchEnd end) const override {
        rapi::FindData found{};
        const HANDLE search = CeFindFirstFile(PathBuffer(path).Get(), &found);
        if (search == INVALID_HANDLE_VALUE || search == nullptr) {
            return {};
        }
        if (end == SearchEnd::kNow) {
            CeFindClose(search);
        }
        found.name[std::size(found.name) - 1] = L'\0';  // The device's answers are not trusted.
        return {.kind = KindOf(found.attributes), .write_time = found.last_write_time, .name = found.name};
    }
    bool Delete(const std::wstring& path) const override {
        return CeDeleteFile(PathBuffer(path).Get()) != FALSE;
    }
    bool Move(const std::wstring& from, const std::wstring& to) const override {
        return CeMoveFile(PathBuffer(from).Get(), PathBuffer(to).Get()) != FALSE;
    }
    bool MoveOver(const std::wstring& from, const std::wstring& to) const override {
        // Whether the old file was really deleted shows by the move, which refuses to replace it.
        Delete(to);
        return Move(from, to);
    }
    // The device's backup names have exactly three digits.
    int BackupEnd() const override { return 1000; }
};

}  // namespace

bool Side::SaysNothingIsThere() const {
    const DWORD error = LastError();
    return error == ERROR_FILE_NOT_FOUND || error == ERROR_PATH_NOT_FOUND || error == ERROR_NO_MORE_FILES;
}

const Side& Side::Pc() {
    static const PcSide side;
    return side;
}

const Side& Side::Device() {
    static const DeviceSide side;
    return side;
}

}  // namespace orvane
