// What the device folder tree decides with: the order of siblings, the pieces of a path, the pictures.
#pragma once

#include <string>
#include <string_view>
#include <vector>

#include "device/file_node.h"

namespace orvane {

// The pictures of the tree's items, as indices of its state image list. Picture 0 is never shown: an index
// of 0 means no picture.
enum class TreePicture : unsigned { kOpenFolder = 1, kClosedFolder = 2, kFile = 3 };

// The picture of an item that nobody has touched yet. A folder without kept entries has nothing to open and
// shows as open.
TreePicture InitialPicture(const FileNode& node);

// Folders before files, and by name without regard to case within each. Negative, 0 or positive.
int CompareSiblings(const FileNode& a, const FileNode& b);

// The non-empty pieces of a device path between its "\", in order.
std::vector<std::wstring_view> PathPieces(std::wstring_view path);

}  // namespace orvane
