#include "device/file_copy.h"

#include <gtest/gtest.h>

#include <iterator>
#include <thread>

#include "device/device_path.h"
#include "tests/device_copy/copy_fixture.h"

namespace orvane {
namespace {

using testing::CopyTest;

constexpr auto kDone = DeviceResult::kDone;
constexpr auto kFailed = DeviceResult::kFailed;
constexpr auto kCancelled = DeviceResult::kCancelled;
constexpr auto kDiskFull = DeviceResult::kDiskFull;

const FILETIME kStamp = testing::UtcTime(2011, 5, 6, 7, 8, 10);
const FILETIME kSourceTime = testing::UtcTime(2010, 1, 2, 3, 4, 6);

// Every copy there is, on the PC file and the device file of one name.
struct Copy {
    const char* name;
    bool to_device;
    bool nested;
    bool backup;
    bool tells_full_disk;
    const FILETIME* stamped;  // Null: no time is stamped.
    DeviceResult (*run)(const std::wstring& pc, const std::wstring& device, HANDLE cancel);
};
const Copy kCopies[] = {
    {"plain to device", true, false, false, false, nullptr,
     [](auto& pc, auto& device, HANDLE cancel) { return CopyPcFileToDevice(pc, device, cancel); }},
    {"to device", true, false, false, true, &kStamp,
     [](auto& pc, auto& device, HANDLE cancel) {
         return CopyPcFileToDeviceWithBackup(kStamp, pc, device, cancel, false);
     }},
    {"to device with backup", true, false, true, true, &kStamp,
     [](auto& pc, auto& device, HANDLE cancel) {
         return CopyPcFileToDeviceWithBackup(kStamp, pc, device, cancel, true);
     }},
    {"manual to device", true, true, true, true, &kSourceTime,
     [](auto& pc, auto& device, HANDLE cancel) { return TransferPcFileToDevice(pc, device, cancel); }},
    {"plain to PC", false, false, false, false, nullptr,
     [](auto& pc, auto& device, HANDLE cancel) { return CopyDeviceFileToPc(device, pc, cancel, false); }},
    {"plain to PC, nested", false, true, false, false, nullptr,
     [](auto& pc, auto& device, HANDLE cancel) { return CopyDeviceFileToPc(device, pc, cancel, true); }},
    {"to PC with backup", false, false, true, true, &kStamp,
     [](auto& pc, auto& device, HANDLE cancel) {
         return CopyDeviceFileToPcWithBackup(kStamp, device, pc, cancel, false, true);
     }},
    {"manual to PC", false, true, true, true, &kSourceTime,
     [](auto& pc, auto& device, HANDLE cancel) { return TransferDeviceFileToPc(device, pc, cancel); }},
};
constexpr std::size_t kCopyCount = std::size(kCopies);

class FileCopyTest : public CopyTest {
  protected:
    // Runs the copy of `file`, within a session of the test's own if it needs one.
    DeviceResult Run(const Copy& copy, const std::wstring& file = L"job.qvj") {
        const UniqueEvent never = NewManualResetEvent();
        const DeviceSession session(never.Get(), /*nested=*/!copy.nested);
        return copy.run(OnPc(file), L"\\" + file, cancel_.Get());
    }
    std::wstring Source(const Copy& copy) const {
        return copy.to_device ? OnPc(L"job.qvj") : OnDevice(L"job.qvj");
    }
    std::wstring Target(const Copy& copy) const {
        return copy.to_device ? OnDevice(L"job.qvj") : OnPc(L"job.qvj");
    }

    // A source of three chunks and an old target that has one backup.
    void SetUpOldTarget(const Copy& copy) {
        Clear();
        testing::WriteTextFile(Source(copy), source_, kSourceTime);
        testing::WriteTextFile(Target(copy), "old");
        testing::WriteTextFile(Target(copy) + L".001", "older");
    }
    // What a copy may leave, whatever went wrong: the whole source or nothing new, and no backup is lost.
    void ExpectNothingLost(const Copy& copy, DeviceResult result) {
        const auto target = testing::ReadTextFile(Target(copy));
        // The manual copy to the device counts a target that it cannot create as copied.
        if (result == kDone && !(copy.to_device && copy.nested)) {
            EXPECT_TRUE(target == source_);
        } else {
            EXPECT_TRUE(!target || target == "old" || target == source_) << "partial target";
            EXPECT_FALSE(result != kDone && target == source_);
        }
        if (copy.backup) {
            EXPECT_TRUE(target == "old" || testing::ReadTextFile(Target(copy) + L".002") == "old");
        }
        EXPECT_EQ(testing::ReadTextFile(Target(copy) + L".001"), "older");
    }

    const std::string source_ = Content(20000);
};

TEST_F(FileCopyTest, CopiesContentAndStampsTimes) {
    for (const Copy& copy : kCopies) {
        for (const std::size_t size : {0u, 1u, 8191u, 8192u, 8193u, 1u << 20}) {
            SCOPED_TRACE(::testing::Message() << copy.name << ", " << size << " bytes");
            Clear();
            testing::WriteTextFile(Source(copy), Content(size), kSourceTime);
            EXPECT_EQ(Run(copy), kDone);
            EXPECT_TRUE(testing::ReadTextFile(Target(copy)) == Content(size));
            const FILETIME written = testing::LastWriteTime(Target(copy));
            if (copy.stamped != nullptr) {
                EXPECT_EQ(testing::TicksOf(written), testing::TicksOf(*copy.stamped));
            } else {
                EXPECT_GT(testing::TicksOf(written), testing::TicksOf(testing::UtcTime(2020, 1, 1)));
            }
            ExpectBalancedSessions();
        }
    }
}

TEST_F(FileCopyTest, BackupTakesTheFirstFreeNumber) {
    for (const Copy& copy : kCopies) {
        SCOPED_TRACE(copy.name);
        SetUpOldTarget(copy);
        testing::WriteTextFile(Target(copy) + L".003", "oldest");
        EXPECT_EQ(Run(copy), kDone);
        EXPECT_EQ(testing::Exists(Target(copy) + L".002"), copy.backup);
        ExpectNothingLost(copy, kDone);
        EXPECT_EQ(testing::ReadTextFile(Target(copy) + L".003"), "oldest");
    }
}

TEST_F(FileCopyTest, BackupNumbersEndOnTheDeviceOnly) {
    for (const Copy* copy : {&kCopies[2], &kCopies[6]}) {
        SCOPED_TRACE(copy->name);
        SetUpOldTarget(*copy);
        for (int number = 2; number <= 999; ++number) {
            const std::wstring digits = std::to_wstring(1000 + number).substr(1);
            testing::WriteTextFile(Target(*copy) + L"." + digits, "");
        }
        EXPECT_EQ(Run(*copy), copy->to_device ? kFailed : kDone);
        EXPECT_EQ(testing::ReadTextFile(Target(*copy) + (copy->to_device ? L"" : L".1000")), "old");
    }
}

TEST_F(FileCopyTest, BackupWithoutRoomForItsNameIsNotBegun) {
    const std::wstring name(256, L'n');
    testing::WriteTextFile(OnPc(L"source"), "new");
    testing::WriteTextFile(OnDevice(name.substr(1)), "old");
    EXPECT_TRUE(DevicePathFits(name.size()));
    EXPECT_FALSE(DevicePathFits(name.size(), true));
    const std::wstring device = L"\\" + name.substr(1);
    EXPECT_EQ(CopyPcFileToDeviceWithBackup(kStamp, OnPc(L"source"), device, cancel_.Get(), true), kFailed);
    EXPECT_EQ(testing::ReadTextFile(OnDevice(name.substr(1))), "old");
    EXPECT_EQ(CopyPcFileToDeviceWithBackup(kStamp, OnPc(L"source"), device, cancel_.Get(), false), kDone);
    ExpectBalancedSessions();
}

TEST_F(FileCopyTest, LockedOldPcFileIsLeftAlone) {
    for (const Copy& copy : kCopies) {
        if (copy.to_device) {
            continue;
        }
        SCOPED_TRACE(copy.name);
        SetUpOldTarget(copy);
        {
            const UniqueFile lock(CreateFileW(Target(copy).c_str(), GENERIC_READ, FILE_SHARE_READ, nullptr,
                                              OPEN_EXISTING, FILE_ATTRIBUTE_NORMAL, nullptr));
            EXPECT_EQ(Run(copy), kFailed);
        }
        EXPECT_EQ(testing::ReadTextFile(Target(copy)), "old");
        ExpectBalancedSessions();
    }
}

TEST_F(FileCopyTest, SourceThatCannotBeOpenedLeavesTheTargetAlone) {
    for (const Copy& copy : kCopies) {
        for (const bool locked : {false, true}) {
            SCOPED_TRACE(::testing::Message() << copy.name << (locked ? ", locked" : ", missing"));
            SetUpOldTarget(copy);
            const UniqueFile lock(CreateFileW(Source(copy).c_str(), GENERIC_READ | DELETE, 0, nullptr,
                                              OPEN_EXISTING, locked ? 0 : FILE_FLAG_DELETE_ON_CLOSE,
                                              nullptr));
            EXPECT_EQ(Run(copy), copy.to_device && copy.nested ? kDone : kFailed);
            EXPECT_EQ(testing::ReadTextFile(Target(copy)), "old");
            EXPECT_FALSE(testing::Exists(Target(copy) + L".002"));
            ExpectBalancedSessions();
        }
    }
}

// Each call that a copy makes, refused once. `expected` is in the order of kCopies; 1 where the call is not
// the copy's own.
TEST_F(FileCopyTest, SurvivesEveryRefusedCall) {
    struct Case {
        const wchar_t* refuse;
        int expected[kCopyCount];
    };
    const Case kCases[] = {
        {L"CeRapiInitEx#1=0x80004005", {-1, -1, -1, 1, -1, 1, -1, 1}},
        {L"CeRapiInitEx#2=0x80004005", {0, 0, -1, 1, 0, 1, 0, 1}},
        {L"CeFindFirstFile#1=5", {0, 0, -1, 0, 0, 0, 0, 0}},
        {L"CeFindFirstFile#2=5", {0, 0, -1, -1, 0, 0, 0, 0}},
        {L"CeFindClose#1=5", {0, 0, 0, 0, 0, 0, 0, 0}},
        {L"CeMoveFile#1=5", {0, 0, -1, -1, 0, 0, 0, 0}},
        {L"CeCreateFile#1=5", {-1, -1, -1, 0, -1, -1, -1, -1}},
        {L"CeGetFileTime#1=5", {0, 0, 0, 0, 0, 0, 0, 0}},
        {L"CeReadFile#1=5", {0, 0, 0, 0, -1, -1, -1, -1}},
        {L"CeReadFile#3=5", {0, 0, 0, 0, -1, -1, -1, -1}},
        {L"CeWriteFile#1=5", {-1, -1, -1, -1, 0, 0, 0, 0}},
        {L"CeWriteFile#3=5", {-1, -1, -1, -1, 0, 0, 0, 0}},
        {L"CeWriteFile#3=112", {-1, -999, -999, -999, 0, 0, 0, 0}},
        {L"CeSetFileTime#1=5", {0, 0, 0, 0, 0, 0, 0, 0}},
        {L"CeCloseHandle#1=5", {-1, -1, -1, -1, 0, 0, 0, 0}},
    };
    for (const Case& refused : kCases) {
        for (std::size_t i = 0; i < kCopyCount; ++i) {
            const Copy& copy = kCopies[i];
            if (refused.expected[i] > 0) {
                continue;
            }
            SCOPED_TRACE(::testing::Message() << copy.name << " without " << refused.refuse);
            SetUpOldTarget(copy);
            device_->Set(L"REFUSE", refused.refuse);
            const DeviceResult result = Run(copy);
            EXPECT_EQ(static_cast<int>(result), refused.expected[i]);
            ExpectNothingLost(copy, result);
            ExpectBalancedSessions(/*after_full_disk=*/result == kDiskFull && !copy.nested);
        }
    }
}

TEST_F(FileCopyTest, VanishedDeviceEndsTheCopy) {
    for (const Copy& copy : kCopies) {
        SCOPED_TRACE(copy.name);
        Clear();
        testing::WriteTextFile(Source(copy), Content(1 << 20), kSourceTime);
        device_->Set(L"VANISH", L"20");
        EXPECT_EQ(Run(copy), kFailed);
        EXPECT_TRUE(copy.to_device || !testing::Exists(Target(copy)));
        ExpectBalancedSessions();
    }
}

TEST_F(FileCopyTest, FullDeviceDiskIsTold) {
    for (const Copy& copy : kCopies) {
        if (!copy.to_device) {
            continue;
        }
        SCOPED_TRACE(copy.name);
        SetUpOldTarget(copy);
        device_->Set(L"CAPACITY", L"18000");
        const DeviceResult expected = copy.tells_full_disk ? kDiskFull : kFailed;
        EXPECT_EQ(Run(copy), expected);
        ExpectNothingLost(copy, expected);
        EXPECT_FALSE(testing::Exists(Target(copy)));
        ExpectBalancedSessions(/*after_full_disk=*/expected == kDiskFull && !copy.nested);
    }
}

// A file of the test system on which every write finds the disk full; it cannot be deleted.
TEST_F(FileCopyTest, FullPcDiskIsTold) {
    const std::wstring full = L"Z:\\dev\\full";
    if (!UniqueFile(CreateFileW(full.c_str(), GENERIC_WRITE, 0, nullptr, OPEN_EXISTING, 0, nullptr))) {
        GTEST_SKIP() << "no file on a full disk here";
    }
    testing::WriteTextFile(OnDevice(L"job.qvj"), source_);
    EXPECT_EQ(CopyDeviceFileToPcWithBackup(kStamp, L"\\job.qvj", full, cancel_.Get(), false, false),
              kDiskFull);
    EXPECT_EQ(CopyDeviceFileToPc(L"\\job.qvj", full, cancel_.Get(), false), kFailed);
    ExpectBalancedSessions();
}

TEST_F(FileCopyTest, CancelledAtTheStart) {
    SetEvent(cancel_.Get());
    for (const Copy& copy : kCopies) {
        SCOPED_TRACE(copy.name);
        SetUpOldTarget(copy);
        const DeviceResult expected = copy.nested ? kCancelled : kFailed;
        EXPECT_EQ(Run(copy), expected);
        ExpectNothingLost(copy, expected);
        EXPECT_TRUE(copy.backup || testing::ReadTextFile(Target(copy)) == "old");
        ExpectBalancedSessions();
    }
}

TEST_F(FileCopyTest, CancelledInTheMiddle) {
    for (const Copy& copy : kCopies) {
        SCOPED_TRACE(copy.name);
        SetUpOldTarget(copy);
        testing::WriteTextFile(Source(copy), Content(1 << 20));
        device_->Set(L"CALL_DELAY", L"10");
        ResetEvent(cancel_.Get());
        std::jthread canceller([this, target = Target(copy)] {
            for (WIN32_FILE_ATTRIBUTE_DATA data = {}; data.nFileSizeLow < 3 * 8192; Sleep(1)) {
                GetFileAttributesExW(target.c_str(), GetFileExInfoStandard, &data);
            }
            SetEvent(cancel_.Get());
        });
        EXPECT_EQ(Run(copy), kCancelled);
        ExpectNothingLost(copy, kCancelled);
        EXPECT_FALSE(testing::Exists(Target(copy)));
        ExpectBalancedSessions();
    }
}

TEST_F(FileCopyTest, DeletesAfterCloseAlsoInACallersSession) {
    const HANDLE file = OpenDeviceFile(L"\\made", GENERIC_WRITE, 0, CREATE_NEW, cancel_.Get(), false);
    ASSERT_NE(file, INVALID_HANDLE_VALUE);
    EXPECT_EQ(OpenDeviceFile(L"\\none", GENERIC_READ, 0, OPEN_EXISTING, cancel_.Get(), false),
              INVALID_HANDLE_VALUE);
    EXPECT_TRUE(DeleteDeviceFileAfterClose(file, L"\\made"));
    EXPECT_FALSE(testing::Exists(OnDevice(L"made")));
    ExpectBalancedSessions();
}

TEST(PathBufferDeathTest, EndsTheProcessRatherThanCut) {
    EXPECT_EQ(std::wstring(PathBuffer(std::wstring(259, L'x')).Get()).size(), 259u);
    EXPECT_DEATH(PathBuffer(std::wstring(260, L'x')), "");
}

}  // namespace
}  // namespace orvane
