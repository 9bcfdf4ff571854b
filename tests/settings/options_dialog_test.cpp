#include "settings/options_dialog.h"

#include "res/ids.h"
#include "tests/settings/settings_values.h"
#include "tests/support/dialog_script.h"
#include "tests/support/message_boxes.h"

namespace orvane {
namespace {

using testing::Press;

const std::wstring kAutoStartKey = L"SOFTWARE\\Microsoft\\Windows CE Services\\AutoStartOnConnect";
const Flags kAll = Named({L"Sync_all_files"});
const Flags kOverwrite = Named({L"Overwrite_old_files"});
const Flags kWarn = Named({L"Overwrite_warn"});
const Flags kDependent = Named({L"Overwrite_warn", L"Overwrite_bkp"});
const Flags kTypes = Those([](std::size_t i) { return i < kTypeCount; });

int BoxOf(std::size_t i) {
    return i < kTypeCount ? kFileTypes[i].box : kFlagSettings[i - kTypeCount].box;
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

void Type(HWND dialog, const wchar_t* pc_folder, const wchar_t* device_folder) {
    SetDlgItemTextW(dialog, IDC_OPTIONS_PC_FOLDER, pc_folder);
    SetDlgItemTextW(dialog, IDC_OPTIONS_DEVICE_FOLDER, device_folder);
}

std::wstring Folders(HWND dialog) {
    return testing::ItemText(dialog, IDC_OPTIONS_PC_FOLDER) + L" " +
           testing::ItemText(dialog, IDC_OPTIONS_DEVICE_FOLDER);
}

// Presses a "Browse" button and, when the field of what opens shows `start`, `button` there.
void Browse(HWND dialog, int browse, int button, const std::wstring& start) {
    const bool device = browse == IDC_OPTIONS_DEVICE_BROWSE;
    HWND opened = nullptr;
    Press(dialog, browse);
    EXPECT_TRUE(testing::WaitUntil([&] {
        opened = FindWindowW(L"#32770", device ? L"Mobile Device Browse" : L"Select Directory");
        return opened != nullptr &&
               testing::ItemText(opened, device ? IDC_BROWSE_FOLDER : IDC_FOLDER_DIRECTORY) == start;
    }));
    Press(opened, button);
    EXPECT_TRUE(testing::WaitUntil([&] { return !IsWindow(opened) && IsWindowEnabled(dialog); }));
}

class OptionsDialog : public ::testing::Test {
  protected:
    OptionsDialog() { SetActiveWindow(owner_); }
    ~OptionsDialog() override { DestroyWindow(owner_); }

    // What the dialog begins with. It does not look at the folders that are stored.
    void Set(const Flags& ticked, const std::wstring& pc_folder = L"C:\\") {
        SyncSettings settings = With(ticked);
        settings.sync_path_dt = L"C:\\stored";
        settings.sync_path_ce = L"\\stored";
        SaveSettings(settings);
        settings.sync_path_dt = pc_folder;
        settings.sync_path_ce = L"\\Jobs\\";
        block_ = RefreshSettingsBlock(settings);
    }
    void Run(const std::function<void(HWND)>& script) {
        testing::RunWithScript([&] { return RunOptions(owner_, block_) ? IDOK : IDCANCEL; }, script);
    }

    testing::ScratchRegistry registry_;
    testing::FolderDevice device_;
    SyncSettingsBlock block_;
    HWND owner_ = CreateWindowExW(0, L"STATIC", L"", WS_POPUP | WS_VISIBLE, 0, 0, 9, 9, nullptr, nullptr,
                                  GetModuleHandleW(nullptr), nullptr);
};

TEST_F(OptionsDialog, TheBoxOfATypeDecidesOnAllFiles) {
    // What is clicked, what is unticked after that, and whether "All files." is off ("0"), on ("1") or as it
    // was.
    const wchar_t* const cases[][3] = {
        {L"qvj", L"", L"1"},        {L"qvj", L"qvj", L"0"}, {L"qvj", L"bmp", L""},  {L"jpg", L"", L"1"},
        {L"jpg", L"txt", L""},      {L"bmp", L"", L""},     {L"bmp", L"bmp", L""},  {L"img", L"bmp", L"1"},
        {L"img", L"img", L"0"},     {L"img", L"qvj", L""},  {L"wkf", L"bmp", L"1"}, {L"wkf", L"bmp txt", L""},
        {L"txt", L"bmp txt", L"1"}, {L"txt", L"wkf", L"0"}, {L"txt", L"tp3", L""},
    };
    const auto types = [](std::wstring_view names) {
        return Those([&](std::size_t i) {
            return i < kTypeCount && names.find(kFileTypes[i].extension.substr(1)) != std::wstring_view::npos;
        });
    };
    COptionsDlg dialog(block_, owner_);
    ASSERT_TRUE(dialog.Create());
    for (const auto& [clicked, unticked, all_files] : cases) {
        for (const Flags& before : {kAll, Flags()}) {
            const Flags ticked = kTypes & ~types(unticked);
            Tick(dialog.Handle(), (ticked ^ types(clicked)) | before);
            for (std::size_t i = 0; i < kTypeCount; ++i) {
                if (types(clicked)[i]) {
                    Click(dialog.Handle(), BoxOf(i));
                }
            }
            const Flags all = *all_files == L'\0' ? before : *all_files == L'1' ? kAll : Flags();
            EXPECT_EQ(Ticked(dialog.Handle()), ticked | all) << clicked << L" " << unticked;
        }
    }
}

TEST_F(OptionsDialog, EveryTypeHasABoxThatNamesIt) {
    COptionsDlg dialog(block_, owner_);
    ASSERT_TRUE(dialog.Create());
    for (const FileType& type : kFileTypes) {
        EXPECT_EQ(testing::ItemText(dialog.Handle(), type.box),
                  L"Copy *" + std::wstring(type.extension) + L" files.");
    }
}

TEST_F(OptionsDialog, SelectAllAndAllFilesTickEveryType) {
    Set(kWarn | kOverwrite);
    COptionsDlg dialog(block_, owner_);
    ASSERT_TRUE(dialog.Create());
    for (const Flags& expected : {kTypes, kTypes | kAll, Flags()}) {
        Click(dialog.Handle(), expected == kTypes ? IDC_OPTIONS_SELECT_ALL : IDC_OPTIONS_ALL_FILES);
        EXPECT_EQ(Ticked(dialog.Handle()), expected | kWarn | kOverwrite);
    }
}

TEST_F(OptionsDialog, WarningAndBackupDependOnOverwriting) {
    for (const Flags& at_start : {kDependent, kDependent | kOverwrite}) {
        Set(at_start);
        COptionsDlg dialog(block_, owner_);
        ASSERT_TRUE(dialog.Create());
        bool on = at_start != kDependent;
        EXPECT_EQ(Ticked(dialog.Handle()), on ? at_start : Flags());
        for (int clicks = 0; clicks < 2; ++clicks, on = !on) {
            EXPECT_EQ(IsWindowEnabled(GetDlgItem(dialog.Handle(), IDC_OPTIONS_WARN)) != FALSE, on);
            EXPECT_EQ(IsWindowEnabled(GetDlgItem(dialog.Handle(), IDC_OPTIONS_BACKUP)) != FALSE, on);
            Click(dialog.Handle(), IDC_OPTIONS_OVERWRITE);
        }
        // Of two that were ticked the warning stays so.
        EXPECT_EQ(Ticked(dialog.Handle()), on ? kWarn | kOverwrite : Flags());
    }
}

TEST_F(OptionsDialog, OkStoresAndCancelDoesNot) {
    // An empty folder on the device leaves the one that is stored.
    const std::array<std::array<const wchar_t*, 2>, 3> folders = {
        {{L"\\typed\\\\", L"\\typed\\"}, {L"", L"\\stored\\"}, {L"\\", L"\\"}}};
    for (std::size_t run = 0; run < 2 * kCount; ++run) {
        const bool ok = run % 2 == 0;
        const auto& [typed, stored] = folders[run / 2 % folders.size()];
        const Flags box = Flags(1) << run / 2;
        const Flags ticked = (box & kDependent).any() ? box | kOverwrite : box;
        Set(ticked);
        Run([&](HWND dialog) {
            EXPECT_EQ(Ticked(dialog), ticked);
            EXPECT_EQ(Folders(dialog), L"C:\\ \\Jobs\\");
            Type(dialog, L"C:\\typed", typed);
            Tick(dialog, ticked ^ kOverwrite);
            Press(dialog, ok ? IDOK : IDCANCEL);
        });
        EXPECT_EQ(StoredFlags(), ok ? ticked ^ kOverwrite : ticked);
        EXPECT_EQ(Stored(L"SyncPath_DT"), ok ? L"C:\\typed\\" : L"C:\\stored\\");
        EXPECT_EQ(Stored(L"SyncPath_CE"), ok ? stored : L"\\stored\\");
    }
}

TEST_F(OptionsDialog, FieldsTakeWhatCanBeFoundAgain) {
    Set({});
    Run([&](HWND dialog) {
        for (const int field : {IDC_OPTIONS_PC_FOLDER, IDC_OPTIONS_DEVICE_FOLDER}) {
            SetDlgItemTextW(dialog, field, L"\\");
            SendDlgItemMessageW(dialog, field, EM_SETSEL, 1, 1);
            for (int i = 0; i < 600; ++i) {
                SendDlgItemMessageW(dialog, field, WM_CHAR, L'x', 1);
            }
        }
        Press(dialog, IDOK);
    });
    EXPECT_EQ(Stored(L"SyncPath_DT"), L"\\" + std::wstring(507, L'x') + L"\\");
    EXPECT_EQ(Stored(L"SyncPath_CE"), L"\\" + std::wstring(257, L'x') + L"\\");
}

TEST_F(OptionsDialog, AutoStartFollowsTheBoxAfterOkOnly) {
    constexpr const wchar_t* kValue = L"ORVANE ActiveSync";
    std::array<wchar_t, MAX_PATH> program{};
    GetModuleFileNameW(nullptr, program.data(), MAX_PATH);
    for (unsigned run = 0; run < 8; ++run) {
        const bool was_on = (run & 1U) != 0;
        const bool toggled = (run & 2U) != 0;
        const bool ok = (run & 4U) != 0;
        Store(kValue, was_on ? L"C:\\elsewhere.exe" : L"", HKEY_LOCAL_MACHINE, kAutoStartKey);
        Run([&](HWND dialog) {
            EXPECT_EQ(IsDlgButtonChecked(dialog, IDC_OPTIONS_AUTO_START) != 0, was_on);
            if (toggled) {
                Click(dialog, IDC_OPTIONS_AUTO_START);
                Click(dialog, IDC_OPTIONS_SELECT_ALL);  // Takes the values of all boxes.
            }
            Press(dialog, ok ? IDOK : IDCANCEL);
        });
        EXPECT_EQ(Stored(kValue, HKEY_LOCAL_MACHINE, kAutoStartKey),
                  was_on != (toggled && ok) ? program.data() : L"")
            << run;
    }
}

TEST_F(OptionsDialog, OnlyAChosenPcFolderDropsWhatWasTyped) {
    const testing::TempFolder pc_folder;
    testing::MakeFolder(device_.PcPath(L"\\Jobs\\North"));
    Set(kOverwrite, pc_folder.Path());
    Run([&](HWND dialog) {
        const std::wstring& pc = pc_folder.Path();
        const std::wstring typed = L"C:\\a \\jobs\\north\\b";
        const Flags both = kWarn | kOverwrite;
        const struct {
            int browse, button;
            std::wstring start, folders;
            Flags ticked;
        } runs[] = {{IDC_OPTIONS_PC_BROWSE, IDCANCEL, pc, typed, both},
                    {IDC_OPTIONS_PC_BROWSE, IDOK, pc, pc + L" \\Jobs\\", kOverwrite},
                    {IDC_OPTIONS_DEVICE_BROWSE, IDCANCEL, L"\\Jobs\\North\\", typed, both},
                    {IDC_OPTIONS_DEVICE_BROWSE, IDOK, L"\\Jobs\\North\\", L"C:\\a \\Jobs\\North\\", both}};
        for (const auto& run : runs) {
            Type(dialog, L"C:\\a", L"\\jobs\\north\\b");
            Tick(dialog, both);
            Browse(dialog, run.browse, run.button, run.start);
            EXPECT_EQ(Folders(dialog), run.folders);
            EXPECT_EQ(Ticked(dialog), run.ticked);
        }
    });
}

TEST_F(OptionsDialog, KeepsTheDeviceFolderWhenTheDeviceCannotBeRead) {
    const testing::MessageBoxAnswerer boxes({IDOK});
    device_.Set(L"REFUSE", L"CeFindAllFiles=5");
    Run([&](HWND dialog) {
        Type(dialog, L"C:\\a", L"\\jobs\\");
        Press(dialog, IDC_OPTIONS_DEVICE_BROWSE);
        HWND browser = nullptr;
        EXPECT_TRUE(testing::WaitUntil([&] {
            browser = FindWindowW(L"#32770", L"Mobile Device Browse");
            return browser != nullptr && boxes.Seen().size() == 1 && IsWindowEnabled(browser);
        }));
        Press(browser, IDOK);
        EXPECT_TRUE(testing::WaitUntil([&] { return !IsWindow(browser) && IsWindowEnabled(dialog); }));
        EXPECT_EQ(Folders(dialog), L"C:\\a \\jobs\\");
    });
}

}  // namespace
}  // namespace orvane
