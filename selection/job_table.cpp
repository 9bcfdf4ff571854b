#include "selection/job_table.h"

#include "platform/paths.h"
#include "selection/pc_listing.h"

namespace orvane {

JobTable::JobTable(const FileNode& root) {
    FlattenTree(table, rows, root, {}, CountEntries(0, root));
}

bool IsPcFolderNamed(const std::wstring& folder) {
    return !WithoutTrailingBackslashes(folder).empty();
}

JobTable ListPcJobFolder(const std::wstring& folder) {
    if (!IsPcFolderNamed(folder)) {
        return {};
    }
    FileNode root;
    const DeviceResult result = ListPcFolder(JoinPath(folder, L"*.*"), true, root);
    JobTable listing(root);
    listing.complete = result == DeviceResult::kDone;
    return listing;
}

}  // namespace orvane
