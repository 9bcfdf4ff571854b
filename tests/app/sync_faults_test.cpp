// Synchronizations that meet with trouble: full disks, refused calls, a device that is gone or lies.
#include <algorithm>

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
    // A backup's name has four characters more; that counts where there is something to keep.
    for (const std::size_t limit : {255U, 259U}) {
        SCOPED_TRACE(limit);
        Setting(L"Overwrite_bkp", L"1");
        const std::wstring fits = NameFor(limit, folder, L".qvj");
        const std::wstring too_long = NameFor(limit + 1, folder, L".jpg");
        for (const std::wstring& name : {fits, too_long, std::wstring(L"z.xml")}) {
            PutOnPc(name, 60, "content");
            if (limit == 255U) {
                WriteTextFile(on_device(name), "old", noon_);
            }
        }
        ASSERT_LT(OnPc(too_long).size(), 250U);
        const SyncRun run;
        run.Synchronize();
        EXPECT_EQ(ReadTextFile(on_device(fits)), "content");
        EXPECT_NE(ReadTextFile(on_device(too_long)), "content");
        EXPECT_EQ(ReadTextFile(on_device(L"z.xml")), "content");
        EXPECT_EQ(run.Log().size(), 5U);
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
    const SyncRun run;
    run.Synchronize();
    EXPECT_EQ(PcFiles(), (Lines{fits, L"z.xml"}));
    EXPECT_EQ(run.Log().size(), 5U);
}

}  // namespace

}  // namespace orvane::testing
