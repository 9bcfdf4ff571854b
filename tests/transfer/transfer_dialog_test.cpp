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
    bool IsChecked(int id) const { return SendMessageW(Item(id), BM_GETCHECK, 0, 0) == BST_CHECKED; }
    // The texts of a list's column, from top to bottom.
    Lines Column(int list_id, int column = 0) const {
        Lines texts(static_cast<std::size_t>(SendMessageW(Item(list_id), LVM_GETITEMCOUNT, 0, 0)));
        for (std::size_t row = 0; row < texts.size(); ++row) {
            wchar_t text[512] = {};
            LVITEMW item{};
            item.iSubItem = column;
            item.pszText = text;
            item.cchTextMax = static_cast<int>(std::size(text));
            SendMessageW(Item(list_id), LVM_GETITEMTEXTW, row, reinterpret_cast<LPARAM>(&item));
            texts[row] = text;
        }
        return texts;
    }
    Lines OnPcPage() const { return Column(IDC_TRANSFER_PC_LIST); }
    Lines OnDevicePage() const { return Column(IDC_TRANSFER_DEVICE_LIST); }
    // Ticks the entry of that name with the space bar.
    void Tick(int list_id, const std::wstring& name) const {
        const Lines names = Column(list_id);
        const auto row = std::find(names.begin(), names.end(), name) - names.begin();
        ASSERT_LT(row, std::ssize(names)) << "not listed";
        LVITEMW item{};
        item.state = item.stateMask = LVIS_SELECTED | LVIS_FOCUSED;
        SendMessageW(Item(list_id), LVM_SETITEMSTATE, static_cast<WPARAM>(row),
                     reinterpret_cast<LPARAM>(&item));
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
    HWND found = nullptr;
    const auto look_at = [](HWND window, LPARAM result) -> BOOL {
        DWORD process = 0;
        GetWindowThreadProcessId(window, &process);
        if (process == GetCurrentProcessId() && GetDlgItem(window, IDC_COPY_CANCEL) != nullptr) {
            *reinterpret_cast<HWND*>(result) = window;
        }
        return TRUE;
    };
    // A snapshot: going from one window to the next would end where one has just been closed.
    EnumWindows(look_at, reinterpret_cast<LPARAM>(&found));
    return found;
}

// Presses "Cancel" in the progress window and waits for the question.
HWND AskToStop() {
    HWND progress = nullptr;
    EXPECT_TRUE(WaitUntil([&] { return (progress = ProgressWindow()) != nullptr; }));
    Press(progress, IDC_COPY_CANCEL);
    EXPECT_TRUE(WaitUntil([&] { return GetLastActivePopup(progress) != progress; }));
    return progress;
}

constexpr const wchar_t* kFiveNames[] = {L"1.txt", L"2.txt", L"3.txt", L"4.txt", L"5.txt"};

// Settings that let some types take part and overwrite older files.
class TransferTest : public JobFolders {
  protected:
    TransferTest() {
        settings_.sync_path_dt = pc_.Path() + L"\\";
        settings_.sync_path_ce = L"\\Jobs\\";
        settings_.types.set().reset(RowOfType(L".bmp"));
        settings_.overwrite_old_files = true;
    }

    SyncSettings settings_;
};

TEST_F(TransferTest, ListsWhatEachSideLacks) {
    for (const wchar_t* name : {L"new.qvj", L"notes.doc", L".qvj", L"picture.bmp", L"picture.IMG"}) {
        PutOnPc(name);
    }
    PutOnPc(L"newer.qvj", 10);
    PutOnDevice(L"NEWER.qvj");
    PutOnPc(L"same.qvj", 9);
    PutOnDevice(L"same.qvj");
    PutOnDevice(L"a.TN3");
    PutOnDevice(L"Job1\\pic.jpg");
    {
        const TransferRun run(settings_);
        EXPECT_EQ(run.OnPcPage(), (Lines{L"new.qvj", L"newer.qvj", L"picture.IMG"}));
        EXPECT_EQ(run.Column(IDC_TRANSFER_PC_LIST, 2), (Lines{L"1", L"1", L"1"}));
        EXPECT_EQ(run.OnDevicePage(), (Lines{L"a.TN3", L"Job1\\pic.jpg"}));
    }
    settings_.overwrite_old_files = false;
    const TransferRun run(settings_);
    EXPECT_EQ(run.OnPcPage(), (Lines{L"new.qvj", L"picture.IMG"}));
}

TEST_F(TransferTest, ButtonsFollowTheTicksOfThePageShown) {
    PutOnPc(L"a.qvj");
    PutOnPc(L"b.qvj");
    PutOnDevice(L"c.qvj");
    const TransferRun run(settings_);
    const auto is_enabled = [&](int id, bool enabled) {
        return WaitUntil([&] { return run.IsEnabled(id) == enabled; });
    };
    EXPECT_TRUE(is_enabled(IDC_TRANSFER_COPY, false));
    EXPECT_EQ(run.Text(IDC_TRANSFER_COPY), L"Copy Selected File(s) from PC to Device");
    run.Tick(IDC_TRANSFER_PC_LIST, L"b.qvj");
    EXPECT_TRUE(is_enabled(IDC_TRANSFER_COPY, true));
    EXPECT_TRUE(is_enabled(IDC_TRANSFER_COPY_ALL, true));
    EXPECT_FALSE(run.IsChecked(IDC_TRANSFER_PC_ALL));
    run.Tick(IDC_TRANSFER_PC_LIST, L"a.qvj");
    EXPECT_TRUE(WaitUntil([&] { return run.IsChecked(IDC_TRANSFER_PC_ALL); }));
    HWND list = run.Item(IDC_TRANSFER_PC_LIST);
    SendMessageW(run.Window(), kListDoubleClick, reinterpret_cast<WPARAM>(list),
                 reinterpret_cast<LPARAM>(list));
    EXPECT_EQ(run.Column(IDC_TRANSFER_PC_LIST, 2), (Lines{L"1", L"0"})) << "the selected entry";
    EXPECT_TRUE(WaitUntil([&] { return !run.IsChecked(IDC_TRANSFER_PC_ALL); }));

    run.SelectDevicePage();
    EXPECT_TRUE(is_enabled(IDC_TRANSFER_COPY, false));
    // A late report about the page that is hidden now.
    SendMessageW(run.Window(), kListItemsDrawn, reinterpret_cast<WPARAM>(list),
                 reinterpret_cast<LPARAM>(list));
    EXPECT_FALSE(run.IsEnabled(IDC_TRANSFER_COPY));
    run.Press(IDC_TRANSFER_DEVICE_ALL);
    EXPECT_EQ(run.Column(IDC_TRANSFER_DEVICE_LIST, 2), Lines{L"0"});
    EXPECT_TRUE(is_enabled(IDC_TRANSFER_COPY, true));
    // The dialog manager's message of the same number is not taken for a listing.
    SendMessageW(run.Window(), DM_SETDEFID, 0, 1);
    EXPECT_EQ(run.OnPcPage(), (Lines{L"a.qvj", L"b.qvj"}));
}

TEST_F(TransferTest, FollowsTheKeyboard) {
    PutOnPc(L"a.qvj");
    TransferRun run(settings_);
    const auto listed = [&](const Lines& names) {
        return WaitUntil([&] { return run.OnPcPage() == names; });
    };
    PutOnPc(L"b.qvj");
    run.Key(VK_RETURN);
    EXPECT_TRUE(listed({L"a.qvj", L"b.qvj"}));
    PutOnPc(L"c.qvj");
    run.Call([&](TestedDialog&) { SetFocus(run.Item(IDC_TRANSFER_PC_LIST)); });
    run.Key(VK_F5);
    EXPECT_TRUE(listed({L"a.qvj", L"b.qvj", L"c.qvj"}));
    run.Key(VK_SPACE);
    EXPECT_TRUE(WaitUntil([&] {
        return run.Column(IDC_TRANSFER_PC_LIST, 2) == Lines{L"0", L"1", L"1"};
    })) << "a row has the focus after the refresh";
    const auto hold_control = [&](BYTE state) {
        run.Call([&](TestedDialog&) {
            BYTE keys[256] = {};
            keys[VK_CONTROL] = state;
            SetKeyboardState(keys);
        });
    };
    hold_control(0x80);
    run.Key('A');
    EXPECT_TRUE(WaitUntil([&] { return run.Column(IDC_TRANSFER_PC_LIST, 2) == Lines{L"0", L"0", L"0"}; }));
    hold_control(0);
    run.Key(VK_ESCAPE);
    EXPECT_TRUE(WaitUntil([&] { return run.HasEnded(); }));
    EXPECT_EQ(run.Result(), IDCANCEL);
}

TEST_F(TransferTest, NewFoldersAreListedAtOnce) {
    PutOnPc(L"a.qvj");
    TempFolder other;
    WriteTextFile(other / L"b.qvj", "");
    bool accept = false;
    const TransferRun run(settings_, true, [&](SyncSettings& settings) {
        settings.sync_path_dt = other.Path() + L"\\";
        return accept;
    });
    run.Press(IDC_TRANSFER_SETTINGS);
    EXPECT_EQ(run.OnPcPage(), Lines{L"a.qvj"});
    accept = true;
    run.Press(IDC_TRANSFER_SETTINGS);
    EXPECT_EQ(run.OnPcPage(), Lines{L"b.qvj"});
}

TEST_F(TransferTest, AnEmptyDeviceFolderIsAskedForAndNeverTheWholeDevice) {
    settings_.sync_path_ce.clear();
    WriteTextFile(device_.PcPath(L"\\system.txt"), "not a job file");
    const MessageBoxAnswerer boxes;
    const TransferRun run(settings_);
    ASSERT_EQ(boxes.Seen().size(), 1U);
    EXPECT_EQ(boxes.Seen()[0].text, L"Failed to read from remote device.");
    EXPECT_EQ(run.OnDevicePage(), Lines{});
    for (const int id :
         {IDC_TRANSFER_COPY, IDC_TRANSFER_COPY_ALL, IDC_TRANSFER_SYNCHRONIZE, IDC_TRANSFER_PC_ALL}) {
        EXPECT_FALSE(run.IsEnabled(id)) << id;
    }
    PutOnDevice(L"a.qvj");
    RegWriteString(HKEY_CURRENT_USER, L"Software\\Veltrano\\CE Devices", L"SyncPath_CE", L"\\Jobs\\");
    run.Press(IDC_TRANSFER_REFRESH);
    EXPECT_EQ(run.OnDevicePage(), Lines{L"a.qvj"});
    EXPECT_EQ(run.Text(IDC_TRANSFER_DEVICE_FOLDER), L"\\Jobs\\");
}

// The window answers while a slow device is listed, a second "Refresh" is dropped, Escape ends all of it.
TEST_F(TransferTest, LivesWhileTheDeviceIsRead) {
    for (int folder = 0; folder < 20; ++folder) {
        PutOnDevice(L"site" + std::to_wstring(folder) + L"\\a.qvj");
    }
    TransferRun run(settings_);
    device_.Set(L"CALL_DELAY", L"200");
    device_.StartTrace();
    run.PressAndGoOn(IDC_TRANSFER_REFRESH);
    EXPECT_TRUE(WaitUntil([&] { return device_.CallsOf(L"CeFindAllFiles") > 0; }));
    run.PressAndGoOn(IDC_TRANSFER_REFRESH);
    SendMessageW(run.Item(IDC_TRANSFER_REFRESH), BM_CLICK, 0, 0);
    const ULONGLONG start = GetTickCount64();
    for (int ask = 0; ask < 20; ++ask) {
        DWORD_PTR answer = 0;
        EXPECT_NE(SendMessageTimeoutW(run.Window(), WM_NULL, 0, 0, SMTO_NORMAL, 150, &answer), 0);
        Sleep(10);
    }
    EXPECT_LT(device_.CallsOf(L"CeFindAllFiles"), 21U);
    run.Key(VK_ESCAPE);
    EXPECT_TRUE(WaitUntil([&] { return run.HasEnded(); }));
    EXPECT_LT(GetTickCount64() - start, 2500U) << "the whole listing would take longer";
    EXPECT_EQ(run.Result(), IDCANCEL);
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

TEST_F(TransferTest, ReplacesOnlyWhatTheUserAllows) {
    settings_.overwrite_warn = true;
    PutOnPc(L"close.qvj", 10);
    PutOnPc(L"kept.qvj", 11);
    PutOnPc(L"new.qvj", 11);
    PutOnDevice(L"close.qvj");
    PutOnDevice(L"kept.qvj");
    PutOnPc(L"replaced.txt");
    PutOnDevice(L"replaced.txt", 11);
    const MessageBoxAnswerer boxes({IDCANCEL, IDOK});
    const TransferRun run(settings_);
    run.Press(IDC_TRANSFER_SYNCHRONIZE);

    ASSERT_EQ(boxes.Seen().size(), 2U);
    EXPECT_EQ(boxes.Seen()[0].default_button, IDCANCEL);
    EXPECT_EQ(boxes.Seen()[0].text,
              L"The file:\n\\Jobs\\kept.qvj [ DEVICE ] \n\nWill be replaced by the file:\n" +
                  OnPc(L"kept.qvj") + L" [ PC ]");
    EXPECT_EQ(run.OnPcPage(), Lines{L"kept.qvj"});
    EXPECT_EQ(run.OnDevicePage(), Lines{});
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
        for (const wchar_t* name : kFiveNames) {
            DeleteFileW((each.to_pc ? OnPc(name) : OnDevice(name)).c_str());
            each.to_pc ? PutOnDevice(name) : PutOnPc(name);
        }
        const TransferRun run(settings_);
        const auto listed = [&] { return each.to_pc ? run.OnDevicePage() : run.OnPcPage(); };
        device_.Set(each.fault, each.value);
        run.PressAndGoOn(IDC_TRANSFER_SYNCHRONIZE);
        HWND box = nullptr;
        EXPECT_TRUE(WaitUntil([&] { return (box = GetLastActivePopup(run.Window())) != run.Window(); }));
        EXPECT_EQ(ui::WindowText(box), L"Copying File");
        EXPECT_EQ(ItemText(box, 0xFFFF), each.text);
        run.Press(IDC_TRANSFER_SYNCHRONIZE);  // Dropped.
        Press(box, IDOK);
        EXPECT_TRUE(WaitUntil([&] { return !IsWindow(box) && ProgressWindow() == nullptr; }));
        const Lines left = listed();
        EXPECT_FALSE(left.empty());
        device_.Clear(each.fault);
        run.Press(IDC_TRANSFER_REFRESH);
        EXPECT_EQ(listed(), left);
        for (const wchar_t* name : kFiveNames) {
            EXPECT_NE(Exists(each.to_pc ? OnPc(name) : OnDevice(name)),
                      std::find(left.begin(), left.end(), name) != left.end());
        }
    }
}

// The user stops a copy to the device, or goes on, while it asks.
TEST_F(TransferTest, StopsWhenTheUserSaysSo) {
    for (const int answer : {IDYES, IDNO}) {
        for (const wchar_t* name : kFiveNames) {
            DeleteFileW(OnDevice(name).c_str());
            PutOnPc(name);
        }
        device_.Set(L"CALL_DELAY", L"25");
        const TransferRun run(settings_);
        run.PressAndGoOn(IDC_TRANSFER_SYNCHRONIZE);
        HWND progress = AskToStop();
        HWND question = GetLastActivePopup(progress);
        EXPECT_EQ(ItemText(question, 0xFFFF), L"Would you like to stop the file copy?");
        PostMessageW(question, WM_COMMAND, static_cast<WPARAM>(answer), 0);
        EXPECT_TRUE(WaitUntil([] { return ProgressWindow() == nullptr; }));
        SendMessageW(run.Window(), WM_NULL, 0, 0);
        const Lines left = run.OnPcPage();
        EXPECT_EQ(left.empty(), answer == IDNO);
        for (const std::wstring& name : left) {
            EXPECT_FALSE(Exists(OnDevice(name)));
        }
    }
}

// The last file from the PC is done while the user still thinks about stopping: the question goes with it,
// or, if files are to come from the device, holds them up.
TEST_F(TransferTest, AnOpenStopQuestionCountsForWhatFollows) {
    device_.Set(L"CALL_DELAY", L"100");
    for (const bool more_follows : {false, true}) {
        DeleteFileW(OnDevice(L"a.txt").c_str());
        PutOnPc(L"a.txt");
        if (more_follows) {
            PutOnDevice(L"b.txt");
        }
        const TransferRun run(settings_);
        run.PressAndGoOn(IDC_TRANSFER_SYNCHRONIZE);
        EXPECT_TRUE(WaitUntil([] {
            const std::wstring title = ui::WindowText(ProgressWindow());
            return title.find(L"{Copying File 1/1  - From PC to Device}") == 0;
        }));
        HWND progress = AskToStop();
        if (more_follows) {
            EXPECT_TRUE(WaitUntil([&] { return Exists(OnDevice(L"a.txt")); }));
            Sleep(1000);  // What would be copied without an answer would be there by then.
            EXPECT_FALSE(Exists(OnPc(L"b.txt")));
            PostMessageW(GetLastActivePopup(progress), WM_COMMAND, IDYES, 0);
        }
        EXPECT_TRUE(WaitUntil([&] { return !IsWindow(progress); }));
        SendMessageW(run.Window(), WM_NULL, 0, 0);
        EXPECT_EQ(run.OnPcPage(), Lines{});
        EXPECT_TRUE(Exists(OnDevice(L"a.txt")));
        EXPECT_EQ(run.OnDevicePage(), more_follows ? Lines{L"b.txt"} : Lines{});
        EXPECT_FALSE(Exists(OnPc(L"b.txt")));
    }
}

TEST_F(TransferTest, FilesThatCannotBeCopiedStayListed) {
    // What a device may claim to have; the first name is one that the PC takes for a device of its own. The
    // job file would have the folder above for its companion.
    device_.Set(L"EXTRA_ENTRIES", L"\\Jobs|NUL.txt;\\Jobs|vanished.txt");
    PutOnDevice(L"...wkf");
    device_.StartTrace();
    const TransferRun run(settings_);
    run.Press(IDC_TRANSFER_SYNCHRONIZE);
    EXPECT_EQ(run.OnDevicePage(), (Lines{L"NUL.txt", L"vanished.txt"}));
    EXPECT_EQ(PcFiles(), Lines{L"...wkf"});
    for (const TraceLine& line : device_.Trace()) {
        const bool is_open = line.function == L"CeCreateFile";
        EXPECT_FALSE(is_open && line.arguments[0].find(L"NUL.txt") != std::wstring::npos);
        EXPECT_FALSE(line.function == L"CeFindAllFiles" &&
                     line.arguments[0].find(L"..") != std::wstring::npos);
    }
}

}  // namespace
}  // namespace orvane::testing
