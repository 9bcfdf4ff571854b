// Synchronizations that meet with trouble: full disks, refused calls, a device that is gone or lies.
#include <algorithm>

#include "res/ids.h"
#include "tests/app/sync_fixture.h"

namespace orvane::testing {

namespace {

TEST_F(SyncTest, AFullDeviceEndsThePassAndTheNextPressStartsAfresh) {
    PutOnPc(L"a.qvj", std::string(3000, 'a'), noon_);
    PutOnPc(L"b.qvj", std::string(20000, 'b'), noon_);
    PutOnPc(L"c.qvj", std::string(100, 'c'), noon_);
    PutOnDevice(L"d.txt", "device", noon_);
    device_.Set(L"CAPACITY", L"20000");
    const DialogRun dialog;
    dialog.Press(IDC_SYNC_START);
    EXPECT_TRUE(WaitUntil([&] { return dialog.Log().size() == 4; }));
    EXPECT_EQ(dialog.Log(), (Lines{L"Checking files...", L"[Desktop to Mobile Device] File copy: \"\\a.qvj\"",
                                   L"[Desktop to Mobile Device] File copy: \"\\b.qvj\"",
                                   L"[Desktop to Mobile Device] Error: DEVICE DISK FULL."}));
    Sleep(200);
    EXPECT_EQ(dialog.Text(IDC_SYNC_STATUS), L"Synchronization in progress...");
    EXPECT_EQ(dialog.Text(IDC_SYNC_CANCEL_EXIT), L"Cancel");
    EXPECT_EQ(DeviceFiles(), (Lines{L"a.qvj", L"d.txt"}));
    EXPECT_FALSE(Exists(OnPc(L"d.txt")));

    device_.Set(L"CAPACITY", L"");
    dialog.Synchronize();
    EXPECT_EQ(DeviceFiles(), (Lines{L"a.qvj", L"b.qvj", L"c.qvj", L"d.txt"}));
    EXPECT_EQ(PcFiles(), DeviceFiles());
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
    const std::string whole(10'000, 'w');
    const Lines small = {L"a.qvj", L"b.qvj", L"c.qvj"};
    const DialogRun dialog;
    // At each call of the run that follows the listing.
    bool all_copied = false;
    for (int call = 3; call <= 23; ++call) {
        SCOPED_TRACE(call);
        for (const std::wstring& name : small) {
            PutOnPc(name, "older", noon_);
            PutOnDevice(name, "newer", AddSeconds(noon_, 60));
        }
        PutOnPc(L"big.qvj", whole, noon_);
        PutOnDevice(L"big.txt", whole, noon_);
        DeleteFileW(OnDevice(L"big.qvj").c_str());
        DeleteFileW(OnPc(L"big.txt").c_str());

        device_.Set(L"VANISH", std::to_wstring(call));
        const MessageBoxAnswerer answers({IDOK});
        dialog.Press(IDC_SYNC_START);
        EXPECT_TRUE(WaitUntil([&] { return dialog.Text(IDC_SYNC_CANCEL_EXIT) == L"Exit"; }));
        device_.Set(L"VANISH", L"");
        int missing = 0;
        all_copied = ReadTextFile(OnDevice(L"big.qvj")) == whole && ReadTextFile(OnPc(L"big.txt")) == whole;
        for (const std::wstring& name : small) {
            EXPECT_EQ(ReadTextFile(OnDevice(name)), "newer");
            const auto on_pc = ReadTextFile(OnPc(name));
            missing += on_pc ? 0 : 1;
            all_copied = all_copied && on_pc == "newer";
            EXPECT_TRUE(!on_pc || on_pc == "older" || on_pc == "newer") << *on_pc;
        }
        EXPECT_LE(missing, 1);  // The file under way.
        EXPECT_TRUE(ReadTextFile(OnPc(L"big.qvj")) == whole);
        EXPECT_TRUE(ReadTextFile(OnDevice(L"big.txt")) == whole);
        // Lost between the calls that create and date the file: the one moment that cannot be covered.
        if (ReadTextFile(OnDevice(L"big.qvj")) == "") {
            DeleteFileW(OnDevice(L"big.qvj").c_str());
        }

        // A copy that was cut off must not be taken for a newer file.
        dialog.Synchronize();
        for (const std::wstring& name : small) {
            EXPECT_EQ(ReadTextFile(OnDevice(name)), "newer");
            EXPECT_EQ(ReadTextFile(OnPc(name)), "newer");
        }
        for (const std::wstring& name : {OnPc(L"big.qvj"), OnDevice(L"big.qvj"), OnPc(L"big.txt")}) {
            EXPECT_TRUE(ReadTextFile(name) == whole) << name.substr(name.size() - 7).c_str();
        }
    }
    EXPECT_TRUE(all_copied);  // The last loss came too late to matter.
}

TEST_F(SyncTest, AFailedFileDoesNotStopTheNext) {
    for (const wchar_t* name : {L"a.qvj", L"locked.qvj", L"z.qvj"}) {
        PutOnPc(name, "pc", noon_);
    }
    PutOnDevice(L"b.txt", "device", noon_);
    PutOnDevice(L"y.txt", "device", noon_);
    device_.Set(L"REFUSE", L"CeCreateFile@\\Jobs\\a.qvj=5;CeCreateFile@\\Jobs\\b.txt=32");
    const HANDLE lock =
        CreateFileW(OnPc(L"locked.qvj").c_str(), GENERIC_READ, 0, nullptr, OPEN_EXISTING, 0, nullptr);
    const DialogRun dialog;
    dialog.Synchronize();
    CloseHandle(lock);
    EXPECT_EQ(DeviceFiles(), (Lines{L"b.txt", L"y.txt", L"z.qvj"}));
    EXPECT_EQ(PcFiles(), (Lines{L"a.qvj", L"locked.qvj", L"y.txt", L"z.qvj"}));
    // The lines of the failed files stay as they are, and no error text reaches the log.
    EXPECT_EQ(dialog.Log().size(), 7U);
}

TEST_F(SyncTest, WorksWithinSessionsAndInsideTheJobFolder) {
    Setting(L"Overwrite_bkp", L"1");
    PutNewerOnPc(L"a.qvj");
    PutOnPc(L"job.wkf", "job", noon_);
    PutOnPc(L"job\\points.dat", "points", noon_);
    PutOnDevice(L"sub\\b.wkf", "job", noon_);
    // What is left of these names without the extension leads out of the job folder, or to its whole content.
    PutOnPc(L"...wkf", "dots", noon_);
    PutOnPc(L".wkf", "dot", noon_);
    device_.StartTrace();
    DialogRun().Synchronize();

    EXPECT_EQ(device_.CallsOf(L"CeRapiInitEx"), device_.CallsOf(L"CeRapiUninit"));
    for (const TraceLine& call : device_.Trace()) {
        EXPECT_TRUE(call.function == L"CeRapiUninit" || call.sessions > 0) << call.number;
        const std::wstring path = call.arguments.empty() ? L"" : call.arguments[0];
        EXPECT_FALSE(path.ends_with(L"\\..") || path.ends_with(L"\\Jobs\\points.dat")) << call.number;
    }
    EXPECT_TRUE(Exists(OnDevice(L"job\\points.dat")));
}

TEST_F(SyncTest, AMissingPcFolderIsMadeButWithoutOneNothingIsCopied) {
    PutOnDevice(L"orvane_test.txt", "device", noon_);
    Setting(L"SyncPath_DT", OnPc(L"not\\there\\"));
    DialogRun().Synchronize();
    const Lines made = {L"not\\", L"not\\there\\", L"not\\there\\orvane_test.txt"};
    EXPECT_EQ(PcFiles(), made);
    // The root of the current drive must not take its place.
    std::wstring current(MAX_PATH, L'\0');
    current.resize(GetCurrentDirectoryW(MAX_PATH, current.data()));
    ASSERT_TRUE(SetCurrentDirectoryW(pc_.Path().c_str()));
    for (const wchar_t* folder : {L"\\", L""}) {
        Setting(L"SyncPath_DT", folder);
        const DialogRun dialog;
        dialog.Synchronize();
        EXPECT_EQ(dialog.BarMaximum(), 1);  // Nothing was listed on the PC.
        EXPECT_EQ(dialog.Log().size(), 3U);
        EXPECT_FALSE(Exists(L"\\orvane_test.txt"));
        EXPECT_EQ(PcFiles(), made);
    }
    SetCurrentDirectoryW(current.c_str());
}

TEST_F(SyncTest, HostileNamesReachNoFileOutsideTheJobFolder) {
    device_.Set(L"EXTRA_ENTRIES",
                L"\\Jobs|..\\evil.qvj;\\Jobs|..|folder;\\Jobs|.|folder;\\Jobs|;\\Jobs|c:evil.qvj;"
                L"\\Jobs|a/evil.qvj;\\Jobs|long.qvj|unterminated;\\Jobs|nul.qvj;\\Jobs|com1.txt;"
                L"\\Jobs|evil.qvj.;\\Jobs|evil.qvj ;\\Jobs|...wkf");
    PutOnDevice(L"good.qvj", "device", noon_);
    device_.StartTrace();
    DialogRun().Synchronize();
    EXPECT_EQ(PcFiles(), (Lines{L"good.qvj"}));
    // The device would refuse most of these names, so it must not even be asked.
    Lines opened;
    for (const TraceLine& call : device_.Trace()) {
        if (call.function == L"CeCreateFile" && call.arguments[0] != L"\\CompareDateTime.txt") {
            opened.push_back(call.arguments[0]);
        }
        EXPECT_TRUE(call.function != L"CeFindAllFiles" || call.arguments[0] == L"\\Jobs\\*") << call.number;
    }
    std::sort(opened.begin(), opened.end());
    // "...wkf" is an ordinary name; that of the folder which would go with it is not.
    EXPECT_EQ(opened, (Lines{L"\\Jobs\\...wkf", L"\\Jobs\\good.qvj"}));
}

TEST_F(SyncTest, ShortNamesLeadIntoNoOtherFolder) {
    const std::wstring folder = L"a long folder name";
    const Lines kept = {folder + L"\\listed.qvj", L"job\\" + folder + L"\\companion.dat"};
    for (const std::wstring& name : kept) {
        PutOnPc(name, "kept", noon_);
    }
    wchar_t path[MAX_PATH] = L"";
    GetShortPathNameW(OnPc(folder).c_str(), path, MAX_PATH);
    const std::wstring alias = std::wstring(path).substr(std::wstring(path).rfind(L'\\') + 1);
    if (alias.find(L'~') == std::wstring::npos) {
        GTEST_SKIP() << "no short names to be had here";
    }
    const FILETIME newer = AddSeconds(noon_, 60);
    PutOnDevice(alias + L"\\listed.qvj", "device", newer);
    PutOnDevice(alias + L"\\new.qvj", "device", newer);
    PutOnDevice(L"job.wkf", "device", newer);
    PutOnDevice(L"job\\" + alias + L"\\companion.dat", "device", newer);
    DialogRun().Synchronize();
    for (const std::wstring& name : kept) {
        EXPECT_EQ(ReadTextFile(OnPc(name)), "kept") << name;
    }
    EXPECT_FALSE(Exists(OnPc(folder + L"\\new.qvj")));
    EXPECT_TRUE(Exists(OnPc(L"job.wkf")));
}

// A name that brings `folder` to that many characters.
std::wstring NameFor(std::size_t characters, const std::wstring& folder, const wchar_t* extension) {
    return std::wstring(characters - folder.size() - 4, L'n') + extension;
}

TEST_F(SyncTest, RowsWithPathsTooLongForTheDeviceFailLikeOthers) {
    const std::wstring folder = L"\\" + std::wstring(200, L'd') + L"\\";
    Setting(L"SyncPath_CE", folder);
    const auto on_device = [&](const std::wstring& name) {
        return L"\\\\?\\" + device_.Root() + folder + name;
    };
    ASSERT_TRUE(CreateDirectoryW(on_device(L"").c_str(), nullptr));
    // A backup's name has four characters more, and must fit too.
    for (const auto& [backups, limit] : {std::pair{L"1", 255U}, std::pair{L"0", 259U}}) {
        SCOPED_TRACE(limit);
        Setting(L"Overwrite_bkp", backups);
        const std::wstring fits = NameFor(limit, folder, L".qvj");
        const std::wstring too_long = NameFor(limit + 1, folder, L".jpg");
        for (const std::wstring& name : {fits, too_long, std::wstring(L"z.xml")}) {
            PutOnPc(name, "content", noon_);
        }
        ASSERT_LT(OnPc(too_long).size(), 250U);
        const DialogRun dialog;
        dialog.Synchronize();
        EXPECT_TRUE(Exists(on_device(fits)));
        EXPECT_FALSE(Exists(on_device(too_long)));
        EXPECT_TRUE(Exists(on_device(L"z.xml")));
        EXPECT_EQ(dialog.Log().size(), 5U);
        for (const std::wstring& name : {fits, too_long, std::wstring(L"z.xml")}) {
            DeleteFileW(OnPc(name).c_str());
            DeleteFileW(on_device(name).c_str());
        }
    }
}

TEST_F(SyncTest, RowsWithPathsTooLongForThePcFailLikeOthers) {
    const std::wstring fits = NameFor(259, OnPc(L""), L".qvj");
    const std::wstring too_long = NameFor(260, OnPc(L""), L".jpg");
    for (const std::wstring& name : {fits, too_long, std::wstring(L"z.xml")}) {
        WriteTextFile(L"\\\\?\\" + OnDevice(name), "content", noon_);
    }
    const DialogRun dialog;
    dialog.Synchronize();
    EXPECT_EQ(PcFiles(), (Lines{fits, L"z.xml"}));
    EXPECT_EQ(dialog.Log().size(), 5U);
}

TEST_F(SyncTest, AsksAboutClocksThatDiffer) {
    device_.Set(L"CLOCK_OFFSET", L"180");
    const MessageBoxAnswerer answers({IDCANCEL, IDOK});
    {
        const DialogRun refused;
        EXPECT_TRUE(WaitUntil([&] { return refused.HasEnded(); }));
    }
    const DialogRun accepted;
    EXPECT_TRUE(WaitUntil([&] { return answers.Seen().size() == 2; }));
    EXPECT_EQ(answers.Seen()[0].caption, L"Syncronization");
    Sleep(100);
    EXPECT_FALSE(accepted.HasEnded());
    accepted.Synchronize();
}

}  // namespace

}  // namespace orvane::testing
