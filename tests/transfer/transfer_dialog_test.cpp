// The real manual view over a PC folder and the folder device: its lists, commands and copies.
#include "transfer/transfer_dialog.h"

#include <gtest/gtest.h>

#include <algorithm>

#include "res/ids.h"
#include "tests/support/dialog_thread.h"
#include "tests/support/job_folders.h"
#include "tests/support/message_boxes.h"

namespace orvane::testing {
namespace {

// Stands for the options dialog; false when the user leaves it with "Cancel".
using Options = std::function<bool(SyncSettings&)>;

class TestedDialog : public CCeFileTransfDlg {
  public:
    TestedDialog(const SyncSettings& settings, bool date_check_done, Options options)
        : CCeFileTransfDlg(RefreshSettingsBlock(settings), date_check_done, nullptr),
          options_(std::move(options)) {}

  protected:
    bool RunOptions(SyncSettings& settings) override { return options_(settings); }

  private:
    const Options options_;
};

struct TransferRun : DialogThread<TestedDialog> {
    explicit TransferRun(const SyncSettings& settings, bool date_check_done = true, Options options = {})
        : DialogThread(settings, date_check_done, std::move(options)) {
        WaitUntilOpen();
    }

    bool IsEnabled(int id) const { return IsWindowEnabled(Item(id)) != FALSE; }
    // The texts of a list's column, from top to bottom.
    Lines Column(int list_id, int column = 0) const {
        HWND list = Item(list_id);
        Lines texts(static_cast<std::size_t>(ListView_GetItemCount(list)));
        for (int row = 0; row < std::ssize(texts); ++row) {
            wchar_t text[512] = {};
            ListView_GetItemText(list, row, column, text, static_cast<int>(std::size(text)));
            texts[static_cast<std::size_t>(row)] = text;
        }
        return texts;
    }
    Lines OnPcPage() const { return Column(IDC_TRANSFER_PC_LIST); }
    Lines OnDevicePage() const { return Column(IDC_TRANSFER_DEVICE_LIST); }
    // "0" for an entry of the PC's page that is ticked, else "1".
    Lines Ticks() const { return Column(IDC_TRANSFER_PC_LIST, 2); }
    // Ticks the entry of that name with the space bar.
    void Tick(int list_id, const std::wstring& name) const {
        const Lines names = Column(list_id);
        const auto row = std::find(names.begin(), names.end(), name) - names.begin();
        ASSERT_LT(row, std::ssize(names)) << "not listed";
        constexpr UINT kChosen = LVIS_SELECTED | LVIS_FOCUSED;
        ListView_SetItemState(Item(list_id), static_cast<WPARAM>(row), kChosen, kChosen);
        SendMessageW(Item(list_id), WM_KEYDOWN, VK_SPACE, 1);
    }
    void SelectDevicePage() const {
        SendMessageW(Item(IDC_TRANSFER_TABS), TCM_SETCURFOCUS, 1, 0);
        EXPECT_TRUE(
            WaitUntil([&] { return Text(IDC_TRANSFER_COPY) == L"Copy Selected File(s) from Device to PC"; }));
    }
    void Key(UINT key) const { PostMessageW(Item(IDC_TRANSFER_PC_LIST), WM_KEYDOWN, key, 1); }
};

// The progress window of this process, null when there is none.
HWND ProgressWindow() {
    return FindDialog([](HWND dialog) { return GetDlgItem(dialog, IDC_COPY_CANCEL) != nullptr; });
}

// Copies all and presses "Cancel" once the progress window's title begins as given: that window, with the
// question.
HWND CopyAndAskToStop(const TransferRun& run, const std::wstring& title) {
    run.PressAndGoOn(IDC_TRANSFER_SYNCHRONIZE);
    HWND progress = nullptr;
    EXPECT_TRUE(WaitUntil([&] { return ui::WindowText(progress = ProgressWindow()).starts_with(title); }));
    Press(progress, IDC_COPY_CANCEL);
    EXPECT_TRUE(WaitUntil([&] { return GetLastActivePopup(progress) != progress; }));
    return progress;
}

// Settings that let some types take part and overwrite older files.
class TransferTest : public JobFolders {
  protected:
    TransferTest() {
        settings_.sync_path_dt = pc_.Path() + L"\\";
        settings_.sync_path_ce = L"\\Jobs\\";
        settings_.types.set().reset(RowOfType(L".bmp"));
        settings_.overwrite_old_files = true;
    }

    // Five files on one side that the other lacks, and the look at whether all but those `left` were copied.
    void PutFive(bool on_device) const {
        for (const std::wstring& name : five_) {
            DeleteFileW((on_device ? OnPc(name) : OnDevice(name)).c_str());
            on_device ? PutOnDevice(name) : PutOnPc(name);
        }
    }
    void ExpectTheRestOfFive(const Lines& left, bool on_device) const {
        for (const std::wstring& name : five_) {
            EXPECT_NE(Exists(on_device ? OnPc(name) : OnDevice(name)),
                      std::find(left.begin(), left.end(), name) != left.end());
        }
    }

    const Lines five_ = {L"1.txt", L"2.txt", L"3.txt", L"4.txt", L"5.txt"};
    SyncSettings settings_;
};

TEST_F(TransferTest, ListsWhatEachSideLacksByTheSettingsAsTheyAre) {
    for (const wchar_t* name : {L"new.qvj", L"notes.doc", L".qvj", L"picture.bmp", L"picture.IMG"}) {
        PutOnPc(name);
    }
    PutOnPc(L"newer.qvj", 10);
    PutOnDevice(L"NEWER.qvj");
    PutOnPc(L"same.qvj", 9);
    PutOnDevice(L"same.qvj");
    PutOnDevice(L"a.TN3");
    PutOnDevice(L"Job1\\pic.jpg");
    PutOnPc(L"sub\\new.qvj");
    PutOnPc(L"sub\\newer.qvj", 10);
    bool accept = false;
    const TransferRun run(settings_, true, [&](SyncSettings& settings) {
        settings.overwrite_old_files = false;
        settings.sync_path_dt += L"sub\\";
        return accept;
    });
    for (int presses = 0; presses < 2; ++presses) {
        EXPECT_EQ(run.OnPcPage(),
                  (Lines{L"new.qvj", L"newer.qvj", L"picture.IMG", L"sub\\new.qvj", L"sub\\newer.qvj"}));
        EXPECT_EQ(run.Ticks(), Lines(5, L"1"));
        EXPECT_EQ(run.OnDevicePage(), (Lines{L"a.TN3", L"Job1\\pic.jpg"}));
        run.Press(IDC_TRANSFER_SETTINGS);
        accept = true;
    }
    EXPECT_EQ(run.OnPcPage(), Lines{L"new.qvj"});
}

TEST_F(TransferTest, ButtonsFollowTheTicksOfThePageShown) {
    PutOnPc(L"a.qvj");
    PutOnPc(L"b.qvj");
    PutOnDevice(L"c.qvj");
    const TransferRun run(settings_);
    const auto buttons_are = [&](bool enabled, bool all_ticked) {
        return WaitUntil([&] {
            return run.IsEnabled(IDC_TRANSFER_COPY) == enabled &&
                   run.IsEnabled(IDC_TRANSFER_COPY_ALL) == enabled &&
                   (IsDlgButtonChecked(run.Window(), IDC_TRANSFER_PC_ALL) != 0) == all_ticked;
        });
    };
    EXPECT_TRUE(buttons_are(false, false));
    run.Tick(IDC_TRANSFER_PC_LIST, L"b.qvj");
    EXPECT_TRUE(buttons_are(true, false));
    run.Tick(IDC_TRANSFER_PC_LIST, L"a.qvj");
    EXPECT_TRUE(buttons_are(true, true));
    const auto list = reinterpret_cast<LPARAM>(run.Item(IDC_TRANSFER_PC_LIST));
    SendMessageW(run.Window(), kListDoubleClick, static_cast<WPARAM>(list), list);
    EXPECT_EQ(run.Ticks(), (Lines{L"1", L"0"})) << "the selected entry";
    EXPECT_TRUE(buttons_are(true, false));

    run.SelectDevicePage();
    EXPECT_TRUE(WaitUntil([&] { return !run.IsEnabled(IDC_TRANSFER_COPY); }));
    // A late report about the page that is hidden now.
    SendMessageW(run.Window(), kListItemsDrawn, static_cast<WPARAM>(list), list);
    EXPECT_FALSE(run.IsEnabled(IDC_TRANSFER_COPY));
    run.Press(IDC_TRANSFER_DEVICE_ALL);
    EXPECT_EQ(run.Column(IDC_TRANSFER_DEVICE_LIST, 2), Lines{L"0"});
    EXPECT_TRUE(WaitUntil([&] { return run.IsEnabled(IDC_TRANSFER_COPY); }));
    // The dialog manager's message of the same number is not taken for a listing.
    SendMessageW(run.Window(), DM_SETDEFID, 0, 1);
    EXPECT_EQ(run.OnPcPage(), (Lines{L"a.qvj", L"b.qvj"}));
}

TEST_F(TransferTest, FollowsTheKeyboard) {
    for (int folder = 0; folder < 20; ++folder) {
        PutOnDevice(L"site" + std::to_wstring(folder) + L"\\a.qvj");
    }
    TransferRun run(settings_);
    Lines names;
    for (const UINT key : std::initializer_list<UINT>{VK_RETURN, VK_F5}) {
        PutOnPc(names.emplace_back(key == VK_F5 ? L"b.qvj" : L"a.qvj"));
        run.Call([&](TestedDialog&) { SetFocus(run.Item(IDC_TRANSFER_PC_LIST)); });
        run.Key(key);
        EXPECT_TRUE(WaitUntil([&] { return run.OnPcPage() == names; }));
    }
    run.Key(VK_SPACE);
    EXPECT_TRUE(WaitUntil([&] { return run.Ticks() == Lines{L"0", L"1"}; })) << "no row has the focus";
    BYTE keys[256] = {};
    for (const BYTE control : {BYTE{0x80}, BYTE{0}}) {
        keys[VK_CONTROL] = control;
        run.Call([&](TestedDialog&) { SetKeyboardState(keys); });
        run.Key(control != 0 ? 'A' : VK_CONTROL);
        EXPECT_TRUE(WaitUntil([&] { return run.Ticks() == Lines{L"0", L"0"}; }));
    }

    // While a slow device is read a second "Refresh" is dropped, and Escape ends all of it.
    device_.Set(L"CALL_DELAY", L"200");
    device_.StartTrace();
    run.PressAndGoOn(IDC_TRANSFER_REFRESH);
    EXPECT_TRUE(WaitUntil([&] { return device_.CallsOf(L"CeFindAllFiles") > 0; }));
    const ULONGLONG start = GetTickCount64();
    run.Press(IDC_TRANSFER_REFRESH);
    EXPECT_LT(GetTickCount64() - start, 150U);
    run.Key(VK_ESCAPE);
    EXPECT_TRUE(WaitUntil([&] { return run.HasEnded(); }));
    EXPECT_LT(GetTickCount64() - start, 2500U) << "the whole listing would take longer";
    EXPECT_EQ(run.Result(), IDCANCEL);
}

TEST_F(TransferTest, AnEmptyDeviceFolderIsAskedForAndNeverTheWholeDevice) {
    settings_.sync_path_ce.clear();
    WriteTextFile(device_.PcPath(L"\\system.txt"), "not a job file");
    const MessageBoxAnswerer boxes;
    const TransferRun run(settings_);
    ASSERT_EQ(boxes.Seen().size(), 1U);
    EXPECT_EQ(boxes.Seen()[0].text, L"Failed to read from remote device.");
    EXPECT_EQ(run.OnDevicePage(), Lines{});
    PutOnDevice(L"a.qvj");
    RegWriteString(HKEY_CURRENT_USER, L"Software\\Veltrano\\CE Devices", L"SyncPath_CE", L"\\Jobs\\");
    run.Press(IDC_TRANSFER_REFRESH);
    EXPECT_EQ(run.OnDevicePage(), Lines{L"a.qvj"});
    EXPECT_EQ(run.Text(IDC_TRANSFER_DEVICE_FOLDER), L"\\Jobs\\");
}

TEST_F(TransferTest, ADeclinedClockCheckEndsTheDialog) {
    device_.Set(L"CLOCK_OFFSET", L"3600");
    const MessageBoxAnswerer boxes({IDCANCEL, IDOK});
    TransferRun declined(settings_, /*date_check_done=*/false);
    EXPECT_TRUE(WaitUntil([&] { return declined.HasEnded(); }));
    EXPECT_EQ(declined.Result(), 0);
    TransferRun accepted(settings_, /*date_check_done=*/false);
    EXPECT_EQ(accepted.Result(), IDCANCEL);
    EXPECT_EQ(boxes.Seen().size(), 2U);
}

TEST_F(TransferTest, CopiesTickedFilesOrAll) {
    PutOnPc(L"a.wkf");
    PutOnPc(L"a\\data\\any.thing");
    PutOnPc(L"sub\\b.qvj", 60);
    PutOnDevice(L"sub\\B.QVJ");
    PutOnDevice(L"c.qvj");
    PutOnDevice(L"d.qvj");
    PutOnDevice(L"new\\deep\\e.qvj", 60);
    const TransferRun run(settings_);
    run.Tick(IDC_TRANSFER_PC_LIST, L"sub\\b.qvj");
    run.Press(IDC_TRANSFER_COPY);
    EXPECT_EQ(run.OnPcPage(), Lines{L"a.wkf"});
    EXPECT_EQ(ReadTextFile(OnDevice(L"sub\\b.qvj")), "from the PC");
    EXPECT_EQ(ReadTextFile(OnDevice(L"sub\\b.qvj.001")), "from the device") << "a backup is always made";

    run.SelectDevicePage();
    run.Tick(IDC_TRANSFER_DEVICE_LIST, L"new\\deep\\e.qvj");
    run.Press(IDC_TRANSFER_COPY);
    EXPECT_EQ(run.OnDevicePage(), (Lines{L"c.qvj", L"d.qvj"}));
    EXPECT_EQ(ReadTextFile(OnPc(L"new\\deep\\e.qvj")), "from the device");
    EXPECT_EQ(TicksOf(LastWriteTime(OnPc(L"new\\deep\\e.qvj"))), TicksOf(AddSeconds(noon_, 60)));

    run.Tick(IDC_TRANSFER_PC_LIST, L"a.wkf");
    run.Tick(IDC_TRANSFER_DEVICE_LIST, L"d.qvj");
    run.Press(IDC_TRANSFER_COPY_ALL);
    EXPECT_EQ(run.OnPcPage(), Lines{});
    EXPECT_EQ(run.OnDevicePage(), Lines{L"c.qvj"});
    run.Press(IDC_TRANSFER_SYNCHRONIZE);
    EXPECT_TRUE(Exists(OnPc(L"c.qvj")) && Exists(OnPc(L"d.qvj")) && Exists(OnDevice(L"a.wkf")));
    EXPECT_TRUE(Exists(OnDevice(L"a\\data\\any.thing"))) << "a job file takes its folder along";
    for (const int id : {IDC_TRANSFER_COPY, IDC_TRANSFER_COPY_ALL, IDC_TRANSFER_SYNCHRONIZE}) {
        EXPECT_FALSE(run.IsEnabled(id)) << id;
    }
}

TEST_F(TransferTest, ReplacesWhatTheUserAllowsAndListsWhatIsLeft) {
    settings_.overwrite_warn = true;
    PutOnPc(L"new.qvj", 11);
    for (const wchar_t* name : {L"close.qvj", L"kept.qvj", L"replaced.txt"}) {
        PutOnPc(name, *name == L'c' ? 10 : 11);
        PutOnDevice(name, *name == L'r' ? 22 : 0);
    }
    // What a device may claim to have; the first name is one that the PC takes for a device of its own.
    device_.Set(L"EXTRA_ENTRIES", L"\\Jobs|NUL.txt;\\Jobs|vanished.txt");
    const MessageBoxAnswerer boxes({IDCANCEL, IDOK});
    const TransferRun run(settings_);
    run.Press(IDC_TRANSFER_SYNCHRONIZE);
    ASSERT_EQ(boxes.Seen().size(), 2U);
    EXPECT_EQ(boxes.Seen()[0].default_button, IDCANCEL);
    EXPECT_EQ(boxes.Seen()[0].text,
              L"The file:\n\\Jobs\\kept.qvj [ DEVICE ] \n\nWill be replaced by the file:\n" +
                  OnPc(L"kept.qvj") + L" [ PC ]");
    EXPECT_EQ(run.OnPcPage(), Lines{L"kept.qvj"});
    EXPECT_EQ(run.OnDevicePage(), (Lines{L"NUL.txt", L"vanished.txt"}));
    EXPECT_EQ(ReadTextFile(OnDevice(L"close.qvj")), "from the PC");
    EXPECT_EQ(ReadTextFile(OnDevice(L"kept.qvj")), "from the device");
    EXPECT_EQ(ReadTextFile(OnPc(L"replaced.txt")), "from the device");
    EXPECT_EQ(ReadTextFile(OnPc(L"replaced.txt.001")), "from the PC");
}

// What ends a copy is told once; what was not copied stays listed; no command gets through meanwhile.
TEST_F(TransferTest, AFullOrLostDeviceEndsTheCopy) {
    const struct {
        const wchar_t* fault;
        const wchar_t* value;
        const wchar_t* text;
        bool to_pc;
    } cases[] = {{L"REFUSE", L"CeWriteFile#3=112", L"Device Disk Full!", false},
                 {L"VANISH", L"12", L"Communication Error.", false},
                 {L"VANISH", L"12", L"Communication Error.", true},
                 {L"CONNECT_RESULT", L"0x80004005", L"Communication Error.", true}};
    for (const auto& each : cases) {
        PutFive(each.to_pc);
        const TransferRun run(settings_);
        const auto listed = [&] { return each.to_pc ? run.OnDevicePage() : run.OnPcPage(); };
        device_.Set(each.fault, each.value);
        run.PressAndGoOn(IDC_TRANSFER_SYNCHRONIZE);
        HWND box = nullptr;
        EXPECT_TRUE(WaitUntil([&] { return (box = GetLastActivePopup(run.Window())) != run.Window(); }));
        EXPECT_EQ(ItemText(box, 0xFFFF), each.text);
        run.Press(IDC_TRANSFER_SYNCHRONIZE);  // Dropped.
        Press(box, IDOK);
        EXPECT_TRUE(WaitUntil([&] { return !IsWindow(box) && ProgressWindow() == nullptr; }));
        const Lines left = listed();
        EXPECT_FALSE(left.empty());
        device_.Clear(each.fault);
        run.Press(IDC_TRANSFER_REFRESH);
        EXPECT_EQ(listed(), left);
        ExpectTheRestOfFive(left, each.to_pc);
    }
}

// The user stops a copy to the device, or goes on, while it asks.
TEST_F(TransferTest, StopsWhenTheUserSaysSo) {
    for (const int answer : {IDYES, IDNO}) {
        PutFive(/*on_device=*/false);
        device_.Set(L"CALL_DELAY", L"25");
        const TransferRun run(settings_);
        HWND progress = CopyAndAskToStop(run, L"{");
        PostMessageW(GetLastActivePopup(progress), WM_COMMAND, static_cast<WPARAM>(answer), 0);
        EXPECT_TRUE(WaitUntil([&] { return !IsWindow(progress); }));
        SendMessageW(run.Window(), WM_NULL, 0, 0);
        const Lines left = run.OnPcPage();
        EXPECT_EQ(left.empty(), answer == IDNO);
        ExpectTheRestOfFive(left, /*on_device=*/false);
    }
}

// The last file from the PC is done while the user still thinks about stopping: the question goes with it,
// or, if files are to come from the device, holds them up.
TEST_F(TransferTest, AnOpenStopQuestionCountsForWhatFollows) {
    device_.Set(L"CALL_DELAY", L"100");
    for (const Lines& following : {Lines{}, Lines{L"b.txt"}}) {
        DeleteFileW(OnDevice(L"a.txt").c_str());
        PutOnPc(L"a.txt");
        for (const std::wstring& name : following) {
            PutOnDevice(name);
        }
        const TransferRun run(settings_);
        HWND progress = CopyAndAskToStop(run, L"{Copying File 1/1  - From PC to Device}");
        if (!following.empty()) {
            EXPECT_TRUE(WaitUntil([&] { return Exists(OnDevice(L"a.txt")); }));
            Sleep(1000);  // What would be copied without an answer would be there by then.
            EXPECT_EQ(PcFiles(), Lines{L"a.txt"});
            PostMessageW(GetLastActivePopup(progress), WM_COMMAND, IDYES, 0);
        }
        EXPECT_TRUE(WaitUntil([&] { return !IsWindow(progress); }));
        SendMessageW(run.Window(), WM_NULL, 0, 0);
        EXPECT_EQ(run.OnPcPage(), Lines{});
        EXPECT_TRUE(Exists(OnDevice(L"a.txt")));
        EXPECT_EQ(run.OnDevicePage(), following);
        EXPECT_EQ(PcFiles(), Lines{L"a.txt"});
    }
}

}  // namespace
}  // namespace orvane::testing
