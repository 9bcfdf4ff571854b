// The settings in the registry, and the real options dialog that changes them.
#include <gtest/gtest.h>
#include <shlobj.h>

#include "platform/resources.h"
#include "res/ids.h"
#include "settings/options_dialog.h"
#include "tests/support/dialog_script.h"
#include "tests/support/folder_device.h"
#include "tests/support/scratch_registry.h"

namespace orvane::testing {
namespace {

using namespace std::string_literals;

const std::wstring kKey = L"Software\\Veltrano\\CE Devices";

// What the registry holds, "(none)" for nothing.
std::wstring Stored(const std::wstring& name) {
    std::wstring text;
    return RegReadString(HKEY_CURRENT_USER, kKey, name, text) ? text : L"(none)";
}

void Store(const std::wstring& name, const std::wstring& text) {
    ASSERT_TRUE(RegWriteString(HKEY_CURRENT_USER, kKey, name, text));
}

// All flags: the rows of the table of types, then those of the other flags.
constexpr std::size_t kTypeCount = kFileTypes.size();
constexpr std::size_t kCount = kTypeCount + kFlagSettings.size();
using Flags = std::bitset<kCount>;

std::wstring ValueOf(std::size_t i) {
    return i < kTypeCount ? L"Sync_" + std::wstring(kFileTypes[i].extension.substr(1)) + L"_files"
                          : ResourceString(kFlagSettings[i - kTypeCount].setting);
}

int BoxOf(std::size_t i) {
    return i < kTypeCount ? kFileTypes[i].box : kFlagSettings[i - kTypeCount].box;
}

template <class Condition>
Flags Those(Condition condition) {
    Flags flags;
    for (std::size_t i = 0; i < kCount; ++i) {
        flags[i] = condition(i);
    }
    return flags;
}

Flags Named(const std::vector<std::wstring>& values) {
    return Those([&](std::size_t i) { return std::ranges::find(values, ValueOf(i)) != values.end(); });
}

Flags StoredFlags() {
    return Those([](std::size_t i) { return Stored(ValueOf(i)) == L"1"; });
}

Flags Ticked(HWND dialog) {
    return Those([&](std::size_t i) { return IsDlgButtonChecked(dialog, BoxOf(i)) == BST_CHECKED; });
}

// Without telling the dialog.
void Tick(HWND dialog, const Flags& boxes) {
    for (std::size_t i = 0; i < kCount; ++i) {
        CheckDlgButton(dialog, BoxOf(i), boxes[i] ? BST_CHECKED : BST_UNCHECKED);
    }
}

void Click(HWND dialog, int id) {
    SendDlgItemMessageW(dialog, id, BM_CLICK, 0, 0);
}

// As the user does, who cannot exceed the field's limit.
void Type(HWND dialog, const std::wstring& pc_folder, const std::wstring& device_folder) {
    for (const int field : {IDC_OPTIONS_PC_FOLDER, IDC_OPTIONS_DEVICE_FOLDER}) {
        const std::wstring& text = field == IDC_OPTIONS_PC_FOLDER ? pc_folder : device_folder;
        SetDlgItemTextW(dialog, field, L"");
        SendDlgItemMessageW(dialog, field, EM_REPLACESEL, 0, reinterpret_cast<LPARAM>(text.c_str()));
    }
}

std::wstring Folders(HWND dialog) {
    return ItemText(dialog, IDC_OPTIONS_PC_FOLDER) + L" " + ItemText(dialog, IDC_OPTIONS_DEVICE_FOLDER);
}

const Flags kAll = Named({L"Sync_all_files"});
const Flags kOverwrite = Named({L"Overwrite_old_files"});
const Flags kWarn = Named({L"Overwrite_warn"});
const Flags kDependent = Named({L"Overwrite_warn", L"Overwrite_bkp"});
const Flags kTypes = Those([](std::size_t i) { return i < kTypeCount; });

class SettingsTest : public ::testing::Test {
  protected:
    SettingsTest() { SetActiveWindow(owner_); }
    ~SettingsTest() override { DestroyWindow(owner_); }

    // What the options dialog begins with. It does not look at the folders that are stored.
    void Set(const Flags& ticked, const std::wstring& pc_folder = L"C:\\") {
        for (std::size_t i = 0; i < kCount; ++i) {
            Store(ValueOf(i), ticked[i] ? L"1" : L"0");
        }
        Store(L"SyncPath_DT", L"C:\\stored\\");
        SyncSettings settings = LoadSettings();
        Store(L"SyncPath_CE", L"\\stored\\");
        settings.sync_path_dt = pc_folder;
        settings.sync_path_ce = L"\\Jobs\\";
        block_ = RefreshSettingsBlock(settings);
    }
    void Run(const std::function<void(HWND)>& script) {
        RunWithScript([&] { return RunOptions(owner_, block_) ? IDOK : IDCANCEL; }, script);
    }

    ScratchRegistry registry_;
    FolderDevice device_;
    SyncSettingsBlock block_;
    HWND owner_ = CreateWindowExW(0, L"STATIC", L"", WS_POPUP | WS_VISIBLE, 0, 0, 9, 9, nullptr, nullptr,
                                  GetModuleHandleW(nullptr), nullptr);
};

TEST_F(SettingsTest, WritesTheDefaultsAtTheFirstStart) {
    std::array<wchar_t, MAX_PATH> documents{};
    EXPECT_EQ(SHGetFolderPathW(nullptr, CSIDL_PERSONAL, nullptr, 0, documents.data()), S_OK);
    const std::wstring folder = documents.data() + L"\\Ferrow\\Office\\Data"s;
    EXPECT_EQ(LoadSettings().sync_path_dt, folder);
    EXPECT_EQ(Stored(L"SyncPath_DT"), folder);
    EXPECT_EQ(Stored(L"SyncPath_CE"), L"(none)");
    EXPECT_EQ(StoredFlags(), Named({L"Sync_qvj_files", L"Sync_wkf_files"}));
    EXPECT_TRUE(Those([](std::size_t i) { return Stored(ValueOf(i)) == L"(none)"; }).none());
}

TEST_F(SettingsTest, ReadsWhateverTheRegistryHolds) {
    for (const wchar_t* text : {L"true", L" 1", L"11", L"2", L""}) {
        Store(L"Sync_qvj_files", text);
        EXPECT_FALSE(LoadSettings().types[RowOfType(L".qvj")]) << text;
        EXPECT_EQ(Stored(L"Sync_qvj_files"), text) << "not a missing value";
    }
    Store(L"Sync_qvj_files", std::wstring(510, L'1'));
    EXPECT_TRUE(LoadSettings().types[RowOfType(L".qvj")]) << "too long to be read: the default";
    const std::tuple<DWORD, std::wstring, DWORD, std::wstring> cases[] = {
        {REG_SZ, L"abc", 3 * 2, L"abc"},  // Without a terminator.
        {REG_BINARY, L"ab", 3, {L'a', L'b'}},
        {REG_SZ, std::wstring(509, L'x'), 510 * 2, std::wstring(509, L'x')}};
    for (const auto& [type, data, bytes, expected] : cases) {
        RegSetKeyValueW(HKEY_CURRENT_USER, kKey.c_str(), L"SyncPath_DT", type, data.c_str(), bytes);
        EXPECT_EQ(LoadSettings().sync_path_dt, expected);
    }
}

TEST_F(SettingsTest, TheDeviceFolderGivesWayToTheFirstUsualOneWhenItIsNotOnTheDevice) {
    MakeFolder(device_.PcPath(L"\\My Jobs"));
    WriteTextFile(device_.PcPath(L"\\file"), "");
    for (const std::wstring& usual :
         {L""s, L"\\ROMDisk\\PROGRAM\\Ferrow Field\\Jobs"s, L"\\CF Card\\Qel ORVANE\\Jobs"s,
          L"\\Program Files\\Ferrow Field\\Jobs"s}) {
        MakeFolder(device_.PcPath(usual + L"\\"));
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

TEST_F(SettingsTest, NoFailedCallPutsAnotherFolderInPlaceOfTheStoredOne) {
    MakeFolder(device_.PcPath(L"\\CF Card\\Qel ORVANE\\Jobs"));  // The second candidate.
    Store(L"SyncPath_CE", L"\\My Jobs\\");
    for (const wchar_t* fault : {L"FAIL_CALL", L"VANISH"}) {
        // The stored folder is looked for, then one candidate after the other.
        for (int call = 1; call <= 3; ++call) {
            device_.Set(fault, std::to_wstring(call));
            EXPECT_EQ(FindDeviceJobFolder(CancelEvent()), call == 1 ? L"\\My Jobs\\" : L"") << fault << call;
            EXPECT_EQ(Stored(L"SyncPath_CE"), L"\\My Jobs\\") << fault << call;
        }
        device_.Clear(fault);
    }
    EXPECT_EQ(FindDeviceJobFolder(CancelEvent()), L"\\CF Card\\Qel ORVANE\\Jobs");
}

TEST_F(SettingsTest, BoxesFollowTheUserAndOneAnother) {
    for (const Flags& at_start : {kDependent, kDependent | kOverwrite}) {
        Set(at_start);
        COptionsDlg dialog(block_, owner_);
        ASSERT_TRUE(dialog.Create());
        bool on = at_start != kDependent;
        EXPECT_EQ(Ticked(dialog.Handle()), on ? at_start : Flags());
        for (int clicks = 0; clicks < 2; ++clicks, on = !on) {
            for (const int box : {IDC_OPTIONS_WARN, IDC_OPTIONS_BACKUP}) {
                EXPECT_EQ(IsWindowEnabled(GetDlgItem(dialog.Handle(), box)) != FALSE, on);
            }
            Click(dialog.Handle(), IDC_OPTIONS_OVERWRITE);
        }
        // Of two that were ticked the warning stays so.
        const Flags left = on ? kWarn | kOverwrite : Flags();
        EXPECT_EQ(Ticked(dialog.Handle()), left);
        for (const FileType& type : kFileTypes) {
            Click(dialog.Handle(), type.box);
        }
        EXPECT_EQ(Ticked(dialog.Handle()), kTypes | kAll | left);
        for (const Flags& types : {Flags(), kTypes, kTypes | kAll}) {
            Click(dialog.Handle(), types == kTypes ? IDC_OPTIONS_SELECT_ALL : IDC_OPTIONS_ALL_FILES);
            EXPECT_EQ(Ticked(dialog.Handle()), types | left);
        }
    }
}

TEST_F(SettingsTest, OkStoresAndCancelDoesNot) {
    const std::wstring auto_start_key = L"SOFTWARE\\Microsoft\\Windows CE Services\\AutoStartOnConnect";
    std::array<wchar_t, MAX_PATH> program{};
    GetModuleFileNameW(nullptr, program.data(), MAX_PATH);
    // An empty folder on the device leaves the one that is stored; what is longer than can be found again is
    // not taken in.
    const std::wstring x(600, L'x');
    const std::pair<std::wstring, std::wstring> folders[] = {
        {L"\\typed\\\\", L"\\typed\\"},
        {L"", L"\\stored\\"},
        {L"\\", L"\\"},
        {L"\\" + x, L"\\" + x.substr(600 - 257) + L"\\"}};
    for (std::size_t run = 0; run < 2 * kCount; ++run) {
        const bool ok = run % 2 == 0;
        const bool starts = run / 2 % 2 == 0;
        const bool toggled = run / 4 % 2 == 0;
        const auto& [typed, stored] = folders[run / 2 % std::size(folders)];
        const Flags box = Flags(1) << run / 2;
        const Flags ticked = (box & kDependent).any() ? box | kOverwrite : box;
        Set(ticked);
        RegWriteString(HKEY_LOCAL_MACHINE, auto_start_key, L"ORVANE ActiveSync",
                       starts ? L"C:\\old.exe" : L"");
        Run([&, typed = typed](HWND dialog) {
            EXPECT_EQ(Ticked(dialog), ticked);
            EXPECT_EQ(Folders(dialog), L"C:\\ \\Jobs\\");
            EXPECT_EQ(IsDlgButtonChecked(dialog, IDC_OPTIONS_AUTO_START) != 0, starts);
            CheckDlgButton(dialog, IDC_OPTIONS_AUTO_START, starts != toggled);
            Click(dialog, IDC_OPTIONS_SELECT_ALL);  // Takes the values of all boxes.
            Type(dialog, L"C:\\" + x, typed);
            Tick(dialog, ticked ^ kOverwrite);
            Press(dialog, ok ? IDOK : IDCANCEL);
        });
        EXPECT_EQ(StoredFlags(), ok ? ticked ^ kOverwrite : ticked);
        EXPECT_EQ(Stored(L"SyncPath_DT"), ok ? L"C:\\" + x.substr(600 - 505) + L"\\" : L"C:\\stored\\");
        EXPECT_EQ(Stored(L"SyncPath_CE"), ok ? stored : L"\\stored\\");
        std::wstring path;
        RegReadString(HKEY_LOCAL_MACHINE, auto_start_key, L"ORVANE ActiveSync", path);
        EXPECT_EQ(path, starts != (toggled && ok) ? program.data() : L"") << run;
    }
}

TEST_F(SettingsTest, OnlyAChosenPcFolderDropsWhatWasTyped) {
    const TempFolder pc_folder;
    const std::wstring& pc = pc_folder.Path();
    MakeFolder(device_.PcPath(L"\\Jobs\\North"));
    const std::wstring typed = L"\\jobs\\north\\b";
    const Flags both = kWarn | kOverwrite;
    Set(kOverwrite, pc);
    // The button that opens, the one that closes, what is typed before, where it opens, what is left.
    const std::tuple<int, int, std::wstring, std::wstring, std::wstring> runs[] = {
        {IDC_OPTIONS_PC_BROWSE, IDCANCEL, typed, pc, L"C:\\a " + typed},
        {IDC_OPTIONS_PC_BROWSE, IDOK, typed, pc, pc + L" \\Jobs\\"},
        {IDC_OPTIONS_DEVICE_BROWSE, IDOK, typed, L"\\Jobs\\North\\", L"C:\\a \\Jobs\\North\\"},
        // Nothing is selected, as on a device that cannot be read.
        {IDC_OPTIONS_DEVICE_BROWSE, IDOK, L"\\gone\\", L"", L"C:\\a \\gone\\"}};
    Run([&](HWND dialog) {
        for (const auto& [browse, button, device_folder, start, folders] : runs) {
            const bool device = browse == IDC_OPTIONS_DEVICE_BROWSE;
            Type(dialog, L"C:\\a", device_folder);
            Tick(dialog, both);
            HWND opened = nullptr;
            Press(dialog, browse);
            EXPECT_TRUE(
                WaitUntil([&, start = start, field = device ? IDC_BROWSE_FOLDER : IDC_FOLDER_DIRECTORY] {
                    opened = FindWindowW(L"#32770", device ? L"Mobile Device Browse" : L"Select Directory");
                    return opened != nullptr && ItemText(opened, field) == start;
                }));
            Press(opened, button);
            EXPECT_TRUE(WaitUntil([&] { return !IsWindow(opened) && IsWindowEnabled(dialog); }));
            EXPECT_EQ(Folders(dialog), folders);
            EXPECT_EQ(Ticked(dialog), device || button == IDCANCEL ? both : kOverwrite);
        }
    });
}

}  // namespace
}  // namespace orvane::testing
