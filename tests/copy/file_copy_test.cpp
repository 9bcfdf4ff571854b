#include "copy/file_copy.h"

#include <gtest/gtest.h>

#include <algorithm>
#include <iterator>
#include <thread>

#include "copy/target_path.h"
#include "platform/handles.h"
#include "tests/copy/copy_fixture.h"
#include "tests/support/dialog_script.h"

namespace orvane {
namespace {

using testing::CopyTest;
using testing::Exists;
using testing::ReadTextFile;
using testing::WriteTextFile;

using enum DeviceResult;

const FILETIME kSourceTime = testing::UtcTime(1985, 5, 6, 7, 8, 10);
const FILETIME kTargetTime = testing::UtcTime(1984, 1, 2, 3, 4, 6);

// Every kind of copy.
struct Kind {
    Direction direction;
    Purpose purpose;
    Session session;
    OldFile old_file;
};
constexpr Kind kKinds[] = {
    {Direction::kPcToDevice, Purpose::kPass, Session::kOwn, OldFile::kReplaced},
    {Direction::kPcToDevice, Purpose::kPass, Session::kOwn, OldFile::kKept},
    {Direction::kPcToDevice, Purpose::kCompanion, Session::kCallers, OldFile::kReplaced},
    {Direction::kPcToDevice, Purpose::kManualView, Session::kCallers, OldFile::kKept},
    {Direction::kDeviceToPc, Purpose::kPass, Session::kOwn, OldFile::kReplaced},
    {Direction::kDeviceToPc, Purpose::kPass, Session::kOwn, OldFile::kKept},
    {Direction::kDeviceToPc, Purpose::kCompanion, Session::kCallers, OldFile::kReplaced},
    {Direction::kDeviceToPc, Purpose::kManualView, Session::kCallers, OldFile::kKept},
};

class FileCopyTest : public CopyTest, public ::testing::WithParamInterface<std::size_t> {
  protected:
    FileCopyTest() { SetUpFiles(); }

    // A source of three chunks and, if wanted, an old target that has one backup.
    void SetUpFiles(bool old_target = true) {
        Clear();
        source_ = to_device_ ? OnPc(L"job.qvj") : OnDevice(L"job.qvj");
        target_ = to_device_ ? OnDevice(L"job.qvj") : OnPc(L"job.qvj");
        WriteTextFile(source_, content_, kSourceTime);
        if (old_target) {
            WriteTextFile(target_, "old", kTargetTime);
            WriteTextFile(target_ + L".001", "older");
        }
        file_ = {Paths(L"job.qvj"), kSourceTime, content_.size(),
                 old_target ? std::optional(kTargetTime) : std::nullopt};
    }
    // Runs the copy, within a session of the test's own if it needs one.
    DeviceResult Run() {
        const CancelEvent never;
        DeviceSession session(never, kind_.session == Session::kCallers ? Session::kOwn : Session::kCallers);
        const CopyContext context = {kind_.direction, kind_.purpose, kind_.session, kind_.old_file, cancel_};
        const DeviceResult result = (to_device_ ? CopyPcFileToDeviceWithBackup(file_, context)
                                                : CopyDeviceFileToPcWithBackup(file_, context))
                                        .result;
        session.Close();
        return result;
    }
    void ExpectWhole() const {
        EXPECT_TRUE(ReadTextFile(target_) == content_);
        EXPECT_EQ(testing::TicksOf(testing::LastWriteTime(target_)), testing::TicksOf(kSourceTime));
    }
    // What may be found, whatever went wrong: the old file or the whole new one under the name, or none; with
    // backups no content is lost, and a name is given up for a backup only.
    void ExpectNothingLost(bool old_target) const {
        const auto target = ReadTextFile(target_);
        EXPECT_TRUE(!target || target == content_ || (old_target && target == "old")) << target->size();
        if (old_target) {
            EXPECT_EQ(ReadTextFile(target_ + L".001"), "older");
            const bool kept = ReadTextFile(target_ + L".002") == "old";
            EXPECT_TRUE(target == "old" || kept || kind_.old_file == OldFile::kReplaced);
            EXPECT_TRUE(target || kept || ReadTextFile(AsidePath(target_)) == content_);
        }
        EXPECT_TRUE(ReadTextFile(source_) == content_);
    }

    const Kind& kind_ = kKinds[GetParam()];
    const bool to_device_ = kind_.direction == Direction::kPcToDevice;
    std::string content_ = Content(20000);
    std::wstring source_;
    std::wstring target_;
    FileToCopy file_;
};
INSTANTIATE_TEST_SUITE_P(All, FileCopyTest, ::testing::Range(std::size_t{0}, std::size(kKinds)));

TEST_P(FileCopyTest, CopiesContentAndTimeAndKeepsTheOldFileIfAsked) {
    for (const std::size_t size : {0u, 1u, 8191u, 8192u, 8193u, 1u << 20}) {
        for (const bool old_target : {false, true}) {
            SCOPED_TRACE(size);
            content_ = Content(size);
            SetUpFiles(old_target);
            EXPECT_EQ(Run(), kDone);
            ExpectWhole();
            ExpectNothingLost(old_target);
            EXPECT_EQ(Exists(target_ + L".002"), old_target && kind_.old_file == OldFile::kKept);
            ExpectNothingAside();
            ExpectBalancedSessions();
        }
    }
}

// At every call of a copy: it is refused, it is carried out and its answer lost, the device is gone from
// there.
TEST_P(FileCopyTest, SurvivesEveryFailingCall) {
    for (const bool old_target : {false, true}) {
        for (const wchar_t* fault : {L"REFUSE", L"LOSE_REPLY", L"VANISH"}) {
            const bool vanishes = fault == std::wstring(L"VANISH");
            bool is_hit = true;
            for (int call = 1; is_hit; ++call) {
                SCOPED_TRACE(::testing::PrintToString(fault) + std::to_string(call) +
                             (old_target ? " old" : ""));
                SetUpFiles(old_target);
                const std::wstring number = std::to_wstring(call);
                device_->Set(fault, vanishes ? number : L"*#" + number + L"=5");
                const DeviceResult result = Run();
                ExpectNothingLost(old_target);
                EXPECT_TRUE(result == kFailed || (result == kDone && ReadTextFile(target_) == content_));
                const auto calls = device_->Trace();
                is_hit = std::any_of(calls.begin(), calls.end(), [vanishes](const testing::TraceLine& line) {
                    return line.error == (vanishes ? DWORD{ERROR_DEVICE_NOT_CONNECTED} : DWORD{5});
                });
                device_->Set(fault, L"");
                // Once more, from listings of what is there now.
                const FILETIME now = testing::LastWriteTime(target_);
                file_.target_time = Exists(target_) ? std::optional(now) : std::nullopt;
                EXPECT_EQ(Run(), kDone);
                ExpectWhole();
                ExpectNothingAside();
            }
        }
    }
}

TEST_P(FileCopyTest, ReplacesNothingThatNoListingHasSeen) {
    const FILETIME other = testing::AddSeconds(kTargetTime, 2);
    file_.target_time = std::nullopt;
    EXPECT_EQ(Run(), kFailed);
    file_.target_time = other;
    EXPECT_EQ(Run(), kFailed);
    EXPECT_TRUE(ReadTextFile(target_) == "old");
    ExpectNothingLost(true);
    ExpectNothingAside();
    DeleteFileW(target_.c_str());
    EXPECT_EQ(Run(), kDone);  // There is nothing left that could be lost.
    // A folder of the name is no file that could be replaced.
    DeleteFileW(target_.c_str());
    testing::MakeFolder(target_);
    EXPECT_EQ(Run(), kFailed);
    ExpectNothingAside();
}

TEST_P(FileCopyTest, CopiesTheWholeFileOrNone) {
    const std::wstring calls = to_device_ ? L"CeWriteFile" : L"CeReadFile";
    device_->Set(L"SHORT", calls + L"#1=100;" + calls + L"#2=1;" + calls + L"#4=3000");
    EXPECT_EQ(Run(), kDone);
    ExpectWhole();
    SetUpFiles();
    device_->Set(L"SHORT", calls + L"#2=0");
    EXPECT_EQ(Run(), kFailed);
    EXPECT_TRUE(ReadTextFile(target_) == "old");
    // A source that ends before its size, and one that has grown.
    if (!to_device_) {
        device_->Set(L"SHORT", L"");
        file_.size = content_.size() + 1;
        EXPECT_EQ(Run(), kFailed);
        EXPECT_TRUE(ReadTextFile(target_) == "old");
        file_.size = 5;
        EXPECT_EQ(Run(), kDone);
        ExpectWhole();
    }
    ExpectNothingAside();
}

TEST_P(FileCopyTest, BackupTakesTheFirstFreeNumber) {
    if (kind_.old_file == OldFile::kReplaced) {
        return;
    }
    WriteTextFile(target_ + L".003", "oldest");
    EXPECT_EQ(Run(), kDone);
    EXPECT_EQ(ReadTextFile(target_ + L".002"), "old");
    // On the device the numbers end, and then the old file stays.
    SetUpFiles();
    for (int number = 2; number <= 999; ++number) {
        WriteTextFile(target_ + L"." + std::to_wstring(1000 + number).substr(1), "");
    }
    EXPECT_EQ(Run(), to_device_ ? kFailed : kDone);
    EXPECT_EQ(ReadTextFile(target_ + (to_device_ ? L"" : L".1000")), "old");
}

TEST_P(FileCopyTest, FilesInUseStayAsTheyAre) {
    enum class Used { kTarget, kAside, kSource };
    for (const Used used : {Used::kTarget, Used::kAside, Used::kSource}) {
        SCOPED_TRACE(static_cast<int>(used));
        SetUpFiles();
        const std::wstring aside = AsidePath(target_);
        WriteTextFile(aside, "of another program");
        const std::wstring& path = used == Used::kTarget ? target_ : used == Used::kAside ? aside : source_;
        const DWORD share = used == Used::kTarget ? FILE_SHARE_READ : 0;
        UniqueFile lock(CreateFileW(path.c_str(), GENERIC_READ, share, nullptr, OPEN_EXISTING, 0, nullptr));
        EXPECT_EQ(Run(), kFailed);
        EXPECT_EQ(Exists(aside), used != Used::kTarget);
        lock.Reset();
        EXPECT_TRUE(ReadTextFile(target_) == "old");
        EXPECT_FALSE(Exists(target_ + L".002"));
    }
}

TEST_P(FileCopyTest, FullDeviceDiskIsTold) {
    if (to_device_) {
        device_->Set(L"CAPACITY", L"18000");
        EXPECT_EQ(Run(), kDiskFull);
        ExpectNothingLost(true);
        EXPECT_TRUE(ReadTextFile(target_) == "old");
        ExpectNothingAside();
        ExpectBalancedSessions(/*after_full_disk=*/kind_.session == Session::kOwn);
    }
}

TEST_P(FileCopyTest, CancelledItLeavesTheOldFile) {
    enum class By { kAtStart, kProgram, kPlainEvent };
    for (const By by : {By::kAtStart, By::kProgram, By::kPlainEvent}) {
        SetUpFiles();
        content_ = Content(1 << 20);
        WriteTextFile(source_, content_);
        file_.size = content_.size();
        device_->Set(L"CALL_DELAY", by == By::kAtStart ? L"" : L"10");
        const std::wstring aside = AsidePath(target_);
        std::jthread canceller([&] {
            testing::WaitUntil([&] { return by == By::kAtStart || Exists(aside); });
            by == By::kPlainEvent ? static_cast<void>(SetEvent(cancel_.Handle())) : cancel_.Signal();
        });
        if (by == By::kAtStart) {
            canceller.join();
        }
        // Of a copy that connects itself the connection ends first.
        EXPECT_EQ(Run(), by == By::kAtStart && kind_.session == Session::kOwn ? kFailed : kCancelled);
        EXPECT_TRUE(ReadTextFile(target_) == "old");
        ExpectNothingAside();
        // At the next chunk, or so soon that some are left of 128.
        EXPECT_LT(device_->CallsOf(to_device_ ? L"CeWriteFile" : L"CeReadFile"), 100u);
        if (by != By::kAtStart) {
            canceller.join();
        }
        cancel_.Reset();
    }
}

// A file of the test system on which every write finds the disk full; it cannot be deleted.
TEST_F(CopyTest, FullPcDiskIsTold) {
    const std::wstring target = OnPc(L"job.qvj");
    if (!testing::MakeLink(AsidePath(target), L"Z:\\dev\\full")) {
        GTEST_SKIP() << "no file on a full disk here";
    }
    WriteTextFile(OnDevice(L"job.qvj"), Content(20000));
    const CopyContext context = {Direction::kDeviceToPc, Purpose::kPass, Session::kOwn, OldFile::kReplaced,
                                 cancel_};
    EXPECT_EQ(
        CopyDeviceFileToPcWithBackup({Paths(L"job.qvj"), kSourceTime, 20000, std::nullopt}, context).result,
        kDiskFull);
    EXPECT_FALSE(Exists(target));
    ExpectBalancedSessions();
}

TEST(AsidePath, FitsForEveryTargetAndDiffersForEach) {
    const std::wstring deep = L"C:\\" + std::wstring(120, L'd') + L"\\" + std::wstring(120, L'e');  // 244
    const std::pair<std::wstring, std::wstring> cases[] = {
        // A target, and what its copy begins with.
        {L"C:\\jobs\\a.qvj", L"C:\\jobs\\a.qvj.orvane-part"},
        {deep + L"\\12345.qvj", L"C:\\" + std::wstring(120, L'd') + L"\\"},
        {deep + L"\\22345.qvj", L"C:\\" + std::wstring(120, L'd') + L"\\"},
        {L"\\" + std::wstring(250, L'n'), L"\\"},
        {L"\\" + std::wstring(257, L'f') + L"\\n", L"\\"},
    };
    std::wstring last;
    for (const auto& [target, folder] : cases) {
        const std::wstring aside = AsidePath(target);
        EXPECT_TRUE(aside.starts_with(folder)) << ::testing::PrintToString(aside);
        EXPECT_LE(aside.size(), 259u);
        EXPECT_TRUE(IsAside(aside));
        EXPECT_EQ(aside.rfind(L'\\'), folder.rfind(L'\\'));
        EXPECT_NE(aside, last);
        last = aside;
    }
    EXPECT_EQ(AsidePath(deep + L"\\ABCDE.qvj"), AsidePath(deep + L"\\abcde.QVJ"));
    EXPECT_FALSE(IsAside(L"job.qvj"));
}

}  // namespace
}  // namespace orvane
