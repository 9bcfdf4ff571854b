#include "copy/companion.h"

#include <gtest/gtest.h>

#include <thread>

#include "copy/entry_copy.h"
#include "platform/handles.h"
#include "tests/copy/copy_fixture.h"
#include "tests/support/dialog_script.h"

namespace orvane {
namespace {

using testing::CopyTest;
using testing::Exists;
using testing::ListTree;
using testing::ReadTextFile;
using testing::WriteTextFile;
using Names = std::vector<std::wstring>;

using enum DeviceResult;

// A job file "job.wkf" and its companion "job", in both directions.
class CompanionTest : public CopyTest, public ::testing::WithParamInterface<Direction> {
  protected:
    void SetUp() override { PutSource(L"job.wkf", "job", noon_); }

    std::wstring Source(const std::wstring& name) const { return to_device_ ? OnPc(name) : OnDevice(name); }
    std::wstring Target(const std::wstring& name) const { return to_device_ ? OnDevice(name) : OnPc(name); }
    void PutSource(const std::wstring& name, std::string_view content, const FILETIME& time) const {
        WriteTextFile(Source(name), content, time);
    }
    void PutTarget(const std::wstring& name, std::string_view content, const FILETIME& time) const {
        WriteTextFile(Target(name), content, time);
    }
    // Copies the job file over one of that time, or to where none is.
    DeviceResult Run(OldFile old_file = OldFile::kReplaced, std::optional<FILETIME> target_time = {}) {
        const CopyContext context = {GetParam(), Purpose::kPass, Session::kOwn, old_file, cancel_};
        const DeviceResult result =
            CopyEntry({Paths(L"job.wkf"), noon_, 3, target_time}, L"\\job.wkf", context, rules_).result;
        ExpectBalancedSessions();
        ExpectNothingAside(Target(L""));
        return result;
    }
    std::size_t FilesOpenedOnDevice() const { return device_->CallsOf(L"CeCreateFile"); }

    const bool to_device_ = GetParam() == Direction::kPcToDevice;
    const FILETIME noon_ = testing::UtcTime(2024, 3, 1, 12);
    const FILETIME later_ = testing::AddSeconds(noon_, 60);
    CompanionRules rules_ = {.overwrite_old_files = true, .own_rows = {}};
};
INSTANTIATE_TEST_SUITE_P(BothWays, CompanionTest,
                         ::testing::Values(Direction::kPcToDevice, Direction::kDeviceToPc));

TEST_P(CompanionTest, GoesWholeAndKeepsItsTimes) {
    PutSource(L"job\\a.dat", "first", noon_);
    PutSource(L"job\\b\\c.dat", Content(9000), later_);
    PutSource(L"job\\d\\e\\f.dat", "", noon_);
    testing::MakeFolder(Source(L"job\\g"));
    EXPECT_EQ(Run(), kDone);
    Names expected = {L"a.dat", L"b\\", L"b\\c.dat", L"d\\", L"d\\e\\", L"d\\e\\f.dat"};
    if (to_device_) {
        expected.push_back(L"g\\");  // Only the device is given empty folders.
    }
    EXPECT_EQ(ListTree(Target(L"job")), expected);
    EXPECT_EQ(ReadTextFile(Target(L"job.wkf")), "job");
    EXPECT_EQ(testing::TicksOf(testing::LastWriteTime(Target(L"job\\b\\c.dat"))), testing::TicksOf(later_));
    // A second time nothing is left to do but for the job file itself.
    const std::size_t opened = FilesOpenedOnDevice();
    EXPECT_EQ(Run(OldFile::kReplaced, noon_), kDone);
    EXPECT_EQ(FilesOpenedOnDevice(), opened + 1);
}

TEST_P(CompanionTest, ReplacesOlderFilesOnlyAndKeepsThemIfAsked) {
    for (const bool overwrite : {false, true}) {
        rules_.overwrite_old_files = overwrite;
        for (const OldFile old_file : {OldFile::kReplaced, OldFile::kKept}) {
            Clear();
            SetUp();
            PutSource(L"job\\newer_here.dat", "newer", later_);
            PutTarget(L"job\\NEWER_HERE.dat", "older", noon_);
            PutSource(L"job\\newer_there.dat", "older", noon_);
            PutTarget(L"job\\newer_there.dat", "newer", later_);
            EXPECT_EQ(Run(old_file), kDone);
            EXPECT_EQ(ReadTextFile(Target(L"job\\newer_there.dat")), "newer");
            EXPECT_EQ(ReadTextFile(Target(L"job\\newer_here.dat")), overwrite ? "newer" : "older");
            const bool kept = overwrite && old_file == OldFile::kKept;
            EXPECT_EQ(ListTree(Target(L"job")).size(), kept ? 3U : 2U);
            EXPECT_EQ(Exists(Target(L"job\\newer_here.dat.001")), kept);
            EXPECT_TRUE(Exists(Target(L"job.wkf")));
        }
    }
}

TEST_P(CompanionTest, ThatIsNotWholeHoldsUpItsJobFile) {
    for (const wchar_t* name : {L"a.dat", L"b.dat", L"sub\\c.dat"}) {
        PutSource(std::wstring(L"job\\") + name, name == std::wstring(L"b.dat") ? "bb" : "other", noon_);
    }
    const std::wstring aside = to_device_ ? L".orvane-part" : L"";
    device_->Set(L"REFUSE", L"CeCreateFile@\\job\\b.dat" + aside + L"=5");
    EXPECT_EQ(Run(), kFailed);
    EXPECT_FALSE(Exists(Target(L"job.wkf")));
    EXPECT_EQ(ListTree(Target(L"job")), (Names{L"a.dat", L"sub\\", L"sub\\c.dat"}));
    device_->Set(L"REFUSE", L"");
    EXPECT_EQ(Run(), kDone);
    EXPECT_EQ(ReadTextFile(Target(L"job\\b.dat")), "bb");
    EXPECT_TRUE(Exists(Target(L"job.wkf")));
}

TEST_P(CompanionTest, OfAJobFileThatCannotBeReadStaysWhereItIs) {
    PutSource(L"job\\a.dat", "first", noon_);
    const UniqueFile lock(
        CreateFileW(Source(L"job.wkf").c_str(), GENERIC_READ, 0, nullptr, OPEN_EXISTING, 0, nullptr));
    EXPECT_EQ(Run(), kFailed);
    EXPECT_FALSE(Exists(Target(L"job")));
}

TEST_P(CompanionTest, LeavesOutWhatIsNotItsOwnOrCanNeverBeCopied) {
    rules_.own_rows.set(RowOfType(L".jpg"));
    PutSource(L"job\\a.dat", "first", noon_);
    PutSource(L"job\\photo.JPG", "has a row of its own", noon_);
    PutSource(L"job\\a.dat.orvane-part", "half of", noon_);
    PutSource(L"job\\clash", "file", noon_);
    PutTarget(L"job\\clash\\file.dat", "folder", noon_);
    PutSource(L"job\\clash 2\\file.dat", "folder", noon_);
    PutTarget(L"job\\clash 2", "file", noon_);
    // Neither side can hold it below the other's longer folder; to the PC, names that mean something else.
    if (!to_device_) {
        device_->Set(L"EXTRA_ENTRIES", L"\\job|nul.txt;\\job|dot.;\\job|" + std::wstring(240, L'n'));
    }
    EXPECT_EQ(Run(), kDone);
    EXPECT_EQ(ListTree(Target(L"job")), (Names{L"a.dat", L"clash 2", L"clash\\", L"clash\\file.dat"}));
    EXPECT_EQ(ReadTextFile(Target(L"job.wkf")), "job");
}

TEST_P(CompanionTest, CancelledItHoldsUpItsJobFile) {
    for (int i = 0; i < 20; ++i) {
        PutSource(L"job\\" + std::to_wstring(i), "content", noon_);
    }
    device_->Set(L"CALL_DELAY", L"5");
    std::jthread canceller([&] {
        testing::WaitUntil([&] { return ListTree(Target(L"job")).size() > 2; });
        cancel_.Signal();
    });
    EXPECT_NE(Run(), kDone);
    EXPECT_LT(ListTree(Target(L"job")).size(), 20U);
    EXPECT_FALSE(Exists(Target(L"job.wkf")));
}

}  // namespace
}  // namespace orvane
