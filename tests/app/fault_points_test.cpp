// Whole synchronizations, without the dialog, that go wrong at every single call to the device.
#include <process.h>

#include <array>
#include <cstdio>

#include "app/sync_pass.h"
#include "app/sync_task.h"
#include "device/device_tree_reader.h"
#include "platform/handles.h"
#include "tests/support/job_folders.h"

namespace orvane::testing {

namespace {

constexpr const wchar_t* kPcVariable = L"ORVANE_TEST_PC";
constexpr const wchar_t* kBackupsVariable = L"ORVANE_TEST_BACKUPS";

// Whether both passes were complete.
bool Synchronize(const std::wstring& pc_folder, bool backups) {
    DeviceTreeReader reader;
    FileNode root;
    std::optional<JobTable> pc = ListPcJobFolder(pc_folder);
    if (!pc || !reader.ReadDeviceTree(L"\\Jobs\\", {}, root, nullptr)) {
        return false;
    }
    SyncTask task;
    task.pc = {std::move(*pc), pc_folder};
    task.device = {JobTable(root), L"\\Jobs"};
    task.types.set();
    task.overwrite_old_files = true;
    task.overwrite_bkp = backups;
    bool complete = true;
    for (const LPTHREAD_START_ROUTINE pass : {SyncThreadDT2CE, SyncThreadCE2DT}) {
        pass(&task);
        task.reports.Drain(INFINITE,
                           [&](const SyncReport& last) { complete = last.end == PassEnd::kComplete; });
        if (!complete) {
            return false;
        }
    }
    return true;
}

// What the test below runs in a process of its own, which a fault ends.
TEST(Synchronization, DISABLED_InAProcessOfItsOwn) {
    wchar_t folder[MAX_PATH] = {};
    GetEnvironmentVariableW(kPcVariable, folder, MAX_PATH);
    wchar_t backups[2] = {};
    GetEnvironmentVariableW(kBackupsVariable, backups, 2);
    Synchronize(folder, backups[0] == L'1');
}

void SynchronizeInAProcess(const std::wstring& pc_folder, bool backups) {
    SetEnvironmentVariableW(kPcVariable, pc_folder.c_str());
    SetEnvironmentVariableW(kBackupsVariable, backups ? L"1" : L"0");
    wchar_t program[MAX_PATH] = {};
    GetModuleFileNameW(nullptr, program, MAX_PATH);
    const auto ended = _wspawnl(_P_WAIT, program, L"test", L"--gtest_also_run_disabled_tests",
                                L"--gtest_brief=1", L"--gtest_filter=Synchronization.DISABLED_*", nullptr);
    EXPECT_EQ(ended, 99) << "not ended by the fault";
}

struct File {
    const wchar_t* name;
    std::string pc = {};  // Empty: not there.
    std::string device = {};
    bool pc_is_newer = false;

    const std::string& Newest() const { return device.empty() || pc_is_newer ? pc : device; }
};

const std::string kLarge(20'000, 'l');

const std::array<File, 8> kFiles = {{{L"new.qvj", kLarge},
                                     {L"new.txt", "", kLarge},
                                     {L"newer_here.qvj", "newer", "older", true},
                                     {L"newer_there.qvj", "older", "newer"},
                                     {L"bridge.wkf", "bridge"},
                                     {L"bridge\\a.dat", "newer", "older", true},
                                     {L"tunnel.wkf", "", "tunnel"},
                                     {L"tunnel\\a.dat", "", "points"}}};

struct Fault {
    const wchar_t* setting;
    bool backups;
};

class FaultPoints : public JobFolders, public ::testing::WithParamInterface<Fault> {
  protected:
    void SetUpFiles() {
        for (const Lines& names : {PcFiles(), DeviceFiles()}) {
            for (const std::wstring& name : names) {
                DeleteFileW(OnPc(name).c_str());
                DeleteFileW(OnDevice(name).c_str());
            }
        }
        for (const File& file : kFiles) {
            if (!file.pc.empty()) {
                PutOnPc(file.name, file.pc_is_newer ? 60 : 0, file.pc);
            }
            if (!file.device.empty()) {
                PutOnDevice(file.name, file.pc_is_newer ? 0 : 60, file.device);
            }
        }
    }

    // The file of that path has its old content, or the newest one and the old one a backup's name; without
    // backups it may be missing where it was about to be replaced.
    void ExpectKept(const std::wstring& path, const std::string& old, const std::string& newest) const {
        const auto now = ReadTextFile(path);
        const bool has_backup = ReadTextFile(path + L".001") == old;
        EXPECT_TRUE(!now || now == old || now == newest) << "part of a file has the name";
        EXPECT_TRUE(old.empty() || now == old || has_backup || (!GetParam().backups && old != newest))
            << "lost";
    }

    const std::wstring setting_ = GetParam().setting;
};

TEST_P(FaultPoints, CostNoFile) {
    SetUpFiles();
    device_.StartTrace();
    ASSERT_TRUE(Synchronize(pc_.Path(), GetParam().backups));
    std::size_t calls = 0;
    for (const TraceLine& line : device_.Trace()) {
        const std::wstring& name = line.function;
        calls += name.starts_with(L"CeRapi") || name == L"CeGetLastError" ? 0 : 1;
    }
    device_.Set(L"TRACE", L"");
    for (std::size_t call = 1; call <= calls; ++call) {
        SCOPED_TRACE(call);
        SetUpFiles();
        device_.Set(setting_, std::to_wstring(call));
        if (setting_ == L"END_PROCESS") {
            SynchronizeInAProcess(pc_.Path(), GetParam().backups);
        } else {
            Synchronize(pc_.Path(), GetParam().backups);
        }
        device_.Set(setting_, L"");
        for (const File& file : kFiles) {
            SCOPED_TRACE(::testing::PrintToString(file.name));
            ExpectKept(OnPc(file.name), file.pc, file.Newest());
            ExpectKept(OnDevice(file.name), file.device, file.Newest());
        }

        EXPECT_TRUE(Synchronize(pc_.Path(), GetParam().backups));
        for (const File& file : kFiles) {
            EXPECT_TRUE(ReadTextFile(OnPc(file.name)) == file.Newest())
                << ::testing::PrintToString(file.name);
            EXPECT_TRUE(ReadTextFile(OnDevice(file.name)) == file.Newest())
                << ::testing::PrintToString(file.name);
        }
        for (const Lines& names : {PcFiles(), DeviceFiles()}) {
            for (const std::wstring& name : names) {
                EXPECT_FALSE(name.ends_with(L".orvane-part"));
            }
        }
    }
    std::printf("%zu points\n", calls);
}

// What lies in a folder that cannot be read is neither missing nor older, and a link that leads back is no
// second copy of the job folder.
TEST_F(JobFolders, PcFoldersThatCannotBeReadArePassedOver) {
    for (const wchar_t* name : {L"locked\\a.qvj", L"locked\\deep\\b.qvj", L"z.qvj"}) {
        PutOnPc(name, 0, "on the PC");
        PutOnDevice(name, 60, "newer on the device");
    }
    PutOnDevice(L"locked\\new.qvj");
    PutOnPc(L"sub\\c.qvj", 0, "on the PC");
    const bool has_link = MakeLink(OnPc(L"sub\\back"), pc_.Path());
    const UniqueFile lock(CreateFileW(OnPc(L"locked").c_str(), FILE_LIST_DIRECTORY, 0, nullptr, OPEN_EXISTING,
                                      FILE_FLAG_BACKUP_SEMANTICS, nullptr));
    EXPECT_TRUE(Synchronize(pc_.Path(), /*backups=*/false));
    EXPECT_EQ(ReadTextFile(OnPc(L"locked\\a.qvj")), "on the PC");
    EXPECT_EQ(ReadTextFile(OnPc(L"locked\\deep\\b.qvj")), "on the PC");
    EXPECT_FALSE(Exists(OnPc(L"locked\\new.qvj")));
    EXPECT_EQ(ReadTextFile(OnPc(L"z.qvj")), "newer on the device");
    EXPECT_EQ(ReadTextFile(OnDevice(L"sub\\c.qvj")), "on the PC");
    EXPECT_FALSE(Exists(OnDevice(L"sub\\back")));
    EXPECT_TRUE(has_link) << "no links to be had here";
    DeleteFileW(OnPc(L"sub\\back").c_str());
    RemoveDirectoryW(OnPc(L"sub\\back").c_str());
    // The job folder itself.
    const UniqueFile root(CreateFileW(pc_.Path().c_str(), FILE_LIST_DIRECTORY, 0, nullptr, OPEN_EXISTING,
                                      FILE_FLAG_BACKUP_SEMANTICS, nullptr));
    EXPECT_FALSE(ListPcJobFolder(pc_.Path()));
    EXPECT_TRUE(ListPcJobFolder(OnPc(L"missing")));
}

INSTANTIATE_TEST_SUITE_P(Synchronization, FaultPoints,
                         ::testing::Values(Fault{L"FAIL_CALL", true}, Fault{L"FAIL_CALL", false},
                                           Fault{L"LOSE_CALL", true}, Fault{L"LOSE_CALL", false},
                                           Fault{L"VANISH", true}, Fault{L"VANISH", false},
                                           Fault{L"END_PROCESS", true}, Fault{L"END_PROCESS", false}));

}  // namespace

}  // namespace orvane::testing
