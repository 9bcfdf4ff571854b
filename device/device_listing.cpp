#include "device/device_listing.h"

#include <algorithm>
#include <cstdint>
#include <memory>
#include <optional>

#include "device/connect.h"
#include "device/remote_api.h"
#include "platform/handles.h"
#include "platform/paths.h"
#include "platform/text_case.h"

namespace orvane {

namespace {

constexpr DWORD kWantedFields = rapi::kFindAttributes | rapi::kFindCreationTime | rapi::kFindLastAccessTime |
                                rapi::kFindLastWriteTime | rapi::kFindSizeHigh | rapi::kFindSizeLow |
                                rapi::kFindName;
static_assert(kWantedFields == 0xBF);

// A count beyond this cannot be true: the Remote API's buffers are below 2 GiB.
constexpr DWORD kMaxRecords = INT32_MAX / sizeof(rapi::FindData);

// Whether all of that memory can be read. A device that claims more records than it sent must not make the
// program read beyond them; what lies within readable memory is only names that are not trusted.
bool IsReadable(const void* memory, std::size_t bytes) {
    auto at = reinterpret_cast<std::uintptr_t>(memory);
    const std::uintptr_t end = at + bytes;
    while (at < end) {
        MEMORY_BASIC_INFORMATION region{};
        if (VirtualQuery(reinterpret_cast<const void*>(at), &region, sizeof(region)) == 0 ||
            region.State != MEM_COMMIT || (region.Protect & (PAGE_NOACCESS | PAGE_GUARD)) != 0) {
            return false;
        }
        at = reinterpret_cast<std::uintptr_t>(region.BaseAddress) + region.RegionSize;
    }
    return true;
}

// The records of one folder. Owns the buffer that the Remote API made for them.
class FoundRecords {
  public:
    FoundRecords() = default;
    FoundRecords(const FoundRecords&) = delete;
    FoundRecords& operator=(const FoundRecords&) = delete;
    ~FoundRecords() {
        if (data_ != nullptr) {
            CeRapiFreeBuffer(data_);
        }
    }

    // False when the device refuses or its answer makes no sense.
    bool Find(const std::wstring& pattern) {
        return CeFindAllFiles(pattern.c_str(), kWantedFields, &count_, &data_) &&
               (count_ == 0 || (data_ != nullptr && count_ <= kMaxRecords &&
                                IsReadable(data_, count_ * sizeof(rapi::FindData))));
    }
    std::span<const rapi::FindData> All() const { return {data_, count_}; }

  private:
    DWORD count_ = 0;
    rapi::FindData* data_ = nullptr;
};

bool IsFolder(const rapi::FindData& record) {
    return (record.attributes & FILE_ATTRIBUTE_DIRECTORY) != 0;
}

// The record's name; empty when it has no terminator or cannot be a component of a path.
std::wstring_view TrustedName(const rapi::FindData& record) {
    const auto* end = std::find(std::begin(record.name), std::end(record.name), L'\0');
    const std::wstring_view name(record.name, static_cast<std::size_t>(end - record.name));
    return end != std::end(record.name) && IsPathComponent(name) ? name : std::wstring_view();
}

void CopyRecord(const rapi::FindData& record, std::wstring_view name, FileNode& node) {
    node.name = name;
    node.is_folder = IsFolder(record) ? 1 : 0;
    node.attributes = record.attributes;
    node.creation_time = record.creation_time;
    node.last_access_time = record.last_access_time;
    node.last_write_time = record.last_write_time;
    node.size_high = record.size_high;
    node.size_low = record.size_low;
}

// One listing. It recurses on threads with little stack: what a level needs lies on the heap, and all
// levels share one path, which grows and shrinks.
class Lister {
  public:
    Lister(const std::wstring& folder, std::span<const std::wstring> extensions, bool recursive,
           const CancelEvent& cancel)
        : path_(WithTrailingBackslash(folder)),
          extensions_(extensions),
          recursive_(recursive),
          cancel_(cancel) {}

    // Lists the folder that path_ names into `node`.
    DeviceResult List(FileNode& node) {
        node.child_count = 0;
        node.children.reset();
        if (cancel_.IsSignalled()) {
            return DeviceResult::kListingCancelled;
        }
        FoundRecords found;
        if (const auto result = Find(found)) {
            return *result;
        }
        const auto kept = std::count_if(found.All().begin(), found.All().end(),
                                        [this](const rapi::FindData& record) { return Keeps(record); });
        if (kept == 0) {
            return DeviceResult::kDone;
        }
        node.children = std::make_unique<FileNode[]>(static_cast<std::size_t>(kept));
        for (const rapi::FindData& record : found.All()) {
            if (!Keeps(record)) {
                continue;
            }
            FileNode& child = node.children[static_cast<std::size_t>(node.child_count++)];
            CopyRecord(record, TrustedName(record), child);
            if (recursive_ && child.is_folder != 0) {
                const DeviceResult result = ListSubFolder(child);
                if (result != DeviceResult::kDone) {
                    return result;
                }
            }
        }
        return DeviceResult::kDone;
    }

  private:
    // Fills `found`; a result when the folder is finished with that.
    std::optional<DeviceResult> Find(FoundRecords& found) {
        if (!FitsPathBuffer(path_.size() + 1)) {
            return DeviceResult::kDone;
        }
        path_ += L'*';
        const bool listed = found.Find(path_);
        path_.pop_back();
        return listed ? std::nullopt : std::optional(DeviceResult::kFailed);
    }

    DeviceResult ListSubFolder(FileNode& folder) {
        const std::size_t length = path_.size();
        path_.append(folder.name).append(1, L'\\');
        DeviceResult result = List(folder);
        path_.resize(length);
        if (result == DeviceResult::kFailed && IsDeviceThere(cancel_)) {
            folder.unread = true;
            result = DeviceResult::kDone;
        }
        return result;
    }

    bool Keeps(const rapi::FindData& record) const {
        const std::wstring_view name = TrustedName(record);
        return !name.empty() && (IsFolder(record) || MatchesExtension(name, extensions_));
    }

    std::wstring path_;  // Ends in "\".
    std::span<const std::wstring> extensions_;
    bool recursive_;
    const CancelEvent& cancel_;
};

}  // namespace

DeviceResult ListDeviceFolder(const std::wstring& folder, std::span<const std::wstring> extensions,
                              bool recursive, FileNode& root, const CancelEvent& cancel) {
    return Lister(folder, extensions, recursive, cancel).List(root);
}

DeviceResult ListDeviceFolderFlat(const std::wstring& folder, FileNode& root) {
    return ListDeviceFolder(folder, {}, false, root, nullptr);
}

bool MatchesExtension(std::wstring_view file_name, std::span<const std::wstring> extensions) {
    if (extensions.empty()) {
        return true;
    }
    const std::size_t dot = file_name.rfind(L'.');
    const std::wstring_view extension =
        dot == std::wstring_view::npos ? std::wstring_view() : file_name.substr(dot + 1);
    return std::any_of(extensions.begin(), extensions.end(), [extension](const std::wstring& entry) {
        return entry == L"*" || EqualIgnoringCase(extension, entry);
    });
}

}  // namespace orvane
