#include "copy/file_copy.h"

#include "copy/content_copy.h"
#include "copy/target_path.h"
#include "device/connect.h"
#include "device/remote_api.h"
#include "platform/file_time.h"
#include "platform/text_case.h"

namespace orvane {

namespace {

// All three times of the source; that of the listing where they cannot be read.
FileTimes TimesOf(const Side& side, HANDLE source, const FileToCopy& file) {
    FileTimes times{};
    return side.GetTimes(source, times) ? times
                                        : FileTimes{file.write_time, file.write_time, file.write_time};
}

// `times` are the source's. Of a pass it is meant that the times of an open file are asked for first and the
// answer thrown away: on the device with the PC's handle.
bool Date(const CopyContext& context, const FileToCopy& file, const FileTimes& times, HANDLE source,
          HANDLE target) {
    const Side& side = context.Target();
    if (context.purpose == Purpose::kManualView) {
        return side.SetTimes(target, &times.creation, &times.last_access, times.last_write);
    }
    if (context.purpose == Purpose::kPass) {
        if (context.direction == Direction::kPcToDevice) {
            CeGetFileTime(source, nullptr, nullptr, nullptr);
        } else {
            GetFileTime(target, nullptr, nullptr, nullptr);
        }
    }
    return side.SetTimes(target, nullptr, nullptr, file.write_time);
}

// `size` and `times` are the source's.
DeviceResult CopyAndDate(const CopyContext& context, const FileToCopy& file, HANDLE source, HANDLE target,
                         std::uint64_t size, const FileTimes& times) {
    const DeviceResult result = CopyContent(context, source, target, size);
    return result == DeviceResult::kDone && !Date(context, file, times, source, target)
               ? DeviceResult::kFailed
               : result;
}

// The last step: the whole copy beside the target takes its name.
class Placing {
  public:
    Placing(const FileToCopy& file, const CopyContext& context, const std::wstring& aside)
        : file_(file),
          context_(context),
          side_(context.Target()),
          target_(file.paths.Target(context.direction)),
          aside_(aside) {}

    DeviceResult Run() const {
        const bool placed = Place();
        // Where the old file is gone and the new one has not got its name, a whole copy stays beside it.
        if (!placed && !(file_.target_time && Look().kind == EntryKind::kNone)) {
            side_.Delete(aside_);
        }
        return placed ? DeviceResult::kDone : DeviceResult::kFailed;
    }

    bool TargetIsAsListed() const {
        const FoundEntry target = Look();
        return target.kind == EntryKind::kNone || (target.kind == EntryKind::kFile && file_.target_time &&
                                                   SameFileTime(target.write_time, *file_.target_time));
    }

  private:
    bool Place() const {
        // A move refuses to replace what no listing has seen; nothing need be looked at first.
        const FoundEntry old_file = file_.target_time ? Look() : FoundEntry{};
        switch (old_file.kind) {
            case EntryKind::kNone:
                return side_.Move(aside_, target_);
            case EntryKind::kFolder:
                return false;
            case EntryKind::kFile:
                break;
        }
        // By another name it is found where the target's is the short name of that file.
        const std::wstring target = JoinPath(ParentPath(target_), old_file.name);
        if (!SameFileTime(old_file.write_time, *file_.target_time) || !EqualIgnoringCase(target, target_)) {
            return false;
        }
        return context_.old_file == OldFile::kKept ? PlaceAndKeep(target) : side_.MoveOver(aside_, target);
    }

    // In place of the old file, whose name stays in the case that it has.
    bool PlaceAndKeep(const std::wstring& target) const {
        const std::wstring backup = MoveToBackup(side_, target);
        if (backup.empty()) {
            return false;
        }
        if (side_.Move(aside_, target)) {
            return true;
        }
        side_.Move(backup, target);
        return false;
    }

    FoundEntry Look() const {
        return side_.Find(target_,
                          context_.session == Session::kOwn ? SearchEnd::kWithSession : SearchEnd::kNow);
    }

    const FileToCopy& file_;
    const CopyContext& context_;
    const Side& side_;
    const std::wstring& target_;
    const std::wstring& aside_;
};

// Places the copy after what has to be done before. That may take long: the target is looked at ahead of it,
// too, so that nothing is done in vain, and nobody else must have begun a copy of the same file meanwhile.
DeviceResult PlaceAfter(const BeforePlacing& before_placing, const FileToCopy& file,
                        const CopyContext& context, const std::wstring& aside) {
    const Side& side = context.Target();
    const Placing placing(file, context, aside);
    if (!before_placing) {
        return placing.Run();
    }
    const FoundEntry whole = side.Find(aside);
    DeviceResult result = placing.TargetIsAsListed() ? before_placing() : DeviceResult::kFailed;
    const FoundEntry now = side.Find(aside);
    if (now.kind != EntryKind::kFile || !SameFileTime(now.write_time, whole.write_time)) {
        return DeviceResult::kFailed;
    }
    if (result == DeviceResult::kDone) {
        return placing.Run();
    }
    side.Delete(aside);
    return result;
}

// Ends a copy to the device that failed: closes and deletes what was written, and closes the session if it is
// the copy's own.
void AbandonOnDevice(DeviceResult result, HANDLE target, const std::wstring& aside, DeviceSession& session,
                     const CopyContext& context) {
    if (context.session == Session::kCallers) {
        Side::Device().Close(target);
        Side::Device().Delete(aside);
        return;
    }
    DeleteDeviceFileAfterClose(target, aside);
    session.Release();
    if (result == DeviceResult::kDiskFull) {
        // Meant: after a full disk the handle and the session are closed a second time.
        CeCloseHandle(target);
        CeRapiUninit();
    }
}

// Ahead of the first chunk. The connection of a session of the copy's own does not come about when the event
// is signalled, so that the event has been looked at just now.
bool IsCancelled(const CopyContext& context) {
    return context.session == Session::kOwn ? context.cancel.Poll() : context.cancel.IsSignalled();
}

CopyOutcome NotBegun() {
    return {DeviceResult::kFailed, /*begun=*/false};
}

CopyOutcome CopyToDevice(const FileToCopy& file, const CopyContext& context,
                         const BeforePlacing& before_placing) {
    const SideFile source(Side::Pc(), Side::Pc().OpenSource(file.paths.pc));
    LARGE_INTEGER size{};
    if (!source || !GetFileSizeEx(source.Get(), &size)) {
        return NotBegun();
    }
    const FileTimes times = TimesOf(Side::Pc(), source.Get(), file);
    DeviceSession session(context.cancel, context.session);
    if (!session) {
        return {DeviceResult::kFailed};
    }
    if (IsCancelled(context)) {
        return {DeviceResult::kCancelled};
    }
    const std::wstring aside = AsidePath(file.paths.device);
    SideFile target(Side::Device(), Side::Device().Create(aside));
    if (!target) {
        return NotBegun();
    }
    const DeviceResult result = CopyAndDate(context, file, source.Get(), target.Get(),
                                            static_cast<std::uint64_t>(size.QuadPart), times);
    if (result != DeviceResult::kDone) {
        AbandonOnDevice(result, target.Release(), aside, session, context);
        return {result};
    }
    if (!target.Close()) {
        Side::Device().Delete(aside);
        return {DeviceResult::kFailed};
    }
    return {PlaceAfter(before_placing, file, context, aside)};
}

CopyOutcome CopyToPc(const FileToCopy& file, const CopyContext& context,
                     const BeforePlacing& before_placing) {
    DeviceSession session(context.cancel, context.session);
    if (!session) {
        return {DeviceResult::kFailed};
    }
    SideFile source(Side::Device(), Side::Device().OpenSource(file.paths.device));
    if (!source) {
        return NotBegun();
    }
    if (IsCancelled(context)) {
        return {DeviceResult::kCancelled};
    }
    const std::wstring aside = AsidePath(file.paths.pc);
    SideFile target(Side::Pc(), Side::Pc().Create(aside));
    if (!target) {
        return NotBegun();
    }
    FileTimes times{};
    if (context.purpose == Purpose::kManualView) {
        times = TimesOf(Side::Device(), source.Get(), file);
    }
    DeviceResult result = CopyAndDate(context, file, source.Get(), target.Get(), file.size, times);
    if (result == DeviceResult::kDiskFull) {
        // Meant: at once, while the file is still open. Where the system refuses that because the file is not
        // shared, it is deleted below like any other.
        Side::Pc().Delete(aside);
    }
    source.Close();
    session.Close();
    if (!target.Close() && result == DeviceResult::kDone) {
        result = DeviceResult::kFailed;
    }
    if (result != DeviceResult::kDone) {
        Side::Pc().Delete(aside);
        return {result};
    }
    return {PlaceAfter(before_placing, file, context, aside)};
}

}  // namespace

CopyOutcome CopyPcFileToDeviceWithBackup(const FileToCopy& file, const CopyContext& context,
                                         const BeforePlacing& before_placing) {
    return CopyToDevice(file, context, before_placing);
}

CopyOutcome CopyDeviceFileToPcWithBackup(const FileToCopy& file, const CopyContext& context,
                                         const BeforePlacing& before_placing) {
    return CopyToPc(file, context, before_placing);
}

CopyOutcome CopyPcFileToDevice(const FileToCopy& file, const CopyContext& context) {
    return CopyToDevice(file, context, {});
}

CopyOutcome CopyDeviceFileToPc(const FileToCopy& file, const CopyContext& context) {
    return CopyToPc(file, context, {});
}

HANDLE OpenDeviceFile(const std::wstring& device_path, DWORD access, DWORD share_mode, DWORD creation,
                      const CancelEvent& cancel, Session session) {
    DeviceSession own(cancel, session);
    if (!own) {
        return INVALID_HANDLE_VALUE;
    }
    const HANDLE file = CeCreateFile(PathBuffer(device_path).Get(), access, share_mode, nullptr, creation,
                                     FILE_ATTRIBUTE_NORMAL, nullptr);
    if (file != INVALID_HANDLE_VALUE) {
        own.Release();  // The caller's, with the file.
    }
    return file;
}

BOOL DeleteDeviceFileAfterClose(HANDLE file, const std::wstring& device_path) {
    CeCloseHandle(file);
    const BOOL deleted = CeDeleteFile(PathBuffer(device_path).Get());
    CeRapiUninit();  // Meant: also when the session is a caller's.
    return deleted;
}

}  // namespace orvane
