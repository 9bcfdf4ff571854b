#include "settings/options_dialog.h"

#include <gtest/gtest.h>

#include <commctrl.h>

#include <array>
#include <bitset>

#include "res/ids.h"
#include "settings/registry_strings.h"
#include "tests/support/dialog_script.h"
#include "tests/support/folder_device.h"
#include "tests/support/scratch_registry.h"

namespace orvane {
namespace {

using testing::Press;

const std::wstring kKey = L"Software\\Veltrano\\CE Devices";
const std::wstring kAutoStartKey = L"SOFTWARE\\Microsoft\\Windows CE Services\\AutoStartOnConnect";

// The boxes in the order of the block.
constexpr std::array kIds = {1021, 1022, 1023, 1024, 1025, 1027, 1029, 1026,
                             1038, 1039, 1040, 1028, 1030, 1031, 1032, 1033};
constexpr std::size_t kCount = kIds.size();
constexpr std::array<const wchar_t*, kCount> kNames = {L"qvj", L"tn3", L"rd3", L"pt3", L"ln3",  L"jpg",
                                                       L"bmp", L"all", L"old", L"bkp", L"warn", L"img",
                                                       L"xml", L"tp3", L"wkf", L"txt"};

using Boxes = std::bitset<kCount>;

template <class Condition>
Boxes Those(Condition condition) {
    Boxes boxes;
    for (std::size_t i = 0; i < kCount; ++i) {
        boxes[i] = condition(i);
    }
    return boxes;
}

Boxes Named(std::wstring_view names) {
    return Those([&](std::size_t i) { return names.find(kNames[i]) != std::wstring_view::npos; });
}

const Boxes kAll = Named(L"all");
const Boxes kOverwrite = Named(L"old");
const Boxes kWarn = Named(L"warn");
const Boxes kTypes = Named(L"qvj tn3 rd3 pt3 ln3 jpg bmp img xml tp3 wkf txt");

Boxes Ticked(HWND dialog) {
    return Those([&](std::size_t i) { return IsDlgButtonChecked(dialog, kIds[i]) == BST_CHECKED; });
}

// Without telling the dialog.
void Tick(HWND dialog, const Boxes& boxes) {
    for (std::size_t i = 0; i < kCount; ++i) {
        CheckDlgButton(dialog, kIds[i], boxes[i] ? BST_CHECKED : BST_UNCHECKED);
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
        return testing::ItemText(opened, device ? IDC_BROWSE_FOLDER : IDC_FOLDER_DIRECTORY) == start;
    }));
    Press(opened, button);
    EXPECT_TRUE(testing::WaitUntil([&] { return !IsWindow(opened) && IsWindowEnabled(dialog); }));
}

std::wstring Stored(const wchar_t* name, HKEY root = HKEY_CURRENT_USER, const std::wstring& key = kKey) {
    std::wstring text;
    return RegReadString(root, key, name, text) ? text : L"(none)";
}

class OptionsDialog : public ::testing::Test {
  protected:
    OptionsDialog() {
        const INITCOMMONCONTROLSEX controls = {sizeof(controls), ICC_WIN95_CLASSES};
        InitCommonControlsEx(&controls);
        SetActiveWindow(owner_);
    }
    ~OptionsDialog() override { DestroyWindow(owner_); }

    // What the dialog begins with.
    void Set(const Boxes& ticked, const std::wstring& pc_folder = L"C:\\") {
        block_.sync_path_dt = pc_folder;
        block_.sync_path_ce = L"\\Jobs\\";
        for (std::size_t i = 0; i < kCount; ++i) {
            (&block_.sync_qvj_files)[i] = ticked[i] ? L"1" : L"0";
        }
    }
    // After OK the block is what the user made of it.
    bool Run(const std::function<void(HWND)>& script) {
        std::optional<SyncSettings> saved;
        testing::RunWithScript([&] { return (saved = RunOptions(owner_, block_)) ? IDOK : IDCANCEL; },
                               script);
        if (saved) {
            RefreshSettingsBlock(*saved, block_);
        }
        return saved.has_value();
    }

    testing::ScratchRegistry registry_;
    testing::FolderDevice device_;
    SyncSettingsBlock block_;
    HWND owner_ = CreateWindowExW(0, L"STATIC", L"", WS_POPUP | WS_VISIBLE, 0, 0, 9, 9, nullptr, nullptr,
                                  GetModuleHandleW(nullptr), nullptr);
};

TEST_F(OptionsDialog, TypeBoxesDecideOnAllFiles) {
    const Boxes some = Named(L"tn3 bmp xml txt");
    const struct {
        int clicked;
        Boxes before, after;
    } cases[] = {{IDC_OPTIONS_QVJ, kTypes ^ Named(L"qvj"), kTypes | kAll},
                 {IDC_OPTIONS_QVJ, kTypes | kAll, kTypes ^ Named(L"qvj")},
                 {IDC_OPTIONS_QVJ, some | kAll, some | kAll | Named(L"qvj")},
                 {IDC_OPTIONS_BMP, kTypes ^ Named(L"bmp"), kTypes},
                 // These overlook that box,
                 {IDC_OPTIONS_IMG, kTypes ^ Named(L"bmp img"), (kTypes | kAll) ^ Named(L"bmp")},
                 // and this one itself, too; it goes by its neighbour.
                 {IDC_OPTIONS_TXT, kTypes, (kTypes | kAll) ^ Named(L"txt")},
                 {IDC_OPTIONS_TXT, (kTypes | kAll) ^ Named(L"wkf txt"), kTypes ^ Named(L"wkf")},
                 {IDC_OPTIONS_SELECT_ALL, some | kWarn | kOverwrite, kTypes | kWarn | kOverwrite},
                 {IDC_OPTIONS_ALL_FILES, some | kOverwrite, kTypes | kAll | kOverwrite},
                 {IDC_OPTIONS_ALL_FILES, kTypes | kAll, Boxes()}};
    COptionsDlg dialog(block_, owner_);
    ASSERT_TRUE(dialog.Create());
    for (const auto& c : cases) {
        Tick(dialog.Handle(), c.before);
        Click(dialog.Handle(), c.clicked);
        EXPECT_EQ(Ticked(dialog.Handle()), c.after) << (&c - cases);
    }
}

TEST_F(OptionsDialog, WarningAndBackupDependOnOverwriting) {
    for (bool on : {false, true}) {
        const Boxes at_start = Named(on ? L"old warn bkp" : L"warn bkp");
        Set(at_start);
        COptionsDlg dialog(block_, owner_);
        ASSERT_TRUE(dialog.Create());
        EXPECT_EQ(Ticked(dialog.Handle()), on ? at_start : Boxes());
        for (int clicks = 0; clicks < 2; ++clicks, on = !on) {
            EXPECT_EQ(IsWindowEnabled(GetDlgItem(dialog.Handle(), IDC_OPTIONS_WARN)) != FALSE, on);
            EXPECT_EQ(IsWindowEnabled(GetDlgItem(dialog.Handle(), IDC_OPTIONS_BACKUP)) != FALSE, on);
            Click(dialog.Handle(), IDC_OPTIONS_OVERWRITE);
        }
        // Of two that were ticked the warning stays so.
        EXPECT_EQ(Ticked(dialog.Handle()), on ? kWarn | kOverwrite : Boxes());
    }
}

TEST_F(OptionsDialog, OkStoresAndCancelDoesNot) {
    for (std::size_t run = 0; run < kCount; ++run) {
        const Boxes made = Boxes(1) << run;
        RegWriteString(HKEY_CURRENT_USER, kKey, L"SyncPath_CE", L"\\stored");
        Set(kTypes);
        EXPECT_TRUE(Run([&](HWND dialog) {
            EXPECT_EQ(Ticked(dialog), kTypes);
            EXPECT_EQ(Folders(dialog), L"C:\\ \\Jobs\\");
            Type(dialog, L"C:\\typed", run % 2 == 0 ? L"\\typed\\\\" : L"");
            Tick(dialog, made);
            CheckDlgButton(dialog, IDC_OPTIONS_START_FILE_VIEW, run % 2 == 0 ? BST_CHECKED : BST_UNCHECKED);
            Press(dialog, IDOK);
        }));
        EXPECT_EQ(ReadStartFileView(), run % 2 == 0);
        EXPECT_EQ(Those([this](std::size_t i) { return IsOn((&block_.sync_qvj_files)[i]); }), made);
        EXPECT_EQ(Stored(L"SyncPath_CE"), run % 2 == 0 ? L"\\typed\\" : L"\\stored");
    }
    EXPECT_FALSE(Run([](HWND dialog) {
        Type(dialog, L"C:\\cancelled", L"\\cancelled");
        Press(dialog, IDCANCEL);
    }));
    EXPECT_EQ(Stored(L"SyncPath_DT"), L"C:\\typed\\");
    EXPECT_EQ(Stored(L"SyncPath_CE"), L"\\stored");
}

TEST_F(OptionsDialog, AutoStartFollowsTheBoxAfterOkOnly) {
    constexpr const wchar_t* kValue = L"ORVANE ActiveSync";
    std::array<wchar_t, MAX_PATH> program{};
    GetModuleFileNameW(nullptr, program.data(), MAX_PATH);
    for (const bool was_on : {false, true}) {
        for (const bool ok : {false, true}) {
            RegWriteString(HKEY_LOCAL_MACHINE, kAutoStartKey, kValue, was_on ? L"C:\\elsewhere.exe" : L"");
            Run([&](HWND dialog) {
                EXPECT_EQ(IsDlgButtonChecked(dialog, IDC_OPTIONS_AUTO_START) != 0, was_on);
                Click(dialog, IDC_OPTIONS_AUTO_START);
                Click(dialog, IDC_OPTIONS_SELECT_ALL);  // Takes the values of all boxes.
                Press(dialog, ok ? IDOK : IDCANCEL);
            });
            EXPECT_EQ(Stored(kValue, HKEY_LOCAL_MACHINE, kAutoStartKey), was_on != ok ? program.data() : L"");
        }
    }
}

TEST_F(OptionsDialog, OnlyAChosenPcFolderDropsWhatWasTyped) {
    const testing::TempFolder pc_folder;
    testing::MakeFolder(device_.PcPath(L"\\Jobs\\North"));
    Set(kOverwrite, pc_folder.Path());
    Run([&](HWND dialog) {
        const struct {
            int browse, button;
            std::wstring start, folders;
        } runs[] = {{IDC_OPTIONS_PC_BROWSE, IDCANCEL, pc_folder.Path(), L"C:\\a \\jobs\\north\\b"},
                    {IDC_OPTIONS_PC_BROWSE, IDOK, pc_folder.Path(), pc_folder.Path() + L" \\Jobs\\"},
                    {IDC_OPTIONS_DEVICE_BROWSE, IDOK, L"\\Jobs\\North\\", L"C:\\a \\Jobs\\North\\"}};
        for (const auto& run : runs) {
            Type(dialog, L"C:\\a", L"\\jobs\\north\\b");
            Browse(dialog, run.browse, run.button, run.start);
            EXPECT_EQ(Folders(dialog), run.folders);
        }
    });
}

}  // namespace
}  // namespace orvane
