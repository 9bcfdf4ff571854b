#include "copy/content_copy.h"

#include <algorithm>
#include <memory>

namespace orvane {

namespace {

constexpr DWORD kChunkBytes = 8192;
// Larger ones gain nothing and 1 MiB loses, measured with files of 8 MB.
constexpr DWORD kMaxPieceBytes = 16 * kChunkBytes;

// What the PC's side holds of a file at a time: room for the whole of a small one and a byte that it may have
// grown by, in full chunks.
class Piece {
  public:
    explicit Piece(std::uint64_t file_size)
        : capacity_(static_cast<DWORD>(std::min<std::uint64_t>(file_size, kMaxPieceBytes - 1)) / kChunkBytes *
                        kChunkBytes +
                    kChunkBytes),
          bytes_(std::make_unique_for_overwrite<BYTE[]>(capacity_)) {}

    DWORD Capacity() const { return capacity_; }
    BYTE* At(DWORD offset) const { return bytes_.get() + offset; }

  private:
    DWORD capacity_;
    std::unique_ptr<BYTE[]> bytes_;
};

// Writes all of it, in as many calls as the side wants: once also for a chunk of nothing.
DeviceResult WriteAll(const Side& to, HANDLE target, const BYTE* data, DWORD wanted) {
    do {
        DWORD written = 0;
        if (!to.Write(target, data, wanted, written)) {
            return to.LastError() == ERROR_DISK_FULL ? DeviceResult::kDiskFull : DeviceResult::kFailed;
        }
        // No progress is no success, and a count beyond the data no count.
        if (written > wanted || (written == 0 && wanted > 0)) {
            return DeviceResult::kFailed;
        }
        data += written;
        wanted -= written;
    } while (wanted > 0);
    return DeviceResult::kDone;
}

class ContentCopy {
  public:
    ContentCopy(const CopyContext& context, HANDLE source, HANDLE target, std::uint64_t size)
        : context_(context), source_(source), target_(target), size_(size), piece_(size) {}

    DeviceResult ToDevice() {
        while (!at_end_) {
            if (!ReadPiece()) {
                return DeviceResult::kFailed;
            }
            const DeviceResult result = WriteChunks();
            if (result != DeviceResult::kDone) {
                return result;
            }
        }
        return DeviceResult::kDone;
    }

    DeviceResult ToPc() {
        while (!at_end_) {
            if (context_.cancel.Poll()) {
                return DeviceResult::kCancelled;
            }
            if (!Read(kChunkBytes)) {
                return DeviceResult::kFailed;
            }
            if (at_end_ || piece_.Capacity() - held_ < kChunkBytes) {
                const DeviceResult result = WriteAll(Side::Pc(), target_, piece_.At(0), held_);
                if (result != DeviceResult::kDone) {
                    return result;
                }
                held_ = 0;
            }
        }
        return DeviceResult::kDone;
    }

  private:
    // Reads up to that many bytes behind those that are held. False when the source cannot be read or ends
    // before its size.
    bool Read(DWORD wanted) {
        DWORD read = 0;
        // A count beyond the buffer is no count: the device's answers are not trusted.
        if (!context_.Source().Read(source_, piece_.At(held_), wanted, read) || read > wanted) {
            return false;
        }
        held_ += read;
        copied_ += read;
        at_end_ = read < wanted && copied_ >= size_;
        return read > 0 || at_end_;
    }

    bool ReadPiece() {
        held_ = 0;
        while (!at_end_ && held_ < piece_.Capacity()) {
            if (!Read(piece_.Capacity() - held_)) {
                return false;
            }
        }
        return true;
    }

    // All full chunks of the piece, and at the end of the source what is left, be it nothing.
    DeviceResult WriteChunks() {
        for (DWORD offset = 0; offset + kChunkBytes <= held_ || at_end_; offset += kChunkBytes) {
            if (context_.cancel.Poll()) {
                return DeviceResult::kCancelled;
            }
            const DWORD chunk = std::min(kChunkBytes, held_ - offset);
            const DeviceResult result = WriteAll(Side::Device(), target_, piece_.At(offset), chunk);
            if (result != DeviceResult::kDone || chunk < kChunkBytes) {
                return result;
            }
        }
        return DeviceResult::kDone;
    }

    const CopyContext& context_;
    const HANDLE source_;
    const HANDLE target_;
    const std::uint64_t size_;
    const Piece piece_;
    DWORD held_ = 0;  // Bytes in the piece.
    std::uint64_t copied_ = 0;
    bool at_end_ = false;  // Of the source.
};

}  // namespace

DeviceResult CopyContent(const CopyContext& context, HANDLE source, HANDLE target, std::uint64_t size) {
    ContentCopy copy(context, source, target, size);
    return context.direction == Direction::kPcToDevice ? copy.ToDevice() : copy.ToPc();
}

}  // namespace orvane
