#include "selection/job_table.h"

#include <gtest/gtest.h>

#include <atomic>
#include <map>
#include <thread>

#include "tests/support/temp_folder.h"

namespace orvane {
namespace {

using testing::MakeFolder;
using testing::TempFolder;
using testing::UtcTime;
using testing::WriteTextFile;

std::map<std::wstring, const FileNode*> ByName(const FileNode& node) {
    std::map<std::wstring, const FileNode*> entries;
    for (const FileNode& child : node.Children()) {
        entries[child.name] = &child;
    }
    return entries;
}

TEST(ListPcFolder, ReadsTheFolderWithOrWithoutWhatLiesBelow) {
    const TempFolder folder;
    const FILETIME time = UtcTime(2024, 3, 1, 12, 30, 15);
    WriteTextFile(folder / L"file.qvj", "12345", time);
    WriteTextFile(folder / L"sub\\.hidden", "1");
    SetFileAttributesW((folder / L"sub\\.hidden").c_str(), FILE_ATTRIBUTE_HIDDEN | FILE_ATTRIBUTE_SYSTEM);
    MakeFolder(folder / L"sub\\empty.qvj");

    for (const bool recurse : {false, true}) {
        FileNode root;
        ASSERT_EQ(ListPcFolder(folder / L"*.*", recurse, root), DeviceResult::kDone);
        const auto entries = ByName(root);
        ASSERT_EQ(root.child_count, 2);
        const FileNode& file = *entries.at(L"file.qvj");
        EXPECT_EQ(file.is_folder, 0);
        EXPECT_EQ(file.size_low, 5U);
        EXPECT_EQ(CompareFileTime(&file.last_write_time, &time), 0);
        const FileNode& sub = *entries.at(L"sub");
        EXPECT_EQ(sub.is_folder, 1);
        ASSERT_EQ(sub.child_count, recurse ? 2 : 0);
        if (recurse) {
            EXPECT_TRUE(ByName(sub).contains(L".hidden"));
            EXPECT_EQ(ByName(sub).at(L"empty.qvj")->is_folder, 1);
        }
    }
}

TEST(ListPcFolder, TellsAMissingFolderFromAnEmptyOne) {
    const TempFolder folder;
    FileNode node;
    EXPECT_EQ(ListPcFolder(folder / L"*.*", true, node), DeviceResult::kDone);
    EXPECT_EQ(node.child_count, 0);
    EXPECT_EQ(ListPcFolder(folder / L"missing\\*.*", true, node), DeviceResult::kFailed);
    EXPECT_EQ(node.child_count, 0);
}

// One sub-folder's search pattern is as long as a path may be, the other's one character longer.
TEST(ListPcFolder, LeavesFoldersEmptyThatAreTooDeep) {
    const TempFolder folder;
    std::wstring parent = folder.Path();
    while (parent.size() < 200) {
        parent += L"\\" + std::wstring(20, L'p');
    }
    const std::wstring fits(255 - parent.size() - 1, L'f');
    const std::wstring deep(fits.size() + 1, L'd');
    for (const std::wstring& name : {fits, deep}) {
        MakeFolder(parent);
        const std::wstring path = L"\\\\?\\" + parent + L"\\" + name;
        ASSERT_TRUE(CreateDirectoryW(path.c_str(), nullptr)) << GetLastError();
        ASSERT_TRUE(CreateDirectoryW((path + L"\\x").c_str(), nullptr)) << GetLastError();
    }
    FileNode node;
    EXPECT_EQ(ListPcFolder(parent + L"\\*.*", true, node), DeviceResult::kDone);
    const auto entries = ByName(node);
    ASSERT_EQ(entries.size(), 2U);
    EXPECT_EQ(entries.at(fits)->child_count, 1);
    EXPECT_EQ(entries.at(deep)->child_count, 0);
}

TEST(ListPcFolder, CountsWhatItReadFromAFolderThatChanges) {
    const TempFolder folder;
    std::atomic<bool> stop{false};
    std::thread writer([&] {
        for (int step = 0; !stop; ++step) {
            const std::wstring file = folder / std::to_wstring(step % 40);
            step / 40 % 2 == 0 ? WriteTextFile(file, "") : static_cast<void>(DeleteFileW(file.c_str()));
        }
    });
    for (int round = 0; round < 500; ++round) {
        FileNode node;
        EXPECT_EQ(ListPcFolder(folder / L"*.*", true, node), DeviceResult::kDone);
        for (const FileNode& child : node.Children()) {
            EXPECT_FALSE(child.name.empty());
        }
    }
    stop = true;
    writer.join();
}

}  // namespace
}  // namespace orvane
