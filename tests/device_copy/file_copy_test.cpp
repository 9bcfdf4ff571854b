#include "device/file_copy.h"

#include <gtest/gtest.h>

#include <iterator>
#include <thread>

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
    const FILETIME* stamped;  // Null: no time is stamped and a full disk not told.
    DeviceResult (*run)(const std::wstring& pc, const std::wstring& device, HANDLE cancel);
};
const Copy kCopies[] = {
    {"plain to device", true, false, false, nullptr,
     [](auto& pc, auto& device, HANDLE cancel) { return CopyPcFileToDevice(pc, device, cancel); }},
    {"to device", true, false, false, &kStamp,
     [](auto& pc, auto& device, HANDLE cancel) {
         return CopyPcFileToDeviceWithBackup(kStamp, pc, device, cancel, false);
     }},
    {"to device with backup", true, false, true, &kStamp,
     [](auto& pc, auto& device, HANDLE cancel) {
         return CopyPcFileToDeviceWithBackup(kStamp, pc, device, cancel, true);
     }},
    {"manual to device", true, true, true, &kSourceTime,
     [](auto& pc, auto& device, HANDLE cancel) { return TransferPcFileToDevice(pc, device, cancel); }},
    {"plain to PC", false, false, false, nullptr,
     [](auto& pc, auto& device, HANDLE cancel) { return CopyDeviceFileToPc(device, pc, cancel, false); }},
    {"plain to PC, nested", false, true, false, nullptr,
     [](auto& pc, auto& device, HANDLE cancel) { return CopyDeviceFileToPc(device, pc, cancel, true); }},
    {"to PC with backup", false, false, true, &kStamp,
     [](auto& pc, auto& device, HANDLE cancel) {
         return CopyDeviceFileToPcWithBackup(kStamp, device, pc, cancel, false, true);
     }},
    {"manual to PC", false, true, true, &kSourceTime,
     [](auto& pc, auto& device, HANDLE cancel) { return TransferDeviceFileToPc(device, pc, cancel); }},
};
constexpr std::size_t kCopyCount = std::size(kCopies);

class FileCopyTest : public CopyTest, public ::testing::WithParamInterface<std::size_t> {
  protected:
    FileCopyTest() { SetUpOldTarget(); }

    // A source of three chunks and an old target that has one backup.
    void SetUpOldTarget() {
        Clear();
        source_ = copy_.to_device ? OnPc(L"job.qvj") : OnDevice(L"job.qvj");
        target_ = copy_.to_device ? OnDevice(L"job.qvj") : OnPc(L"job.qvj");
        testing::WriteTextFile(source_, content_, kSourceTime);
        testing::WriteTextFile(target_, "old");
        testing::WriteTextFile(target_ + L".001", "older");
    }
    // Runs the copy, within a session of the test's own if it needs one.
    DeviceResult Run() {
        const UniqueEvent never = NewManualResetEvent();
        DeviceSession session(never.Get(), /*nested=*/!copy_.nested);
        const DeviceResult result = copy_.run(OnPc(L"job.qvj"), L"\\job.qvj", cancel_.Get());
        session.Close();
        ExpectBalancedSessions(/*after_full_disk=*/result == kDiskFull && !copy_.nested);
        return result;
    }
    // What a copy may leave, whatever went wrong: the whole source or nothing new, and no backup is lost.
    void ExpectNothingLost(DeviceResult result) {
        const auto target = testing::ReadTextFile(target_);
        // The manual copy to the device counts a target that it cannot create as copied.
        if (result == kDone && !(copy_.to_device && copy_.nested)) {
            EXPECT_TRUE(target == content_);
        } else {
            EXPECT_TRUE(!target || target == "old" || target == content_) << "partial target";
            EXPECT_FALSE(result != kDone && target == content_);
        }
        if (copy_.backup) {
            EXPECT_TRUE(target == "old" || testing::ReadTextFile(target_ + L".002") == "old");
        }
        EXPECT_EQ(testing::ReadTextFile(target_ + L".001"), "older");
    }

    const Copy& copy_ = kCopies[GetParam()];
    std::string content_ = Content(20000);
    std::wstring source_;
    std::wstring target_;
};
INSTANTIATE_TEST_SUITE_P(All, FileCopyTest, ::testing::Range(std::size_t{0}, kCopyCount));

TEST_P(FileCopyTest, CopiesContentAndStampsTimes) {
    for (const std::size_t size : {0u, 1u, 8191u, 8192u, 8193u, 1u << 20}) {
        SCOPED_TRACE(size);
        content_ = Content(size);
        SetUpOldTarget();
        EXPECT_EQ(Run(), kDone);
        ExpectNothingLost(kDone);
        const FILETIME written = testing::LastWriteTime(target_);
        if (copy_.stamped != nullptr) {
            EXPECT_EQ(testing::TicksOf(written), testing::TicksOf(*copy_.stamped));
        } else {
            EXPECT_GT(testing::TicksOf(written), testing::TicksOf(testing::UtcTime(2020, 1, 1)));
        }
    }
}

TEST_P(FileCopyTest, BackupTakesTheFirstFreeNumber) {
    testing::WriteTextFile(target_ + L".003", "oldest");
    EXPECT_EQ(Run(), kDone);
    EXPECT_EQ(testing::Exists(target_ + L".002"), copy_.backup);
    ExpectNothingLost(kDone);
    EXPECT_EQ(testing::ReadTextFile(target_ + L".003"), "oldest");
}

TEST_P(FileCopyTest, BackupNumbersEndOnTheDeviceOnly) {
    if (!copy_.backup) {
        return;
    }
    for (int number = 2; number <= 999; ++number) {
        testing::WriteTextFile(target_ + L"." + std::to_wstring(1000 + number).substr(1), "");
    }
    EXPECT_EQ(Run(), copy_.to_device ? kFailed : kDone);
    EXPECT_EQ(testing::ReadTextFile(target_ + (copy_.to_device ? L"" : L".1000")), "old");
}

TEST_F(CopyTest, BackupWithoutRoomForItsNameIsNotBegun) {
    const std::wstring name(255, L'n');
    testing::WriteTextFile(OnPc(L"source"), "new");
    testing::WriteTextFile(OnDevice(name), "old");
    const auto copy = [&](bool backup) {
        return CopyPcFileToDeviceWithBackup(kStamp, OnPc(L"source"), L"\\" + name, cancel_.Get(), backup);
    };
    EXPECT_EQ(copy(true), kFailed);
    EXPECT_EQ(testing::ReadTextFile(OnDevice(name)), "old");
    EXPECT_EQ(copy(false), kDone);
}

TEST_P(FileCopyTest, LockedOldPcFileIsLeftAlone) {
    if (copy_.to_device) {
        return;
    }
    const UniqueFile lock(CreateFileW(target_.c_str(), GENERIC_READ, FILE_SHARE_READ, nullptr, OPEN_EXISTING,
                                      FILE_ATTRIBUTE_NORMAL, nullptr));
    EXPECT_EQ(Run(), kFailed);
    EXPECT_EQ(testing::ReadTextFile(target_), "old");
}

TEST_P(FileCopyTest, SourceThatCannotBeOpenedLeavesTheTargetAlone) {
    for (const DWORD locked_or_gone : {0, FILE_FLAG_DELETE_ON_CLOSE}) {
        SCOPED_TRACE(locked_or_gone);
        SetUpOldTarget();
        const UniqueFile lock(CreateFileW(source_.c_str(), GENERIC_READ | DELETE, 0, nullptr, OPEN_EXISTING,
                                          locked_or_gone, nullptr));
        EXPECT_EQ(Run(), copy_.to_device && copy_.nested ? kDone : kFailed);
        EXPECT_EQ(testing::ReadTextFile(target_), "old");
        EXPECT_FALSE(testing::Exists(target_ + L".002"));
    }
}

// Each call that a copy makes, refused once. `expected` is in the order of kCopies; 1 where the call is not
// the copy's own.
TEST_P(FileCopyTest, SurvivesEveryRefusedCall) {
    struct Case {
        const wchar_t* refuse;
        int expected[kCopyCount];
    };
    const Case kCases[] = {
        {L"CeRapiInitEx#1=0x80004005", {-1, -1, -1, 1, -1, 1, -1, 1}},
        {L"CeRapiInitEx#2=0x80004005", {0, 0, -1, 1, 0, 1, 0, 1}},
        {L"CeFindFirstFile#1=5", {0, 0, -1, 0, 0, 0, 0, 0}},
        {L"CeFindFirstFile#2=5", {0, 0, -1, -1, 0, 0, 0, 0}},
        {L"CeMoveFile#1=5", {0, 0, -1, -1, 0, 0, 0, 0}},
        {L"CeCreateFile#1=5", {-1, -1, -1, 0, -1, -1, -1, -1}},
        {L"CeReadFile#3=5", {0, 0, 0, 0, -1, -1, -1, -1}},
        {L"CeWriteFile#3=5", {-1, -1, -1, -1, 0, 0, 0, 0}},
        {L"CeWriteFile#3=112", {-1, -999, -999, -999, 0, 0, 0, 0}},
        {L"CeGetFileTime#1=5", {0, 0, 0, 0, 0, 0, 0, 0}},
        {L"CeSetFileTime#1=5", {0, 0, 0, 0, 0, 0, 0, 0}},
        {L"CeCloseHandle#1=5", {-1, -1, -1, -1, 0, 0, 0, 0}},
    };
    for (const Case& refused : kCases) {
        const int expected = refused.expected[GetParam()];
        if (expected <= 0) {
            SCOPED_TRACE(::testing::PrintToString(refused.refuse));
            SetUpOldTarget();
            device_->Set(L"REFUSE", refused.refuse);
            const DeviceResult result = Run();
            EXPECT_EQ(static_cast<int>(result), expected);
            ExpectNothingLost(result);
            // What is complete no longer has the date of what is not.
            if (result == kDone && testing::Exists(target_)) {
                EXPECT_GT(testing::TicksOf(testing::LastWriteTime(target_)),
                          testing::TicksOf(testing::UtcTime(1991, 1, 1)));
            }
        }
    }
}

TEST_P(FileCopyTest, VanishedDeviceEndsTheCopy) {
    testing::WriteTextFile(source_, Content(1 << 20));
    device_->Set(L"VANISH", L"30");
    EXPECT_EQ(Run(), kFailed);
    EXPECT_TRUE(copy_.to_device || !testing::Exists(target_));
}

TEST_P(FileCopyTest, FullDeviceDiskIsTold) {
    if (copy_.to_device) {
        device_->Set(L"CAPACITY", L"18000");
        const DeviceResult expected = copy_.stamped != nullptr ? kDiskFull : kFailed;
        EXPECT_EQ(Run(), expected);
        ExpectNothingLost(expected);
        EXPECT_FALSE(testing::Exists(target_));
    }
}

// A file of the test system on which every write finds the disk full; it cannot be deleted.
TEST_F(CopyTest, FullPcDiskIsTold) {
    const std::wstring full = L"Z:\\dev\\full";
    if (!UniqueFile(CreateFileW(full.c_str(), GENERIC_WRITE, 0, nullptr, OPEN_EXISTING, 0, nullptr))) {
        GTEST_SKIP() << "no file on a full disk here";
    }
    testing::WriteTextFile(OnDevice(L"job.qvj"), Content(20000));
    EXPECT_EQ(CopyDeviceFileToPcWithBackup(kStamp, L"\\job.qvj", full, cancel_.Get(), false, false),
              kDiskFull);
    ExpectBalancedSessions();
}

TEST_P(FileCopyTest, CancelledAtTheStart) {
    SetEvent(cancel_.Get());
    const DeviceResult expected = copy_.nested ? kCancelled : kFailed;
    EXPECT_EQ(Run(), expected);
    ExpectNothingLost(expected);
    EXPECT_TRUE(copy_.backup || testing::ReadTextFile(target_) == "old");
}

TEST_P(FileCopyTest, CancelledInTheMiddle) {
    testing::WriteTextFile(source_, Content(1 << 20));
    device_->Set(L"CALL_DELAY", L"10");
    std::jthread canceller([this] {
        for (WIN32_FILE_ATTRIBUTE_DATA data = {}; data.nFileSizeLow < 3 * 8192; Sleep(1)) {
            GetFileAttributesExW(target_.c_str(), GetFileExInfoStandard, &data);
        }
        SetEvent(cancel_.Get());
    });
    EXPECT_EQ(Run(), kCancelled);
    ExpectNothingLost(kCancelled);
    EXPECT_FALSE(testing::Exists(target_));
}

}  // namespace
}  // namespace orvane
