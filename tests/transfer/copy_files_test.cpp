// Copying from the dialog, with the progress window and its questions.
#include "tests/transfer/transfer_fixture.h"

namespace orvane::testing {

namespace {

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

}  // namespace

TEST_F(TransferTest, CopiesTheTickedFilesOfAPage) {
    PutOnPc(L"a.qvj");
    PutOnPc(L"sub\\b.qvj", 60);
    PutOnDevice(L"sub\\B.QVJ");
    PutOnDevice(L"c.qvj");
    PutOnDevice(L"new\\deep\\d.qvj", 60);
    const TransferRun run(settings_);
    run.Tick(IDC_TRANSFER_PC_LIST, L"sub\\b.qvj");
    run.Press(IDC_TRANSFER_COPY);
    EXPECT_EQ(run.Column(IDC_TRANSFER_PC_LIST), Names{L"a.qvj"});
    EXPECT_EQ(ReadTextFile(OnDevice(L"sub\\b.qvj")), "from the PC");
    EXPECT_EQ(ReadTextFile(OnDevice(L"sub\\b.qvj.001")), "from the device") << "a backup is always made";

    run.SelectDevicePage();
    run.Tick(IDC_TRANSFER_DEVICE_LIST, L"new\\deep\\d.qvj");
    run.Press(IDC_TRANSFER_COPY);
    EXPECT_EQ(run.Column(IDC_TRANSFER_DEVICE_LIST), Names{L"c.qvj"});
    EXPECT_EQ(ReadTextFile(OnPc(L"new\\deep\\d.qvj")), "from the device");
    EXPECT_EQ(TicksOf(LastWriteTime(OnPc(L"new\\deep\\d.qvj"))), TicksOf(AddSeconds(noon_, 60)));
}

TEST_F(TransferTest, CopyAllTakesTheTickedAndSynchronizeEverything) {
    PutOnPc(L"a.qvj");
    PutOnPc(L"b.qvj");
    PutOnDevice(L"c.qvj");
    PutOnDevice(L"d.qvj");
    const TransferRun run(settings_);
    run.Tick(IDC_TRANSFER_PC_LIST, L"a.qvj");
    run.Tick(IDC_TRANSFER_DEVICE_LIST, L"d.qvj");
    run.Press(IDC_TRANSFER_COPY_ALL);
    EXPECT_EQ(run.Column(IDC_TRANSFER_PC_LIST), Names{L"b.qvj"});
    EXPECT_EQ(run.Column(IDC_TRANSFER_DEVICE_LIST), Names{L"c.qvj"});
    run.Press(IDC_TRANSFER_SYNCHRONIZE);
    for (const std::wstring& folder : {pc_.Path(), device_.PcPath(L"\\Jobs")}) {
        EXPECT_EQ(ListTree(folder), (Names{L"a.qvj", L"b.qvj", L"c.qvj", L"d.qvj"}));
    }
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
    EXPECT_EQ(run.Column(IDC_TRANSFER_PC_LIST), Names{L"kept.qvj"});
    EXPECT_EQ(run.Column(IDC_TRANSFER_DEVICE_LIST), Names{});
    EXPECT_EQ(ReadTextFile(OnDevice(L"close.qvj")), "from the PC");
    EXPECT_EQ(ReadTextFile(OnDevice(L"kept.qvj")), "from the device");
    EXPECT_EQ(ReadTextFile(OnPc(L"replaced.txt")), "from the device");
    EXPECT_EQ(ReadTextFile(OnPc(L"replaced.txt.001")), "from the PC");
}

TEST_F(TransferTest, AFullDeviceEndsTheCopy) {
    for (const wchar_t* name : {L"1.txt", L"2.txt", L"3.txt", L"4.txt", L"5.txt"}) {
        PutOnPc(name);
    }
    device_.Set(L"REFUSE", L"CeWriteFile#3=112");
    const MessageBoxAnswerer boxes;
    const TransferRun run(settings_);
    run.Press(IDC_TRANSFER_SYNCHRONIZE);
    ASSERT_EQ(boxes.Seen().size(), 1U);
    EXPECT_EQ(boxes.Seen()[0].text, L"Device Disk Full!");
    EXPECT_EQ(run.Column(IDC_TRANSFER_PC_LIST), (Names{L"3.txt", L"4.txt", L"5.txt"}));
    EXPECT_FALSE(Exists(OnDevice(L"3.txt")));
    EXPECT_EQ(ProgressWindow(), nullptr);
}

TEST_F(TransferTest, AJobFileTakesItsFolderAlong) {
    PutOnPc(L"job1.wkf");
    PutOnPc(L"job1\\data\\any.thing");
    PutOnPc(L"alone.wkf");
    PutOnDevice(L"job2.WKF");
    PutOnDevice(L"job2\\any.thing");
    const TransferRun run(settings_);
    run.Press(IDC_TRANSFER_SYNCHRONIZE);
    EXPECT_EQ(ReadTextFile(OnDevice(L"job1\\data\\any.thing")), "from the PC");
    EXPECT_EQ(ReadTextFile(OnPc(L"job2\\any.thing")), "from the device");
    EXPECT_FALSE(Exists(OnDevice(L"alone")));
}

// The user stops a copy to the device, or goes on, while it asks.
TEST_F(TransferTest, StopsWhenTheUserSaysSo) {
    for (const int answer : {IDYES, IDNO}) {
        for (const wchar_t* name : {L"1.txt", L"2.txt", L"3.txt", L"4.txt", L"5.txt"}) {
            PutOnPc(name);
            DeleteFileW(OnDevice(name).c_str());
        }
        device_.Set(L"CALL_DELAY", L"25");
        const MessageBoxAnswerer boxes({answer});
        const TransferRun run(settings_);
        run.PressAndGoOn(IDC_TRANSFER_SYNCHRONIZE);
        ASSERT_TRUE(WaitUntil([] { return ProgressWindow() != nullptr; }));
        HWND progress = ProgressWindow();
        PostMessageW(progress, WM_COMMAND, IDC_COPY_CANCEL, 0);
        EXPECT_TRUE(WaitUntil([] { return ProgressWindow() == nullptr; }));
        SendMessageW(run.Window(), WM_NULL, 0, 0);
        ASSERT_EQ(boxes.Seen().size(), 1U);
        EXPECT_EQ(boxes.Seen()[0].text, L"Would you like to stop the file copy?");
        const Names left = run.Column(IDC_TRANSFER_PC_LIST);
        EXPECT_EQ(left.empty(), answer == IDNO);
        for (const std::wstring& name : left) {
            EXPECT_FALSE(Exists(OnDevice(name)));
        }
    }
}

// The last file from the PC is done while the user still thinks about stopping.
TEST_F(TransferTest, AnOpenStopQuestionGoesWithTheLastFile) {
    PutOnPc(L"a.txt");
    device_.Set(L"CALL_DELAY", L"100");
    const TransferRun run(settings_);
    run.PressAndGoOn(IDC_TRANSFER_SYNCHRONIZE);
    ASSERT_TRUE(WaitUntil([] {
        wchar_t title[100] = {};
        GetWindowTextW(ProgressWindow(), title, static_cast<int>(std::size(title)));
        return std::wstring(title).find(L"{Copying File 1/1  - From PC to Device}") == 0;
    }));
    HWND progress = ProgressWindow();
    PostMessageW(progress, WM_COMMAND, IDC_COPY_CANCEL, 0);
    EXPECT_TRUE(WaitUntil([&] { return GetLastActivePopup(progress) != progress; }));
    EXPECT_TRUE(WaitUntil([&] { return !IsWindow(progress); }));
    EXPECT_EQ(run.Column(IDC_TRANSFER_PC_LIST), Names{});
    EXPECT_TRUE(Exists(OnDevice(L"a.txt")));
}

TEST_F(TransferTest, AnOpenStopQuestionHoldsUpTheOtherDirection) {
    PutOnPc(L"a.txt");
    PutOnDevice(L"b.txt");
    device_.Set(L"CALL_DELAY", L"100");
    device_.StartTrace();
    const TransferRun run(settings_);
    run.PressAndGoOn(IDC_TRANSFER_SYNCHRONIZE);
    ASSERT_TRUE(WaitUntil([] { return ProgressWindow() != nullptr; }));
    HWND progress = ProgressWindow();
    PostMessageW(progress, WM_COMMAND, IDC_COPY_CANCEL, 0);
    EXPECT_TRUE(WaitUntil([&] { return GetLastActivePopup(progress) != progress; }));
    EXPECT_TRUE(WaitUntil([&] { return Exists(OnDevice(L"a.txt")); }));
    // Until the copy is over and nothing but the question is left.
    EXPECT_TRUE(WaitUntil([&] {
        const std::size_t calls = device_.Trace().size();
        Sleep(400);
        return device_.Trace().size() == calls;
    }));
    PostMessageW(GetLastActivePopup(progress), WM_COMMAND, IDYES, 0);
    EXPECT_TRUE(WaitUntil([&] { return !IsWindow(progress); }));
    SendMessageW(run.Window(), WM_NULL, 0, 0);
    EXPECT_EQ(run.Column(IDC_TRANSFER_PC_LIST), Names{});
    EXPECT_EQ(run.Column(IDC_TRANSFER_DEVICE_LIST), Names{L"b.txt"});
    EXPECT_FALSE(Exists(OnPc(L"b.txt")));
}

TEST_F(TransferTest, FilesThatCannotBeCopiedStayListed) {
    // What a device may claim to have; the first name is one that the PC takes for a device of its own. The
    // job file would have the folder above for its companion.
    device_.Set(L"EXTRA_ENTRIES", L"\\Jobs|NUL.txt;\\Jobs|vanished.txt");
    PutOnDevice(L"...wkf");
    device_.StartTrace();
    const TransferRun run(settings_);
    run.Press(IDC_TRANSFER_SYNCHRONIZE);
    EXPECT_EQ(run.Column(IDC_TRANSFER_DEVICE_LIST), (Names{L"NUL.txt", L"vanished.txt"}));
    EXPECT_EQ(ListTree(pc_.Path()), Names{L"...wkf"});
    for (const TraceLine& line : device_.Trace()) {
        const bool is_open = line.function == L"CeCreateFile";
        EXPECT_FALSE(is_open && line.arguments[0].find(L"NUL.txt") != std::wstring::npos);
        EXPECT_FALSE(line.function == L"CeFindAllFiles" &&
                     line.arguments[0].find(L"..") != std::wstring::npos);
    }
}

TEST_F(TransferTest, APathWithoutRoomForItsBackupIsNotCopied) {
    settings_.sync_path_ce = L"\\Jobs\\" + std::wstring(200, L'f');
    MakeFolder(device_.PcPath(settings_.sync_path_ce));
    // On the device they have 255 and 256 characters, without the backup's four.
    const std::wstring fits = std::wstring(44, L'a') + L".txt";
    const std::wstring too_long = std::wstring(45, L'b') + L".txt";
    PutOnPc(fits);
    PutOnPc(too_long);
    const TransferRun run(settings_);
    run.Press(IDC_TRANSFER_SYNCHRONIZE);
    EXPECT_EQ(run.Column(IDC_TRANSFER_PC_LIST), Names{too_long});
}

TEST_F(TransferTest, ADeviceThatVanishesLeavesTheDialogUsable) {
    for (const wchar_t* name : {L"1.txt", L"2.txt", L"3.txt"}) {
        PutOnDevice(name);
    }
    const MessageBoxAnswerer boxes;
    const TransferRun run(settings_);
    device_.Set(L"VANISH", L"8");
    run.Press(IDC_TRANSFER_SYNCHRONIZE);
    EXPECT_FALSE(run.Column(IDC_TRANSFER_DEVICE_LIST).empty());
    EXPECT_EQ(run.Column(IDC_TRANSFER_DEVICE_LIST).size() + ListTree(pc_.Path()).size(), 3U);
    run.Press(IDC_TRANSFER_REFRESH);
    EXPECT_TRUE(run.IsEnabled(IDC_TRANSFER_REFRESH));
}

}  // namespace orvane::testing
