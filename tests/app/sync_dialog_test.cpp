// Whole synchronizations through the real dialog: what it does and what it shows.
#include <windows.h>

#include <commctrl.h>

#include <algorithm>

#include "qelutils/xlate.h"
#include "res/ids.h"
#include "tests/app/sync_fixture.h"

namespace orvane::testing {

namespace {

TEST_F(SyncTest, CopiesBothWaysAndTellsSo) {
    PutOnPc(L"from_pc.qvj", "pc", noon_);
    PutOnPc(L"sub\\deep\\Plan.XML", "plan", noon_);
    PutOnPc(L"letter.doc", "stays", noon_);
    PutOnDevice(L"from_device.txt", "device", noon_);
    PutOnDevice(L"day 1\\scan.img", "image", noon_);
    PutOnPc(L"newer_here.tn3", "newer", AddSeconds(noon_, 10));
    PutOnDevice(L"NEWER_HERE.tn3", "older", noon_);
    PutOnPc(L"same.tn3", "as on the pc", AddSeconds(noon_, 9));
    PutOnDevice(L"same.tn3", "as on the device", noon_);
    PutOnPc(L"newer_there.rd3", "older", noon_);
    PutOnDevice(L"newer_there.rd3", "newer", AddSeconds(noon_, 3600));

    const DialogRun dialog;
    EXPECT_EQ(dialog.Text(IDC_SYNC_CANCEL_EXIT), L"Exit");
    EXPECT_EQ(dialog.Text(IDC_SYNC_STATUS), L"");
    EXPECT_FALSE(dialog.IsBarVisible());
    dialog.Synchronize();

    Lines log = dialog.Log();
    EXPECT_EQ(log, (Lines{L"Checking files...", L"[Desktop to Mobile Device] File copy: \"\\from_pc.qvj\"",
                          L"[Desktop to Mobile Device] File copy: \"\\newer_here.tn3\"",
                          L"[Desktop to Mobile Device] File copy: \"\\sub\\deep\\Plan.XML\"",
                          L"[Mobile Device to Desktop] File copy: \"\\day 1\\scan.img\"",
                          L"[Mobile Device to Desktop] File copy: \"\\from_device.txt\"",
                          L"[Mobile Device to Desktop] File copy: \"\\newer_there.rd3\"",
                          L"Synchronization complete."}));
    EXPECT_EQ(dialog.Text(IDC_SYNC_CANCEL_EXIT), L"Exit");
    // 8 entries on the PC, 6 on the device.
    EXPECT_EQ(dialog.BarMaximum(), 14);
    EXPECT_EQ(SendMessageW(dialog.Item(IDC_SYNC_PROGRESS), PBM_GETPOS, 0, 0), 14);

    EXPECT_EQ(ReadTextFile(OnDevice(L"from_pc.qvj")), "pc");
    EXPECT_EQ(ReadTextFile(OnDevice(L"sub\\deep\\Plan.XML")), "plan");
    EXPECT_FALSE(Exists(OnDevice(L"letter.doc")));
    EXPECT_EQ(ReadTextFile(OnPc(L"from_device.txt")), "device");
    EXPECT_EQ(ReadTextFile(OnPc(L"day 1\\scan.img")), "image");
    EXPECT_EQ(ReadTextFile(OnDevice(L"newer_here.tn3")), "newer");
    EXPECT_EQ(ReadTextFile(OnDevice(L"same.tn3")), "as on the device");
    EXPECT_EQ(ReadTextFile(OnPc(L"newer_there.rd3")), "newer");
    EXPECT_EQ(TicksOf(LastWriteTime(OnPc(L"from_device.txt"))), TicksOf(noon_));

    // Nothing is left to do, and the log goes on below.
    dialog.Synchronize();
    log.insert(log.end(), {L"Checking files...", L"Synchronization complete."});
    EXPECT_EQ(dialog.Log(), log);
}

TEST_F(SyncTest, StartsAsAFileViewerOnRequest) {
    Setting(L"Start_File_View", L"1");
    const DialogRun dialog;
    ASSERT_NE(FileView(), nullptr);
    const ULONGLONG shown = GetTickCount64();
    EXPECT_TRUE(WaitUntil([&] {
        EXPECT_FALSE(IsWindowVisible(dialog.Window()));
        return GetTickCount64() >= shown + 200;
    }));
    PostMessageW(FileView(), WM_CLOSE, 0, 0);
    EXPECT_TRUE(WaitUntil([&] {
        EXPECT_FALSE(IsWindowVisible(dialog.Window()));
        return dialog.HasEnded();
    }));
}

TEST_F(SyncTest, TakesCompanionFoldersAlongAndKeepsBackups) {
    Setting(L"Overwrite_bkp", L"1");
    PutOnPc(L"bridge.wkf", "job", noon_);
    PutOnPc(L"bridge\\raw\\points.dat", "points", noon_);
    PutOnDevice(L"tunnel.WKF", "job", noon_);
    PutOnDevice(L"tunnel\\points.dat", "points", noon_);
    PutNewerOnPc(L"level.qvj");
    PutOnDevice(L"level.qvj.001", "oldest", noon_);

    DialogRun().Synchronize();
    EXPECT_EQ(ReadTextFile(OnDevice(L"bridge\\raw\\points.dat")), "points");
    EXPECT_EQ(ReadTextFile(OnPc(L"tunnel\\points.dat")), "points");
    EXPECT_EQ(ReadTextFile(OnDevice(L"level.qvj")), "newer");
    EXPECT_EQ(ReadTextFile(OnDevice(L"level.qvj.002")), "older");
}

TEST_F(SyncTest, AsksBeforeReplacingWhenTheUserWantsWarning) {
    Setting(L"Overwrite_warn", L"1");
    PutNewerOnPc(L"a.qvj");
    PutNewerOnPc(L"b.qvj");
    const MessageBoxAnswerer answers({IDCANCEL, IDOK});
    DialogRun().Synchronize();
    EXPECT_EQ(ReadTextFile(OnDevice(L"a.qvj")), "older");
    EXPECT_EQ(ReadTextFile(OnDevice(L"b.qvj")), "newer");
    const auto boxes = answers.Seen();
    ASSERT_EQ(boxes.size(), 2U);
    EXPECT_EQ(boxes[0].caption, L"Synchronization - Warning");
    EXPECT_EQ(boxes[0].text, L"The file:\n\\Jobs\\a.qvj [Device] \n\nWill be replaced by the file:\n" +
                                 OnPc(L"a.qvj") + L" [PC]");
    EXPECT_EQ(boxes[0].owner, nullptr);
    EXPECT_EQ(boxes[0].style & 0x1171U, 0x1121U);
}

TEST_F(SyncTest, WorksInTheUsersLanguage) {
    qel_text::SetCatalogLanguage(MAKELANGID(LANG_GERMAN, SUBLANG_GERMAN));
    {
        PutManyOnPc(40);
        device_.Set(L"CALL_DELAY", L"5");
        const DialogRun dialog;
        EXPECT_EQ(dialog.Text(IDC_SYNC_CANCEL_EXIT), L"Beenden");
        dialog.Press(IDC_SYNC_START);
        EXPECT_TRUE(WaitUntil([&] { return dialog.Text(IDC_SYNC_CANCEL_EXIT) == L"Abbrechen"; }));
        dialog.Press(IDC_SYNC_CANCEL_EXIT);
        EXPECT_EQ(dialog.Text(IDC_SYNC_CANCEL_EXIT), L"Beenden");
        dialog.Press(IDC_SYNC_CANCEL_EXIT);  // The second click of a double click.
        Sleep(GetDoubleClickTime() + 100);
        EXPECT_FALSE(dialog.HasEnded());
        dialog.Press(IDC_SYNC_CANCEL_EXIT);
        EXPECT_TRUE(WaitUntil([&] { return dialog.HasEnded(); }));
    }
    qel_text::SetCatalogLanguage(MAKELANGID(LANG_ENGLISH, SUBLANG_ENGLISH_US));
}

TEST_F(SyncTest, CancelStopsAndTheNextPressStartsAfresh) {
    PutManyOnPc(60);
    device_.Set(L"CALL_DELAY", L"5");
    const DialogRun dialog;
    const auto starts = [&] {
        const Lines log = dialog.Log();
        return std::count(log.begin(), log.end(), L"Checking files...");
    };
    dialog.Press(IDC_SYNC_START);
    EXPECT_TRUE(WaitUntil([&] { return dialog.Log().size() >= 3; }));
    EXPECT_EQ(dialog.Text(IDC_SYNC_STATUS), L"Synchronization in progress...");
    EXPECT_TRUE(dialog.IsBarVisible());

    // While a worker runs the press does nothing.
    dialog.Press(IDC_SYNC_START);
    EXPECT_EQ(starts(), 1);

    dialog.Press(IDC_SYNC_CANCEL_EXIT);
    EXPECT_EQ(dialog.Text(IDC_SYNC_CANCEL_EXIT), L"Exit");
    Sleep(300);  // For the file under way to end.
    const Lines copied = DeviceFiles();
    EXPECT_LT(copied.size(), 60U);
    Sleep(300);
    EXPECT_EQ(DeviceFiles(), copied);
    EXPECT_EQ(dialog.Completions(), 0);
    EXPECT_EQ(dialog.Text(IDC_SYNC_STATUS), L"Sychronization cancelled");
    EXPECT_TRUE(dialog.IsBarVisible());

    device_.Set(L"CALL_DELAY", L"");
    dialog.Synchronize();
    EXPECT_EQ(starts(), 2);
    for (int i = 0; i < 60; ++i) {
        EXPECT_EQ(ReadTextFile(OnDevice(L"new_" + std::to_wstring(i) + L".qvj")), "content") << i;
    }
}

TEST_F(SyncTest, CancelledInItsLastFileARunStaysCancelled) {
    for (const bool to_device : {true, false}) {
        const std::wstring large = to_device ? L"large.qvj" : L"large.txt";
        WriteTextFile(to_device ? OnPc(large) : OnDevice(large), std::string(4'000'000, 'l'), noon_);
        if (to_device) {
            PutOnDevice(L"later.txt", "for the second pass", noon_);
        }
        device_.Set(L"CALL_DELAY", L"10");
        const DialogRun dialog;
        dialog.Press(IDC_SYNC_START);
        EXPECT_TRUE(WaitUntil([&] { return dialog.Log().size() == 2; }));
        Sleep(100);
        dialog.Press(IDC_SYNC_CANCEL_EXIT);
        Sleep(300);
        EXPECT_EQ(dialog.Text(IDC_SYNC_STATUS), L"Sychronization cancelled");
        EXPECT_EQ(dialog.Log().size(), 2U);
        EXPECT_FALSE(Exists(to_device ? OnDevice(large) : OnPc(large)));
        EXPECT_FALSE(Exists(OnPc(L"later.txt")));
        DeleteFileW(OnPc(L"large.qvj").c_str());
        DeleteFileW(OnDevice(L"later.txt").c_str());
    }
}

TEST_F(SyncTest, LeavingRemovesTheFileThatIsCopiedInPart) {
    PutOnPc(L"large.qvj", std::string(4'000'000, 'l'), noon_);
    device_.Set(L"CALL_DELAY", L"10");
    const DialogRun dialog;
    dialog.Press(IDC_SYNC_START);
    EXPECT_TRUE(WaitUntil([&] { return Exists(OnDevice(L"large.qvj")); }));
    PostMessageW(dialog.Window(), WM_COMMAND, IDCANCEL, 0);
    EXPECT_TRUE(WaitUntil([&] { return dialog.HasEnded(); }));
    EXPECT_FALSE(Exists(OnDevice(L"large.qvj")));
}

TEST_F(SyncTest, AnOpenQuestionHoldsUpTheNextStart) {
    Setting(L"Overwrite_warn", L"1");
    PutNewerOnPc(L"a.qvj");
    const DialogRun dialog;
    const auto question = [] { return FindWindowW(L"#32770", L"Synchronization - Warning"); };
    dialog.Press(IDC_SYNC_START);
    EXPECT_TRUE(WaitUntil([&] { return question() != nullptr; }));
    dialog.Press(IDC_SYNC_CANCEL_EXIT);
    dialog.Press(IDC_SYNC_START);
    EXPECT_EQ(dialog.Log(), (Lines{L"Checking files..."}));

    PostMessageW(question(), WM_COMMAND, IDOK, 0);
    EXPECT_TRUE(WaitUntil([&] { return question() == nullptr; }));
    Setting(L"Overwrite_warn", L"0");
    const MessageBoxAnswerer answers({IDOK});
    dialog.Synchronize();
    EXPECT_EQ(ReadTextFile(OnDevice(L"a.qvj")), "newer");
}

TEST_F(SyncTest, TwentyRunsLeaveNoHandlesBehind) {
    PutManyOnPc(1);
    PutOnDevice(L"a.txt", "device", noon_);
    const DialogRun dialog;
    dialog.Synchronize();
    DWORD before = 0;
    DWORD after = 0;
    GetProcessHandleCount(GetCurrentProcess(), &before);
    for (int i = 0; i < 20; ++i) {
        DeleteFileW(OnDevice(L"new_0.qvj").c_str());
        DeleteFileW(OnPc(L"a.txt").c_str());
        dialog.Synchronize();
        EXPECT_TRUE(Exists(OnDevice(L"new_0.qvj")) && Exists(OnPc(L"a.txt"))) << i;
    }
    GetProcessHandleCount(GetCurrentProcess(), &after);
    // Each run keeps the two cancel events of its passes.
    EXPECT_LE(after, before + 2 * 20);
}

TEST_F(SyncTest, ShowsTheAboutBoxFromTheSystemMenu) {
    const DialogRun dialog;
    PostMessageW(dialog.Window(), WM_SYSCOMMAND, IDM_ABOUT, 0);
    const auto about = [] { return FindWindowW(L"#32770", L"About Orvanelink"); };
    ASSERT_TRUE(WaitUntil([&] { return about() != nullptr; }));
    PostMessageW(about(), WM_COMMAND, IDOK, 0);
    EXPECT_TRUE(WaitUntil([&] { return about() == nullptr; }));
}

}  // namespace

}  // namespace orvane::testing
