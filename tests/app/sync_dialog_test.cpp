// What the synchronization dialog does and shows.
#include <atomic>
#include <cstdlib>
#include <new>

#include "tests/app/sync_fixture.h"
#include "ui/dialog.h"

namespace {

// While it is not 0, only the thread of that number and the one that set it get memory.
std::atomic<DWORD> fed_thread{0};
std::atomic<DWORD> feeding_thread{0};

}  // namespace

// NOLINTNEXTLINE(misc-new-delete-overloads): the library's own operator delete frees what malloc gave.
void* operator new(std::size_t bytes) {
    const DWORD thread = GetCurrentThreadId();
    const bool fed = fed_thread == 0 || thread == fed_thread || thread == feeding_thread;
    if (void* memory = fed ? std::malloc(bytes) : nullptr) {
        return memory;
    }
    throw std::bad_alloc();
}

namespace orvane::testing {

namespace {

constexpr const wchar_t* kRunning = L"Synchronization in progress...";
constexpr const wchar_t* kCancelled = L"Sychronization cancelled";
constexpr const wchar_t* kStart = L"Checking files...";
constexpr const wchar_t* kView = L"File Transfer - Copy From";
constexpr const wchar_t* kOptions = L"Options";

// A dialog of that caption that can be seen; null when there is none.
HWND Shown(const wchar_t* caption) {
    return FindDialog([&](HWND dialog) { return ui::WindowText(dialog) == caption; });
}

std::atomic<int> announced{0};

void CALLBACK CountAnnouncement(HWINEVENTHOOK /*hook*/, DWORD /*event*/, HWND window, LONG object,
                                LONG /*child*/, DWORD /*thread*/, DWORD /*time*/) {
    announced += object == OBJID_CLIENT && GetDlgCtrlID(window) == IDC_SYNC_STATUS ? 1 : 0;
}

TEST_F(SyncTest, ShowsAndAnnouncesHowFarARunIs) {
    PutOnPc(L"a.qvj");
    PutOnDevice(L"b.txt");
    announced = 0;
    const HWINEVENTHOOK hook =
        SetWinEventHook(EVENT_OBJECT_NAMECHANGE, EVENT_OBJECT_NAMECHANGE, GetModuleHandleW(nullptr),
                        CountAnnouncement, GetCurrentProcessId(), 0, WINEVENT_INCONTEXT);
    const SyncRun run;
    EXPECT_EQ(run.Button(), L"Exit");
    EXPECT_EQ(run.Status(), L"");
    EXPECT_FALSE(run.IsBarVisible());
    run.Synchronize();
    EXPECT_EQ(run.Button(), L"Exit");
    EXPECT_EQ(run.BarMaximum(), 2);
    EXPECT_EQ(SendMessageW(run.Item(IDC_SYNC_PROGRESS), PBM_GETPOS, 0, 0), 2);
    EXPECT_EQ(TicksOf(LastWriteTime(OnPc(L"b.txt"))), TicksOf(noon_));
    EXPECT_EQ(announced, 2);  // That it runs and that it is complete.
    UnhookWinEvent(hook);
}

TEST_F(SyncTest, StartsAsAFileViewerOnRequest) {
    Setting(L"Start_File_View", L"1");
    const DialogThread<CWendlowDlg> run;
    ASSERT_TRUE(WaitUntil([&] { return Shown(kView) != nullptr; }));
    const ULONGLONG shown = GetTickCount64();
    EXPECT_TRUE(WaitUntil([&] {
        EXPECT_FALSE(IsWindowVisible(run.Window()));
        return GetTickCount64() >= shown + 200;
    }));
    PostMessageW(Shown(kView), WM_CLOSE, 0, 0);
    EXPECT_TRUE(WaitUntil([&] {
        EXPECT_FALSE(IsWindowVisible(run.Window()));
        return run.HasEnded();
    }));
}

TEST_F(SyncTest, WorksInTheUsersLanguage) {
    qel_text::SetCatalogLanguage(MAKELANGID(LANG_GERMAN, SUBLANG_GERMAN));
    PutManyOnPc(40);
    device_.Set(L"CALL_DELAY", L"5");
    const SyncRun run;
    EXPECT_EQ(run.Button(), L"Beenden");
    run.Press(IDC_SYNC_START);
    EXPECT_EQ(run.Button(), L"Abbrechen");
    run.Press(IDC_SYNC_CANCEL_EXIT);
    EXPECT_EQ(run.Button(), L"Beenden");
    run.Press(IDC_SYNC_CANCEL_EXIT);  // The second click of a double click.
    Sleep(GetDoubleClickTime() + 100);
    EXPECT_FALSE(run.HasEnded());
    run.Press(IDC_SYNC_CANCEL_EXIT);
    EXPECT_TRUE(WaitUntil([&] { return run.HasEnded(); }));
}

TEST_F(SyncTest, CancelStopsAndTheNextPressStartsAfresh) {
    PutManyOnPc(60);
    device_.Set(L"CALL_DELAY", L"5");
    const SyncRun run;
    run.Press(IDC_SYNC_START);
    EXPECT_TRUE(WaitUntil([&] { return run.Log().size() >= 3; }));
    EXPECT_EQ(run.Status(), kRunning);
    EXPECT_TRUE(run.IsBarVisible());

    run.Press(IDC_SYNC_CANCEL_EXIT);
    EXPECT_EQ(run.Button(), L"Exit");
    EXPECT_TRUE(WaitUntil([&] { return !run.HasWorker(); }));
    const Lines copied = DeviceFiles();
    EXPECT_LT(copied.size(), 60U);
    EXPECT_EQ(run.Status(), kCancelled);
    EXPECT_TRUE(run.IsBarVisible());

    device_.Set(L"CALL_DELAY", L"");
    run.Synchronize();
    EXPECT_EQ(run.Logged(kStart), 2);
    EXPECT_EQ(DeviceFiles(), PcFiles());
}

TEST_F(SyncTest, CancelledInItsLastFileARunStaysCancelled) {
    for (const bool to_device : {true, false}) {
        const std::wstring large = to_device ? L"large.qvj" : L"large.txt";
        WriteTextFile(to_device ? OnPc(large) : OnDevice(large), std::string(4'000'000, 'l'), noon_);
        if (to_device) {
            PutOnDevice(L"later.txt");  // For the second pass.
        }
        device_.Set(L"CALL_DELAY", L"10");
        const SyncRun run;
        run.Press(IDC_SYNC_START);
        EXPECT_TRUE(WaitUntil([&] { return run.Log().size() == 2; }));
        Sleep(100);  // Into the file.
        run.Press(IDC_SYNC_CANCEL_EXIT);
        EXPECT_TRUE(WaitUntil([&] { return !run.HasWorker(); }));
        EXPECT_EQ(run.Status(), kCancelled);
        EXPECT_EQ(run.Log().size(), 2U);
        EXPECT_EQ(PcFiles(), to_device ? Lines{large} : Lines{});
        DeleteFileW(OnPc(large).c_str());
        DeleteFileW(OnDevice(L"later.txt").c_str());
    }
}

TEST_F(SyncTest, DoesOneThingAtATime) {
    Setting(L"Overwrite_warn", L"1");
    PutOnPc(L"a.qvj", 60);
    PutOnDevice(L"a.qvj");
    HWND question = nullptr;
    const SyncRun run;
    run.Press(IDC_SYNC_START);
    // It holds the worker up.
    ASSERT_TRUE(WaitUntil([&] { return (question = Shown(L"Synchronization - Warning")) != nullptr; }));
    EXPECT_EQ(
        ItemText(question, 0xFFFF),
        L"The file:\n\\Jobs\\a.qvj [Device] \n\nWill be replaced by the file:\n" + OnPc(L"a.qvj") + L" [PC]");
    EXPECT_EQ(GetWindow(question, GW_OWNER), nullptr);
    for (const int first : {IDC_SYNC_START, IDC_SYNC_CANCEL_EXIT}) {
        run.Press(first);
        const ULONGLONG pressed = GetTickCount64();
        run.Press(IDC_SYNC_START);
        run.Press(IDC_SYNC_FILE_VIEW);
        EXPECT_LT(GetTickCount64() - pressed, 500U);
        EXPECT_EQ(run.Log(), Lines{kStart});
    }
    // Nor is the worker waited for when the user leaves.
    const ULONGLONG left = GetTickCount64();
    run.PressAndGoOn(IDCANCEL);
    EXPECT_TRUE(WaitUntil([&] { return run.HasEnded(); }));
    EXPECT_LT(GetTickCount64() - left, 1500U);
    PostMessageW(question, WM_COMMAND, IDCANCEL, 0);
}

// The window lives while the device is read, drops what is pressed, and can be closed.
TEST_F(SyncTest, LivesWhileTheJobFoldersAreRead) {
    for (const bool escape : {true, false}) {
        PutOnDevice(L"sub\\a.qvj");
        const SyncRun run;
        device_.Set(L"CALL_DELAY", L"1000");
        run.PressAndGoOn(IDC_SYNC_START);
        EXPECT_TRUE(WaitUntil([&] { return run.Status() == kRunning; }));
        run.PressAndGoOn(IDC_SYNC_SETTINGS);
        run.Press(IDC_SYNC_START);
        InvalidateRect(run.Window(), nullptr, TRUE);
        Sleep(200);
        EXPECT_FALSE(GetUpdateRect(run.Window(), nullptr, FALSE));
        DWORD_PTR answer = 0;
        EXPECT_TRUE(SendMessageTimeoutW(run.Window(), WM_NULL, 0, 0, SMTO_NORMAL, 100, &answer));
        EXPECT_EQ(Shown(kOptions), nullptr);
        escape ? PostMessageW(run.Item(IDC_SYNC_LOG), WM_KEYDOWN, VK_ESCAPE, 0)
               : PostMessageW(run.Window(), WM_SYSCOMMAND, SC_CLOSE, 0);
        const ULONGLONG closed = GetTickCount64();
        EXPECT_TRUE(WaitUntil([&] { return run.HasEnded(); }));
        EXPECT_LT(GetTickCount64() - closed, 3000U);  // The call under way, the next one, and a second.
        EXPECT_FALSE(Exists(OnPc(L"sub")));
        device_.Set(L"CALL_DELAY", L"");
    }
}

TEST_F(SyncTest, ARunThatIsOutOfMemoryIsOver) {
    PutManyOnPc(40);
    device_.Set(L"CALL_DELAY", L"5");
    const SyncRun run;
    run.Press(IDC_SYNC_START);
    EXPECT_TRUE(WaitUntil([&] { return run.Log().size() >= 3; }));
    feeding_thread = GetCurrentThreadId();
    fed_thread = GetWindowThreadProcessId(run.Window(), nullptr);
    EXPECT_TRUE(WaitUntil([&] { return run.Status() == kCancelled; }));
    fed_thread = 0;
    EXPECT_EQ(run.Button(), L"Exit");
    run.Synchronize();
    EXPECT_EQ(DeviceFiles(), PcFiles());
}

TEST_F(SyncTest, SettingsOfTheFileViewHoldHereToo) {
    PutOnPc(L"a.qvj");
    PutOnPc(L"b.tn3");
    const SyncRun run;
    run.PressAndGoOn(IDC_SYNC_FILE_VIEW);
    ASSERT_TRUE(WaitUntil([&] {  // Until it has listed what to copy.
        return SendDlgItemMessageW(Shown(kView), IDC_TRANSFER_PC_LIST, LVM_GETITEMCOUNT, 0, 0) == 2 &&
               IsWindowEnabled(GetDlgItem(Shown(kView), IDC_TRANSFER_SYNCHRONIZE));
    }));
    PostMessageW(Shown(kView), WM_COMMAND, IDC_TRANSFER_SETTINGS, 0);
    ASSERT_TRUE(WaitUntil([&] { return Shown(kOptions) != nullptr; }));
    SendDlgItemMessageW(Shown(kOptions), IDC_OPTIONS_QVJ, BM_SETCHECK, BST_UNCHECKED, 0);
    PostMessageW(Shown(kOptions), WM_COMMAND, IDOK, 0);
    ASSERT_TRUE(WaitUntil([&] { return Shown(kOptions) == nullptr; }));
    PostMessageW(Shown(kView), WM_CLOSE, 0, 0);
    ASSERT_TRUE(WaitUntil([&] { return Shown(kView) == nullptr; }));
    run.Synchronize();
    EXPECT_EQ(DeviceFiles(), Lines{L"b.tn3"});
}

TEST_F(SyncTest, AsksForTheDeviceFolderAgain) {
    device_.Set(L"CONNECT_RESULT", L"0x80004005");
    const SyncRun run;
    EXPECT_EQ(run.Status(), L"No mobile device with a job folder was found.");
    PutOnPc(L"a.qvj");
    const MessageBoxAnswerer boxes;
    run.Press(IDC_SYNC_START);
    EXPECT_EQ(boxes.Seen().size(), 1U);
    EXPECT_EQ(run.Status(), L"");
    // The device comes, with its job folder as stored, which is not all of it.
    device_.Clear(L"CONNECT_RESULT");
    WriteTextFile(device_.PcPath(L"\\other.txt"), "beside the job folder");
    run.Synchronize();
    EXPECT_EQ(DeviceFiles(), Lines{L"a.qvj"});
    EXPECT_EQ(PcFiles(), Lines{L"a.qvj"});
}

TEST_F(SyncTest, TwentyRunsLeaveNoHandlesBehind) {
    PutManyOnPc(1);
    PutOnDevice(L"a.txt");
    const SyncRun run;
    run.Synchronize();
    DWORD before = 0;
    DWORD after = 0;
    GetProcessHandleCount(GetCurrentProcess(), &before);
    for (int i = 0; i < 20; ++i) {
        DeleteFileW(OnDevice(L"new_0.qvj").c_str());
        DeleteFileW(OnPc(L"a.txt").c_str());
        run.Synchronize();
        EXPECT_TRUE(Exists(OnDevice(L"new_0.qvj")) && Exists(OnPc(L"a.txt"))) << i;
    }
    GetProcessHandleCount(GetCurrentProcess(), &after);
    EXPECT_LE(after, before + 2);
}

TEST_F(SyncTest, AsksAboutClocksThatDiffer) {
    device_.Set(L"CLOCK_OFFSET", L"180");
    const MessageBoxAnswerer answers({IDCANCEL, IDOK});
    {
        const SyncRun refused;
        EXPECT_TRUE(WaitUntil([&] { return refused.HasEnded(); }));
    }
    const SyncRun accepted;
    ASSERT_EQ(answers.Seen().size(), 2U);
    EXPECT_EQ(answers.Seen()[0].caption, L"Syncronization");
    EXPECT_FALSE(accepted.HasEnded());
    accepted.Synchronize();
}

}  // namespace

}  // namespace orvane::testing
