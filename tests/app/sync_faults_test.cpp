// Synchronizations that meet with trouble: full disks, refused calls, a device that is gone or lies.
#include <set>

#include "tests/app/sync_fixture.h"

namespace orvane::testing {

namespace {

TEST_F(SyncTest, AFullDeviceEndsThePassAndTheNextPressStartsAfresh) {
    PutOnPc(L"a.qvj", 0, std::string(3000, 'a'));
    PutOnPc(L"b.qvj", 0, std::string(20000, 'b'));
    PutOnPc(L"c.qvj", 0, std::string(100, 'c'));
    PutOnDevice(L"d.txt", 0, "device");
    device_.Set(L"CAPACITY", L"20000");
    const SyncRun run;
    run.Press(IDC_SYNC_START);
    EXPECT_TRUE(WaitUntil([&] { return run.Log().size() == 4; }));
    EXPECT_EQ(run.Log(), (Lines{L"Checking files...", L"[Desktop to Mobile Device] File copy: \"\\a.qvj\"",
                                L"[Desktop to Mobile Device] File copy: \"\\b.qvj\"",
                                L"[Desktop to Mobile Device] Error: DEVICE DISK FULL."}));
    Sleep(200);
    EXPECT_EQ(run.Status(), L"Synchronization in progress...");
    EXPECT_EQ(run.Button(), L"Cancel");
    EXPECT_EQ(DeviceFiles(), (Lines{L"a.qvj", L"d.txt"}));
    EXPECT_FALSE(Exists(OnPc(L"d.txt")));

    device_.Set(L"CAPACITY", L"");
    run.Synchronize();
    EXPECT_EQ(DeviceFiles(), (Lines{L"a.qvj", L"b.qvj", L"c.qvj", L"d.txt"}));
    EXPECT_EQ(PcFiles(), DeviceFiles());
}

TEST_F(SyncTest, AnUnreadableDeviceLeavesTheDialogIdle) {
    PutOnPc(L"a.qvj", 0, "pc");
    const SyncRun run;
    for (const auto& [name, value] :
         {std::pair{L"CONNECT_RESULT", L"0x80004005"}, std::pair{L"REFUSE", L"CeFindAllFiles=5"}}) {
        device_.Set(name, value);
        const MessageBoxAnswerer answers({IDOK});
        run.Press(IDC_SYNC_START);
        ASSERT_EQ(answers.Seen().size(), 1U) << value;
        EXPECT_EQ(answers.Seen()[0].text, L"failed to read from remote device.");
        EXPECT_EQ(answers.Seen()[0].caption, L"Orvanelink");
        EXPECT_EQ(run.Status(), L"");
        EXPECT_EQ(run.Button(), L"Exit");
        EXPECT_TRUE(run.Log().empty());
        device_.Set(name, L"");
    }
    run.Synchronize();
    EXPECT_TRUE(Exists(OnDevice(L"a.qvj")));
}

TEST_F(SyncTest, ALostDeviceEndsTheRunAndIsTold) {
    PutManyOnPc(20);
    PutOnDevice(L"later.txt");
    const SyncRun run;
    device_.Set(L"VANISH", L"12");
    device_.Set(L"VANISH_DELAY", L"1");  // From then on it is silent, and each look for it takes a second.
    const ULONGLONG pressed = GetTickCount64();
    run.Press(IDC_SYNC_START);
    EXPECT_TRUE(WaitUntil([&] { return run.Button() == L"Exit"; }));
    EXPECT_LT(GetTickCount64() - pressed, 5'000U);
    const Lines log = run.Log();
    EXPECT_LT(log.size(), 6U);
    EXPECT_EQ(log.back(), L"Communication Error.");
    EXPECT_EQ(run.Status(), L"Sychronization cancelled");
    device_.Set(L"VANISH", L"");
    run.Synchronize();
    EXPECT_EQ(DeviceFiles(), PcFiles());
}

TEST_F(SyncTest, AMissingPcFolderIsMadeButWithoutOneNothingIsCopied) {
    PutOnDevice(L"orvane_test.txt", 0, "device");
    Setting(L"SyncPath_DT", OnPc(L"not\\there\\"));
    SyncRun().Synchronize();
    const Lines made = {L"not\\", L"not\\there\\", L"not\\there\\orvane_test.txt"};
    EXPECT_EQ(PcFiles(), made);
    // The root of the current drive must not take its place.
    std::wstring current(MAX_PATH, L'\0');
    current.resize(GetCurrentDirectoryW(MAX_PATH, current.data()));
    ASSERT_TRUE(SetCurrentDirectoryW(pc_.Path().c_str()));
    for (const wchar_t* folder : {L"\\", L""}) {
        Setting(L"SyncPath_DT", folder);
        const SyncRun run;
        run.Synchronize();
        EXPECT_EQ(run.BarMaximum(), 1);  // Nothing was listed on the PC.
        EXPECT_EQ(run.Log().size(), 3U);
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
    PutOnDevice(L"good.qvj", 0, "device");
    device_.StartTrace();
    SyncRun().Synchronize();
    EXPECT_EQ(PcFiles(), (Lines{L"good.qvj"}));
    // The device would refuse most of these names, so it must not even be asked.
    std::set<std::wstring> opened;
    for (const TraceLine& call : device_.Trace()) {
        if (call.function == L"CeCreateFile" && call.arguments[0] != L"\\CompareDateTime.txt") {
            opened.insert(call.arguments[0]);
        }
        EXPECT_TRUE(call.function != L"CeFindAllFiles" || call.arguments[0] == L"\\Jobs\\*") << call.number;
    }
    // "...wkf" is an ordinary name; that of the folder which would go with it is not.
    EXPECT_EQ(opened, (std::set<std::wstring>{L"\\Jobs\\...wkf", L"\\Jobs\\good.qvj"}));
}

TEST_F(SyncTest, ShortNamesLeadIntoNoOtherFolder) {
    const std::wstring folder = L"a long folder name";
    const Lines kept = {folder + L"\\listed.qvj", L"job\\" + folder + L"\\companion.dat"};
    for (const std::wstring& name : kept) {
        PutOnPc(name, 0, "kept");
    }
    wchar_t path[MAX_PATH] = L"";
    GetShortPathNameW(OnPc(folder).c_str(), path, MAX_PATH);
    const std::wstring alias = std::wstring(path).substr(std::wstring(path).rfind(L'\\') + 1);
    if (alias.find(L'~') == std::wstring::npos) {
        GTEST_SKIP() << "no short names to be had here";
    }
    PutOnDevice(alias + L"\\listed.qvj", 60);
    PutOnDevice(alias + L"\\new.qvj", 60);
    PutOnDevice(L"job.wkf", 60);
    PutOnDevice(L"job\\" + alias + L"\\companion.dat", 60);
    SyncRun().Synchronize();
    for (const std::wstring& name : kept) {
        EXPECT_EQ(ReadTextFile(OnPc(name)), "kept") << name;
    }
    EXPECT_FALSE(Exists(OnPc(folder + L"\\new.qvj")));
    EXPECT_TRUE(Exists(OnPc(L"job.wkf")));
}

TEST_F(SyncTest, RowsWithPathsTooLongForASideFailLikeOthers) {
    // A backup's name has four characters more; that counts where there is something to keep.
    const struct {
        bool to_device;
        std::size_t limit;
    } cases[] = {{true, 255}, {true, 259}, {false, 259}};
    for (const auto& [to_device, limit] : cases) {
        SCOPED_TRACE(limit);
        const std::wstring folder = to_device ? L"\\" + std::wstring(200, L'd') + L"\\" : L"\\Jobs\\";
        Setting(L"SyncPath_CE", folder);
        Setting(L"Overwrite_bkp", to_device ? L"1" : L"0");
        const std::wstring pc = L"\\\\?\\" + OnPc(L"");
        const std::wstring device = L"\\\\?\\" + device_.PcPath(folder);
        const std::size_t rest = limit - (to_device ? folder : OnPc(L"")).size();
        const std::wstring fits = std::wstring(rest - 4, L'n') + L".qvj";
        const std::wstring too_long = std::wstring(rest - 3, L'n') + L".jpg";
        CreateDirectoryW(device.c_str(), nullptr);
        for (const std::wstring& name : {fits, too_long, std::wstring(L"z.xml")}) {
            WriteTextFile((to_device ? pc : device) + name, "content", AddSeconds(noon_, 60));
            if (limit == 255) {
                WriteTextFile(device + name, "old", noon_);
            }
        }
        const SyncRun run;
        run.Synchronize();
        const std::wstring& target = to_device ? device : pc;
        EXPECT_EQ(ReadTextFile(target + fits), "content");
        EXPECT_NE(ReadTextFile(target + too_long), "content");
        EXPECT_EQ(ReadTextFile(target + L"z.xml"), "content");
        EXPECT_EQ(run.Log().size(), 5U);
        for (const std::wstring& name : {fits, too_long, std::wstring(L"z.xml")}) {
            DeleteFileW((pc + name).c_str());
            DeleteFileW((device + name).c_str());
        }
    }
}

}  // namespace

}  // namespace orvane::testing
