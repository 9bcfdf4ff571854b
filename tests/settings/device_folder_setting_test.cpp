#include <gtest/gtest.h>

#include "settings/registry_strings.h"
#include "settings/settings_store.h"
#include "tests/support/folder_device.h"
#include "tests/support/scratch_registry.h"

namespace orvane {
namespace {

constexpr const wchar_t* kKey = L"Software\\Veltrano\\CE Devices";
constexpr const wchar_t* kName = L"SyncPath_CE";
constexpr const wchar_t* kCandidates[] = {L"\\Program Files\\Ferrow Field\\Jobs",
                                          L"\\CF Card\\Qel ORVANE\\Jobs",
                                          L"\\ROMDisk\\PROGRAM\\Ferrow Field\\Jobs"};

class DeviceFolderSetting : public ::testing::Test {
  protected:
    // What is loaded, and stored afterwards, where `stored` is in the registry before.
    void ExpectLoaded(const std::wstring& stored, const std::wstring& expected, const std::wstring& kept) {
        RegWriteString(HKEY_CURRENT_USER, kKey, kName, stored);
        EXPECT_EQ(LoadSettings().sync_path_ce, expected) << stored;
        std::wstring text;
        RegReadString(HKEY_CURRENT_USER, kKey, kName, text);
        EXPECT_EQ(text, kept) << stored;
        EXPECT_EQ(device_.CloseSessions(), 0);
    }

    testing::ScratchRegistry registry_;
    testing::FolderDevice device_;
};

TEST_F(DeviceFolderSetting, StandsWhileItIsOnTheDevice) {
    testing::MakeFolder(device_.PcPath(L"\\My Jobs\\North"));
    testing::MakeFolder(device_.PcPath(kCandidates[0]));
    for (const wchar_t* stored : {L"\\My Jobs\\North\\", L"\\My Jobs\\North", L"\\my jobs\\", L"\\"}) {
        ExpectLoaded(stored, stored, stored);
    }
}

TEST_F(DeviceFolderSetting, GivesWayToTheFirstUsualFolder) {
    testing::WriteTextFile(device_.PcPath(L"\\file"), "");
    const std::wstring gone[] = {L"\\gone\\", L"\\file", L"", L"\\" + std::wstring(300, L'x')};
    for (const std::wstring& stored : gone) {
        ExpectLoaded(stored, L"", stored);
    }
    for (const wchar_t* candidate : {kCandidates[2], kCandidates[1], kCandidates[0]}) {
        testing::MakeFolder(device_.PcPath(candidate));
        for (const std::wstring& stored : gone) {
            ExpectLoaded(stored, candidate, candidate);
        }
    }
}

}  // namespace
}  // namespace orvane
