// Synchronizations that meet with trouble: full disks, refused calls, a device that is gone or lies.
#include <algorithm>

#include "res/ids.h"
#include "tests/app/sync_fixture.h"

namespace orvane::testing {

namespace {

using Lines = std::vector<std::wstring>;

TEST_F(SyncTest, AFullDeviceEndsThePassAndTheNextPressStartsAfresh) {
    PutOnPc(L"a.qvj", std::string(3000, 'a'), noon_);
    PutOnPc(L"b.qvj", std::string(20000, 'b'), noon_);
    PutOnPc(L"c.qvj", std::string(100, 'c'), noon_);
    PutOnDevice(L"d.txt", "device", noon_);
    device_.Set(L"CAPACITY", L"20000");
    const DialogRun dialog;
    dialog.Press(IDC_SYNC_START);
    EXPECT_TRUE(DialogRun::WaitUntil([&] { return dialog.Log().size() == 4; }));
    EXPECT_EQ(dialog.Log(), (Lines{L"Checking files...", L"[Desktop to Mobile Device] File copy: \"\\a.qvj\"",
                                   L"[Desktop to Mobile Device] File copy: \"\\b.qvj\"",
                                   L"[Desktop to Mobile Device] Error: DEVICE DISK FULL."}));
    Sleep(200);
    EXPECT_EQ(dialog.Text(IDC_SYNC_STATUS), L"Synchronization in progress...");
    EXPECT_EQ(dialog.Text(IDC_SYNC_CANCEL_EXIT), L"Cancel");
    EXPECT_TRUE(Exists(OnDevice(L"a.qvj")));
    EXPECT_FALSE(Exists(OnDevice(L"b.qvj")));
    EXPECT_FALSE(Exists(OnPc(L"d.txt")));

    device_.Set(L"CAPACITY", L"");
    dialog.Synchronize();
    EXPECT_TRUE(Exists(OnDevice(L"b.qvj")));
    EXPECT_TRUE(Exists(OnPc(L"d.txt")));
}

TEST_F(SyncTest, AnUnreadableDeviceLeavesTheDialogIdle) {
    PutOnPc(L"a.qvj", "pc", noon_);
    const DialogRun dialog;
    for (const auto& [name, value] :
         {std::pair{L"CONNECT_RESULT", L"0x80004005"}, std::pair{L"REFUSE", L"CeFindAllFiles=5"}}) {
        device_.Set(name, value);
        const MessageBoxAnswerer answers({IDOK});
        dialog.Press(IDC_SYNC_START);
        ASSERT_EQ(answers.Seen().size(), 1U) << value;
        EXPECT_EQ(answers.Seen()[0].text, L"failed to read from remote device.");
        EXPECT_EQ(answers.Seen()[0].caption, L"Orvanelink");
        EXPECT_EQ(answers.Seen()[0].style & 0xFFU, static_cast<UINT>(MB_OK));
        EXPECT_EQ(dialog.Text(IDC_SYNC_STATUS), L"");
        EXPECT_EQ(dialog.Text(IDC_SYNC_CANCEL_EXIT), L"Exit");
        EXPECT_TRUE(dialog.Log().empty());
        device_.Set(name, L"");
    }
    dialog.Synchronize();
    EXPECT_TRUE(Exists(OnDevice(L"a.qvj")));
}

TEST_F(SyncTest, ADeviceThatVanishesCostsNoFile) {
    for (const wchar_t* name : {L"a.qvj", L"b.qvj", L"c.qvj"}) {
        PutOnPc(name, "older", noon_);
        PutOnDevice(name, "newer", AddSeconds(noon_, 60));
    }
    // A copy that is cut off must not be taken for a newer file by the next run.
    const std::string whole(50'000, 'w');
    PutOnPc(L"big.qvj", whole, noon_);
    PutOnDevice(L"big.txt", whole, noon_);
    const DialogRun dialog;
    // Places all over the run where the device may be lost, up to its regular end.
    for (int call = 2; call < 100; call += 3) {
        device_.Set(L"VANISH", std::to_wstring(call));
        const MessageBoxAnswerer answers({IDOK});
        dialog.Press(IDC_SYNC_START);
        EXPECT_TRUE(DialogRun::WaitUntil([&] { return dialog.Text(IDC_SYNC_CANCEL_EXIT) == L"Exit"; }));
        device_.Set(L"VANISH", L"");
        for (const wchar_t* name : {L"a.qvj", L"b.qvj", L"c.qvj"}) {
            EXPECT_EQ(ReadTextFile(OnDevice(name)), "newer") << call;
            const auto on_pc = ReadTextFile(OnPc(name));
            EXPECT_TRUE(!on_pc || on_pc == "older" || on_pc == "newer") << call;
        }
        // Lost between the calls that create and date the file: the one moment that cannot be covered.
        if (ReadTextFile(OnDevice(L"big.qvj")) == "") {
            DeleteFileW(OnDevice(L"big.qvj").c_str());
        }
        EXPECT_TRUE(ReadTextFile(OnPc(L"big.qvj")) == whole) << call;
        EXPECT_TRUE(ReadTextFile(OnDevice(L"big.txt")) == whole) << call;
    }
    dialog.Synchronize();
    EXPECT_TRUE(ReadTextFile(OnDevice(L"big.qvj")) == whole);
    EXPECT_TRUE(ReadTextFile(OnPc(L"big.txt")) == whole);
    EXPECT_EQ(ReadTextFile(OnPc(L"c.qvj")), "newer");
}

TEST_F(SyncTest, AFailedFileDoesNotStopTheNext) {
    PutOnPc(L"a.qvj", "pc", noon_);
    PutOnPc(L"locked.qvj", "pc", noon_);
    PutOnPc(L"z.qvj", "pc", noon_);
    PutOnDevice(L"b.txt", "device", noon_);
    PutOnDevice(L"y.txt", "device", noon_);
    device_.Set(L"REFUSE", L"CeCreateFile@\\Jobs\\a.qvj=5;CeCreateFile@\\Jobs\\b.txt=32");
    const HANDLE lock =
        CreateFileW(OnPc(L"locked.qvj").c_str(), GENERIC_READ, 0, nullptr, OPEN_EXISTING, 0, nullptr);
    const DialogRun dialog;
    dialog.Synchronize();
    CloseHandle(lock);
    EXPECT_TRUE(Exists(OnDevice(L"z.qvj")));
    EXPECT_TRUE(Exists(OnPc(L"y.txt")));
    EXPECT_FALSE(Exists(OnDevice(L"a.qvj")));
    EXPECT_FALSE(Exists(OnDevice(L"locked.qvj")));
    EXPECT_FALSE(Exists(OnPc(L"b.txt")));
    // The lines of the failed files stay as they are, and no error text reaches the log.
    EXPECT_EQ(dialog.Log().size(), 7U);
}

TEST_F(SyncTest, WorksWithinSessionsAndInsideTheJobFolder) {
    Setting(L"Overwrite_bkp", L"1");
    PutOnPc(L"a.qvj", "newer", AddSeconds(noon_, 60));
    PutOnDevice(L"a.qvj", "older", noon_);
    PutOnPc(L"job.wkf", "job", noon_);
    PutOnPc(L"job\\points.dat", "points", noon_);
    PutOnDevice(L"sub\\b.wkf", "job", noon_);
    // What is left of these names without the extension leads out of the job folder, or to its whole content.
    PutOnPc(L"...wkf", "dots", noon_);
    PutOnPc(L".wkf", "dot", noon_);
    device_.StartTrace();
    DialogRun().Synchronize();

    const std::vector<TraceLine> trace = device_.Trace();
    EXPECT_EQ(device_.CallsOf(L"CeRapiInitEx"), device_.CallsOf(L"CeRapiUninit"));
    for (const TraceLine& call : trace) {
        const bool ends_session = call.function == L"CeRapiUninit";
        EXPECT_TRUE(ends_session || call.sessions > 0) << call.number;
        const std::wstring path = call.arguments.empty() ? L"" : call.arguments[0];
        EXPECT_FALSE(path.ends_with(L"\\..") || path.ends_with(L"\\Jobs\\points.dat")) << call.number;
    }
    EXPECT_TRUE(Exists(OnDevice(L"job\\points.dat")));
}

TEST_F(SyncTest, MissingPcFolderIsMadeWithWhatTheDeviceHas) {
    Setting(L"SyncPath_DT", pc_.Path() + L"\\not\\there\\");
    PutOnDevice(L"a.qvj", "device", noon_);
    DialogRun().Synchronize();
    EXPECT_EQ(ReadTextFile(OnPc(L"not\\there\\a.qvj")), "device");
}

TEST_F(SyncTest, HostileNamesReachNoFileOutsideTheJobFolder) {
    device_.Set(
        L"EXTRA_ENTRIES",
        L"\\Jobs|..\\evil.qvj;\\Jobs|..|folder;\\Jobs|.|folder;\\Jobs|;\\Jobs|c:evil.qvj;\\Jobs|a/evil.qvj;"
        L"\\Jobs|long.qvj|unterminated;\\Jobs|nul.qvj;\\Jobs|com1.txt;\\Jobs|evil.qvj.");
    PutOnDevice(L"good.qvj", "device", noon_);
    const DialogRun dialog;
    dialog.Synchronize();
    EXPECT_EQ(ListTree(pc_.Path()), (Lines{L"good.qvj"}));
    EXPECT_FALSE(Exists(pc_.Path() + L"\\..\\evil.qvj"));
}

TEST_F(SyncTest, RowsWithTooLongPathsFailLikeOthers) {
    Setting(L"Overwrite_bkp", L"1");
    // "\Jobs" and these make device paths of 255 and 256 characters; a backup's name has four more.
    const std::wstring fits = std::wstring(245, L'f') + L".qvj";
    const std::wstring too_long = std::wstring(246, L't') + L".qvj";
    const TempFolder& short_folder = pc_;
    WriteTextFile(L"\\\\?\\" + short_folder / fits, "content", noon_);
    WriteTextFile(L"\\\\?\\" + short_folder / too_long, "content", noon_);
    PutOnPc(L"z.qvj", "content", noon_);
    const DialogRun dialog;
    dialog.Synchronize();
    EXPECT_FALSE(Exists(L"\\\\?\\" + OnDevice(too_long)));
    EXPECT_TRUE(Exists(OnDevice(L"z.qvj")));
    EXPECT_EQ(dialog.Log().size(), 5U);
}

TEST_F(SyncTest, AsksAboutClocksThatDiffer) {
    device_.Set(L"CLOCK_OFFSET", L"180");
    {
        const MessageBoxAnswerer answers({IDCANCEL});
        const DialogRun refused;
        EXPECT_TRUE(DialogRun::WaitUntil([&] { return refused.HasEnded(); }));
        ASSERT_EQ(answers.Seen().size(), 1U);
        EXPECT_EQ(answers.Seen()[0].caption, L"Syncronization");
    }
    const MessageBoxAnswerer answers({IDOK});
    const DialogRun accepted;
    EXPECT_TRUE(DialogRun::WaitUntil([&] { return answers.Seen().size() == 1; }));
    Sleep(100);
    EXPECT_FALSE(accepted.HasEnded());
    accepted.Synchronize();
}

}  // namespace

}  // namespace orvane::testing
