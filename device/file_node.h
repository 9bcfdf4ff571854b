// One entry of a folder listing, on the PC or the device, and the root of one.
#pragma once

#include <windows.h>

#include <cstdint>
#include <memory>
#include <span>
#include <string>

namespace orvane {

// The root of a listing has an empty name; its children are the folder's entries. A node owns its children,
// and so a root its whole tree. Times are UTC, sizes bytes.
struct FileNode {
    std::wstring name;  // The entry's own name, no path.
    std::unique_ptr<FileNode[]> children;
    std::int32_t child_count = 0;
    std::uint8_t is_folder = 0;  // 1 for a folder.
    bool unread = false;         // A folder whose entries a listing could not get: it has none here.
    std::uint32_t attributes = 0;
    FILETIME creation_time = {};
    FILETIME last_access_time = {};
    FILETIME last_write_time = {};
    std::uint32_t size_high = 0;
    std::uint32_t size_low = 0;

    std::uint64_t Size() const { return (std::uint64_t{size_high} << 32U) | size_low; }
    std::span<const FileNode> Children() const {
        return {children.get(), static_cast<std::size_t>(child_count)};
    }
};

}  // namespace orvane
