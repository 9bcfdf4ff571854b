#include <gmock/gmock.h>
#include <shlobj.h>

#include "tests/settings/settings_values.h"

namespace orvane {
namespace {

using namespace std::string_literals;

class SettingsStore : public ::testing::Test {
  protected:
    testing::ScratchRegistry registry_;
};

TEST_F(SettingsStore, WritesTheDefaultsAtTheFirstStart) {
    std::array<wchar_t, MAX_PATH> documents{};
    EXPECT_EQ(SHGetFolderPathW(nullptr, CSIDL_PERSONAL, nullptr, 0, documents.data()), S_OK);
    const std::wstring folder = documents.data() + std::wstring(L"\\Ferrow\\Office\\Data");
    EXPECT_EQ(LoadSettings().sync_path_dt, folder);
    EXPECT_EQ(Stored(L"SyncPath_DT"), folder);
    EXPECT_EQ(Stored(L"SyncPath_CE"), L"(none)");
    EXPECT_EQ(StoredFlags(), Named({L"Sync_qvj_files", L"Sync_wkf_files"}));
    for (std::size_t i = 0; i < kCount; ++i) {
        EXPECT_NE(Stored(ValueOf(i)), L"(none)") << ValueOf(i);
    }
}

TEST_F(SettingsStore, KeepsEveryFlagInAValueAndATextOfItsOwn) {
    for (std::size_t i = 0; i < kCount; ++i) {
        const Flags on = Flags().set(i);
        SyncSettings settings = SettingsOf(RefreshSettingsBlock(With(on)));
        SaveSettings(settings);
        EXPECT_EQ(StoredFlags(), on & ~Named({L"Start_File_View"})) << ValueOf(i);
    }
    const SyncSettingsBlock block = RefreshSettingsBlock(
        With(Named({L"Sync_bmp_files", L"Sync_all_files", L"Overwrite_bkp", L"Sync_img_files"})));
    EXPECT_THAT(std::vector(block.begin() + 8, block.begin() + 15),
                ::testing::ElementsAre(L"1", L"1", L"0", L"1", L"0", L"1", L"0"));
}

TEST_F(SettingsStore, TakesOnlyTheTextOneForOnAndReplacesWhatCannotBeRead) {
    for (const wchar_t* text : {L"true", L" 1", L"11", L"2", L""}) {
        Store(L"Sync_qvj_files", text);
        Store(L"Start_File_View", text);
        EXPECT_FALSE(LoadSettings().types[RowOfType(L".qvj")]) << text;
        EXPECT_FALSE(ReadStartFileView()) << text;
        EXPECT_EQ(Stored(L"Sync_qvj_files"), text) << "not a missing value";
    }
    Store(L"SyncPath_DT", std::wstring(509, L'x'));
    EXPECT_EQ(LoadSettings().sync_path_dt, std::wstring(509, L'x'));
    Store(L"Sync_qvj_files", std::wstring(510, L'1'));
    EXPECT_TRUE(LoadSettings().types[RowOfType(L".qvj")]);
    EXPECT_EQ(Stored(L"Sync_qvj_files"), L"1");
}

TEST_F(SettingsStore, SurvivesBytesThatAreNoText) {
    const struct {
        DWORD type;
        const void* data;
        DWORD bytes;
        std::wstring expected;
    } cases[] = {{REG_SZ, L"", 0, L""},
                 {REG_SZ, L"a\0b", 4 * 2, L"a"},
                 {REG_SZ, L"abc", 3 * 2, L"abc"},
                 {REG_EXPAND_SZ, L"%TEMP%", 7 * 2, L"%TEMP%"},
                 {REG_BINARY, L"ab", 3, {L'a', L'b'}}};
    Store(L"SyncPath_DT", L"");
    for (const auto& c : cases) {
        ASSERT_EQ(RegSetKeyValueW(HKEY_CURRENT_USER, kKey.c_str(), L"SyncPath_DT", c.type, c.data, c.bytes),
                  0);
        EXPECT_EQ(Stored(L"SyncPath_DT"), c.expected) << (&c - cases);
    }
}

TEST_F(SettingsStore, LeavesTheDeviceFolderUnreadWithoutADevice) {
    Store(L"SyncPath_CE", L"\\My Jobs\\");
    SyncSettings settings = LoadSettings();
    EXPECT_EQ(settings.sync_path_ce, L"");
    SaveSettings(settings);
    EXPECT_EQ(Stored(L"SyncPath_CE"), L"\\My Jobs\\");
}

TEST_F(SettingsStore, TheDeviceFolderGivesWayToTheFirstUsualOneWhenItIsNotOnTheDevice) {
    const testing::FolderDevice device;
    testing::MakeFolder(device.PcPath(L"\\My Jobs"));
    testing::WriteTextFile(device.PcPath(L"\\file"), "");
    for (const std::wstring& usual :
         {L""s, L"\\ROMDisk\\PROGRAM\\Ferrow Field\\Jobs"s, L"\\CF Card\\Qel ORVANE\\Jobs"s,
          L"\\Program Files\\Ferrow Field\\Jobs"s}) {
        testing::MakeFolder(device.PcPath(usual + L"\\"));
        for (const std::wstring& gone : {L"\\gone\\"s, L"\\file"s, L""s, L"\\" + std::wstring(300, L'x')}) {
            Store(L"SyncPath_CE", gone);
            EXPECT_EQ(LoadSettings().sync_path_ce, usual) << gone;
            EXPECT_EQ(Stored(L"SyncPath_CE"), usual.empty() ? gone : usual);
        }
        for (const wchar_t* there : {L"\\my jobs\\", L"\\My Jobs", L"\\"}) {
            Store(L"SyncPath_CE", there);
            EXPECT_EQ(LoadSettings().sync_path_ce, there);
            EXPECT_EQ(Stored(L"SyncPath_CE"), there);
        }
    }
}

TEST_F(SettingsStore, NoFailedCallPutsAnotherFolderInPlaceOfTheStoredOne) {
    testing::FolderDevice device;
    testing::MakeFolder(device.PcPath(L"\\CF Card\\Qel ORVANE\\Jobs"));  // The second candidate.
    Store(L"SyncPath_CE", L"\\My Jobs\\");
    for (const wchar_t* fault : {L"FAIL_CALL", L"VANISH"}) {
        // The stored folder is looked for, then one candidate after the other.
        for (int call = 1; call <= 3; ++call) {
            device.Set(fault, std::to_wstring(call));
            EXPECT_EQ(FindDeviceJobFolder(), call == 1 ? L"\\My Jobs\\" : L"") << fault << call;
            EXPECT_EQ(Stored(L"SyncPath_CE"), L"\\My Jobs\\") << fault << call;
        }
        device.Clear(fault);
    }
    EXPECT_EQ(FindDeviceJobFolder(), L"\\CF Card\\Qel ORVANE\\Jobs");
}

}  // namespace
}  // namespace orvane
