#include "selection/pc_listing.h"

#include <cwchar>
#include <optional>
#include <string_view>

#include "platform/handles.h"
#include "platform/paths.h"

namespace orvane {

namespace {

constexpr std::wstring_view kEverything = L"*.*";

// One pass over all that a pattern finds, "." and ".." left out.
class PcSearch {
  public:
    explicit PcSearch(const std::wstring& pattern) : find_(FindFirstFileW(pattern.c_str(), &data_)) {}

    // Whether the search found anything, be it "." alone, and went on to its regular end.
    bool ReachedEnd() const { return reached_end_; }

    // Steps to the next entry, the first one at the first call. Null after the last.
    const WIN32_FIND_DATAW* Next() {
        do {
            if (!find_) {
                return nullptr;
            }
            if (started_ && !FindNextFileW(find_.Get(), &data_)) {
                reached_end_ = GetLastError() == ERROR_NO_MORE_FILES;
                return nullptr;
            }
            started_ = true;
        } while (std::wcscmp(data_.cFileName, L".") == 0 || std::wcscmp(data_.cFileName, L"..") == 0);
        return &data_;
    }

  private:
    WIN32_FIND_DATAW data_{};
    UniqueFind find_;
    bool started_ = false;
    bool reached_end_ = false;
};

// The number of entries that the pattern finds; nothing when it finds none at all or the search breaks off.
std::optional<std::int32_t> CountFound(const std::wstring& pattern) {
    PcSearch search(pattern);
    std::int32_t count = 0;
    while (search.Next() != nullptr) {
        ++count;
    }
    return search.ReachedEnd() ? std::optional(count) : std::nullopt;
}

void FillNode(const WIN32_FIND_DATAW& data, FileNode& node) {
    node.name = data.cFileName;
    node.is_folder = (data.dwFileAttributes & FILE_ATTRIBUTE_DIRECTORY) != 0 ? 1 : 0;
    node.creation_time = data.ftCreationTime;
    node.last_access_time = data.ftLastAccessTime;
    node.last_write_time = data.ftLastWriteTime;
    node.size_low = data.nFileSizeLow;
}

}  // namespace

DeviceResult ListPcFolder(const std::wstring& pattern, bool recurse, FileNode& node) {
    const std::optional<std::int32_t> capacity = CountFound(pattern);
    if (!capacity) {
        return DeviceResult::kFailed;
    }
    if (*capacity == 0) {
        return DeviceResult::kDone;
    }
    node.children = std::make_unique<FileNode[]>(static_cast<std::size_t>(*capacity));

    // The folder may change between the two passes: entries that are new are left out, and the count is that
    // of the entries that were really filled.
    const std::wstring folder(pattern, 0, pattern.size() - kEverything.size());
    PcSearch filling(pattern);
    while (node.child_count < *capacity) {
        const WIN32_FIND_DATAW* data = filling.Next();
        if (data == nullptr) {
            return filling.ReachedEnd() ? DeviceResult::kDone : DeviceResult::kFailed;
        }
        FileNode& child = node.children[static_cast<std::size_t>(node.child_count++)];
        FillNode(*data, child);
        if (child.is_folder == 0 || !recurse) {
            continue;
        }
        const std::wstring sub_pattern = folder + child.name + L"\\" + std::wstring(kEverything);
        if (!FitsPathBuffer(sub_pattern.size())) {
            continue;
        }
        if (const DeviceResult result = ListPcFolder(sub_pattern, recurse, child);
            result != DeviceResult::kDone) {
            return result;
        }
    }
    return DeviceResult::kDone;
}

}  // namespace orvane
