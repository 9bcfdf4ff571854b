#include "settings/settings_store.h"

#include <gtest/gtest.h>
#include <shlobj.h>

#include <array>

#include "settings/registry_strings.h"
#include "tests/support/scratch_registry.h"

namespace orvane {
namespace {

constexpr const wchar_t* kKey = L"Software\\Veltrano\\CE Devices";
constexpr const wchar_t* kAutoStartKey = L"SOFTWARE\\Microsoft\\Windows CE Services\\AutoStartOnConnect";

struct Flag {
    const wchar_t* name;
    std::int32_t SyncSettings::*flag;
};
using S = SyncSettings;
// In the order of the block; Start_File_View is not in it.
constexpr std::array<Flag, 17> kFlags = {{{L"Sync_qvj_files", &S::sync_qvj_files},
                                          {L"Sync_tn3_files", &S::sync_tn3_files},
                                          {L"Sync_rd3_files", &S::sync_rd3_files},
                                          {L"Sync_pt3_files", &S::sync_pt3_files},
                                          {L"Sync_ln3_files", &S::sync_ln3_files},
                                          {L"Sync_jpg_files", &S::sync_jpg_files},
                                          {L"Sync_bmp_files", &S::sync_bmp_files},
                                          {L"Sync_all_files", &S::sync_all_files},
                                          {L"Overwrite_old_files", &S::overwrite_old_files},
                                          {L"Overwrite_bkp", &S::overwrite_bkp},
                                          {L"Overwrite_warn", &S::overwrite_warn},
                                          {L"Sync_img_files", &S::sync_img_files},
                                          {L"Sync_xml_files", &S::sync_xml_files},
                                          {L"Sync_tp3_files", &S::sync_tp3_files},
                                          {L"Sync_wkf_files", &S::sync_wkf_files},
                                          {L"Sync_txt_files", &S::sync_txt_files},
                                          {L"Start_File_View", &S::start_file_view}}};

class SettingsStore : public ::testing::Test {
  protected:
    static std::wstring Documents() {
        std::array<wchar_t, MAX_PATH> path{};
        EXPECT_EQ(SHGetFolderPathW(nullptr, CSIDL_PERSONAL, nullptr, 0, path.data()), S_OK);
        return path.data();
    }
    // What the registry holds, "(none)" for nothing.
    static std::wstring Stored(const wchar_t* name) {
        std::wstring text;
        return RegReadString(HKEY_CURRENT_USER, kKey, name, text) ? text : L"(none)";
    }
    static void Store(const wchar_t* name, const std::wstring& text) {
        ASSERT_TRUE(RegWriteString(HKEY_CURRENT_USER, kKey, name, text));
    }

    testing::ScratchRegistry registry_;
};

TEST_F(SettingsStore, WritesTheDefaultsAtTheFirstStart) {
    const SyncSettings settings = LoadSettings();
    const std::wstring folder = Documents() + L"\\Ferrow\\Office\\Data";
    EXPECT_EQ(settings.sync_path_dt, folder);
    EXPECT_EQ(Stored(L"SyncPath_DT"), folder);
    EXPECT_EQ(settings.sync_path_ce, L"");
    EXPECT_EQ(Stored(L"SyncPath_CE"), L"(none)");
    for (const Flag& flag : kFlags) {
        const bool on = flag.flag == &S::sync_qvj_files || flag.flag == &S::sync_wkf_files;
        EXPECT_EQ(settings.*flag.flag, on ? 1 : 0) << flag.name;
        EXPECT_EQ(Stored(flag.name), on ? L"1" : L"0") << flag.name;
    }
}

TEST_F(SettingsStore, KeepsEveryFlagInAValueAndATextOfItsOwn) {
    SyncSettingsBlock block;
    ASSERT_EQ(&block.sync_txt_files - &block.sync_path_dt, 17) << "texts behind each other";
    for (const Flag& on : kFlags) {
        SyncSettings saved;
        saved.*on.flag = 1;
        SaveSettings(saved);
        const SyncSettings loaded = LoadSettings();
        RefreshSettingsBlock(loaded, block);
        const std::wstring* text = &block.sync_qvj_files;
        for (const Flag& flag : kFlags) {
            const bool is_on = on.flag == flag.flag;
            EXPECT_EQ(Stored(flag.name), is_on ? L"1" : L"0") << on.name << " " << flag.name;
            EXPECT_EQ(loaded.*flag.flag, is_on ? 1 : 0) << on.name << " " << flag.name;
            if (flag.flag != &S::start_file_view) {
                EXPECT_EQ(*text++, is_on ? L"1" : L"0") << on.name << " " << flag.name;
            }
        }
        EXPECT_EQ(ReadStartFileView(), on.flag == &S::start_file_view);
    }
}

TEST_F(SettingsStore, TakesOnlyTheTextOneForOn) {
    for (const wchar_t* text : {L"true", L"yes", L" 1", L"1 ", L"11", L"01", L"2", L"", L"\uFF11"}) {
        Store(L"Sync_qvj_files", text);
        Store(L"Start_File_View", text);
        EXPECT_EQ(LoadSettings().sync_qvj_files, 0) << text;
        EXPECT_FALSE(ReadStartFileView()) << text;
        EXPECT_EQ(Stored(L"Sync_qvj_files"), text) << "not a missing value";
    }
    const std::wstring too_long(510, L'1');
    Store(L"Sync_qvj_files", too_long);
    Store(L"SyncPath_DT", too_long);
    EXPECT_EQ(LoadSettings().sync_qvj_files, 1);
    EXPECT_EQ(Stored(L"Sync_qvj_files"), L"1");
    EXPECT_EQ(Stored(L"SyncPath_DT"), Documents() + L"\\Ferrow\\Office\\Data");
}

TEST_F(SettingsStore, LeavesTheDeviceFolderUnreadWithoutADevice) {
    Store(L"SyncPath_CE", L"\\My Jobs\\");
    Store(L"SyncPath_DT", L"");
    SyncSettings settings = LoadSettings();
    EXPECT_EQ(settings.sync_path_ce, L"");
    EXPECT_EQ(settings.sync_path_dt, L"") << "an empty text is a value";
    SaveSettings(settings);
    EXPECT_EQ(settings.sync_path_ce, L"");
    EXPECT_EQ(Stored(L"SyncPath_CE"), L"\\My Jobs\\");
}

TEST_F(SettingsStore, SavesFoldersWithOneBackslash) {
    const struct {
        const wchar_t* folder;
        const wchar_t* stored;
    } folders[] = {{L"C:\\Jobs", L"C:\\Jobs\\"},
                   {L"\\Jobs\\\\\\", L"\\Jobs\\"},
                   {L"\\", L"\\"},
                   {L"\\\\pc\\a b\\", L"\\\\pc\\a b\\"}};
    for (const auto& c : folders) {
        SyncSettings settings;
        settings.sync_path_dt = settings.sync_path_ce = c.folder;
        SaveSettings(settings);
        for (const std::wstring& folder :
             {settings.sync_path_dt, settings.sync_path_ce, Stored(L"SyncPath_DT"), Stored(L"SyncPath_CE")}) {
            EXPECT_EQ(folder, c.stored);
        }
    }
}

TEST_F(SettingsStore, KeepsTheProgramsPathForTheAutoStart) {
    EXPECT_FALSE(ReadAutoStart());
    HWND window = CreateWindowExW(0, L"STATIC", L"", WS_POPUP | WS_VISIBLE, 0, 0, 9, 9, nullptr, nullptr,
                                  GetModuleHandleW(nullptr), nullptr);
    SetActiveWindow(window);
    std::array<wchar_t, 512> expected{};
    GetWindowModuleFileNameW(window, expected.data(), 511);
    EXPECT_NE(expected[0], L'\0');
    std::wstring stored;
    for (const bool on : {true, false, true}) {
        WriteAutoStart(on, nullptr);
        EXPECT_EQ(ReadAutoStart(), on);
        EXPECT_TRUE(RegReadString(HKEY_LOCAL_MACHINE, kAutoStartKey, L"ORVANE ActiveSync", stored));
        EXPECT_EQ(stored, on ? expected.data() : L"");
    }
    DestroyWindow(window);
}

}  // namespace
}  // namespace orvane
