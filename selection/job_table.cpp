#include "selection/job_table.h"

#include <algorithm>
#include <iterator>
#include <memory>
#include <span>

#include "platform/handles.h"
#include "platform/paths.h"
#include "platform/text_case.h"
#include "qelutils/text_format.h"
#include "qelutils/xlate.h"

namespace orvane {

namespace {

constexpr std::wstring_view kEverything = L"*.*";

// A folder as the file system knows it, whatever path led there.
struct FolderIdentity {
    DWORD volume = 0;
    DWORD index_high = 0;
    DWORD index_low = 0;

    bool operator==(const FolderIdentity&) const = default;
};

std::optional<FolderIdentity> IdentityOf(const std::wstring& folder) {
    const UniqueFile handle(CreateFileW(folder.c_str(), 0,
                                        FILE_SHARE_READ | FILE_SHARE_WRITE | FILE_SHARE_DELETE, nullptr,
                                        OPEN_EXISTING, FILE_FLAG_BACKUP_SEMANTICS, nullptr));
    BY_HANDLE_FILE_INFORMATION information{};
    if (!handle || !GetFileInformationByHandle(handle.Get(), &information)) {
        return std::nullopt;
    }
    return FolderIdentity{information.dwVolumeSerialNumber, information.nFileIndexHigh,
                          information.nFileIndexLow};
}

// Whether the link leads to a folder on the way to it. One that leads nowhere, or cannot be followed, cannot
// be listed either.
bool LeadsBack(const std::wstring& link) {
    const std::optional<FolderIdentity> target = IdentityOf(link);
    for (std::wstring_view folder = ParentPath(link); target && !folder.empty();
         folder = ParentPath(folder)) {
        if (IdentityOf(WithTrailingBackslash(folder)) == target) {
            return true;
        }
    }
    return false;
}

void FillNode(const WIN32_FIND_DATAW& data, FileNode& node) {
    node.name = data.cFileName;
    node.is_folder = (data.dwFileAttributes & FILE_ATTRIBUTE_DIRECTORY) != 0 ? 1 : 0;
    node.attributes = data.dwFileAttributes;
    node.creation_time = data.ftCreationTime;
    node.last_access_time = data.ftLastAccessTime;
    node.last_write_time = data.ftLastWriteTime;
    node.size_low = data.nFileSizeLow;
}

// What a search found, "." and ".." left out, and the error that it ended with: ERROR_NO_MORE_FILES if it
// found anything, be it "." alone, and came to its regular end.
struct Found {
    std::vector<FileNode> entries;
    DWORD error = ERROR_SUCCESS;
};

Found Search(const std::wstring& pattern) {
    Found found;
    WIN32_FIND_DATAW data;
    const UniqueFind search(FindFirstFileW(pattern.c_str(), &data));
    if (!search) {
        found.error = GetLastError();
        return found;
    }
    do {
        const std::wstring_view name = data.cFileName;
        if (name != L"." && name != L"..") {
            FillNode(data, found.entries.emplace_back());
        }
    } while (FindNextFileW(search.Get(), &data));
    found.error = GetLastError();
    return found;
}

// Lists the folder of the pattern. ERROR_SUCCESS, or why it could not be read.
DWORD ListFolder(const std::wstring& pattern, bool recurse, FileNode& node, const CancelEvent& stop);

void ListSubFolder(const std::wstring& path, FileNode& folder, const CancelEvent& stop) {
    const std::wstring pattern = path + L"\\" + std::wstring(kEverything);
    const bool is_link = (folder.attributes & FILE_ATTRIBUTE_REPARSE_POINT) != 0;
    folder.unread = stop.Poll() || !FitsPathBuffer(pattern.size()) || (is_link && LeadsBack(path)) ||
                    ListFolder(pattern, true, folder, stop) != ERROR_SUCCESS;
}

DWORD ListFolder(const std::wstring& pattern, bool recurse, FileNode& node, const CancelEvent& stop) {
    Found found = Search(pattern);
    if (found.error != ERROR_NO_MORE_FILES) {
        return found.error;
    }
    if (found.entries.empty()) {
        return ERROR_SUCCESS;
    }
    node.children = std::make_unique<FileNode[]>(found.entries.size());
    node.child_count = static_cast<std::int32_t>(found.entries.size());
    std::move(found.entries.begin(), found.entries.end(), node.children.get());
    const std::wstring folder(pattern, 0, pattern.size() - kEverything.size());
    for (FileNode& child : std::span(node.children.get(), found.entries.size())) {
        if (recurse && child.is_folder != 0) {
            ListSubFolder(folder + child.name, child, stop);
        }
    }
    return ERROR_SUCCESS;
}

void CollectUnread(const FileNode& node, const std::wstring& prefix, std::vector<std::wstring>& unread) {
    for (const FileNode& child : node.Children()) {
        if (child.unread) {
            unread.push_back(prefix + child.name + L"\\");
        } else if (child.is_folder != 0) {
            CollectUnread(child, prefix + child.name + L"\\", unread);
        }
    }
}

}  // namespace

DeviceResult ListPcFolder(const std::wstring& pattern, bool recurse, FileNode& node) {
    return ListFolder(pattern, recurse, node, nullptr) == ERROR_SUCCESS ? DeviceResult::kDone
                                                                        : DeviceResult::kFailed;
}

FileNode ListPcTree(const std::wstring& folder, const CancelEvent& stop) {
    FileNode root;
    const DWORD error = ListFolder(JoinPath(folder, kEverything), true, root, stop);
    root.unread = error != ERROR_SUCCESS && error != ERROR_FILE_NOT_FOUND && error != ERROR_PATH_NOT_FOUND;
    return root;
}

JobTable::JobTable(const FileNode& root) {
    FlattenTree(table, rows, root, {}, CountEntries(0, root));
    CollectUnread(root, L"\\", unread_);
}

bool JobTable::IsUnknown(std::wstring_view name) const {
    return std::any_of(unread_.begin(), unread_.end(), [name](const std::wstring& folder) {
        return name.size() > folder.size() && EqualIgnoringCase(name.substr(0, folder.size()), folder);
    });
}

std::optional<JobTable> ListPcJobFolder(const std::wstring& folder, const CancelEvent& stop) {
    if (!IsPcFolderNamed(folder)) {
        return JobTable();
    }
    const FileNode root = ListPcTree(folder, stop);
    return root.unread ? std::nullopt : std::optional<JobTable>(root);
}

std::wstring UnreadableFolderText(const std::wstring& folder) {
    return qel_text::detail::qel_safefmt_impl(Xlate(L"The folder {1} on the PC cannot be read."),
                                              {WithoutTrailingBackslashes(folder)});
}

}  // namespace orvane
