#include "browse/dir_tree_rules.h"

#include <cwchar>

namespace orvane {

TreePicture InitialPicture(const FileNode& node) {
    if (node.is_folder == 0) {
        return TreePicture::kFile;
    }
    return node.child_count > 0 ? TreePicture::kClosedFolder : TreePicture::kOpenFolder;
}

int CompareSiblings(const FileNode& a, const FileNode& b) {
    if (a.is_folder != b.is_folder) {
        return a.is_folder != 0 ? -1 : 1;
    }
    return _wcsicmp(a.name.c_str(), b.name.c_str());
}

std::vector<std::wstring_view> PathPieces(std::wstring_view path) {
    std::vector<std::wstring_view> pieces;
    while (!path.empty()) {
        const std::size_t length = path.find(L'\\');
        if (length != 0) {
            pieces.push_back(path.substr(0, length));
        }
        path = length == std::wstring_view::npos ? std::wstring_view() : path.substr(length + 1);
    }
    return pieces;
}

}  // namespace orvane
