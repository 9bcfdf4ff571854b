#include "transfer/candidates.h"

#include <gtest/gtest.h>

#include "tests/support/temp_folder.h"

namespace orvane::testing {

namespace {

JobTable TableOf(const std::wstring& name, const FILETIME& time) {
    FileNode root;
    root.children = std::make_unique<FileNode[]>(1);
    root.child_count = 1;
    name.copy(root.children[0].name, kPathBufferChars - 1);
    root.children[0].last_write_time = time;
    return JobTable(root);
}

}  // namespace

TEST(CandidatesTest, TypesAreThoseOfTheirOwnSetting) {
    FileTypes types;
    types.img = types.qvj = true;
    EXPECT_TRUE(IsListedType(L"a.IMG", types));
    EXPECT_TRUE(IsListedType(L"sub\\a.qvj", types));
    EXPECT_FALSE(IsListedType(L"a.bmp", types)) << "its setting is off";
    EXPECT_FALSE(IsListedType(L"a.doc", types));
    EXPECT_FALSE(IsListedType(L".qvj", types)) << "a name of four characters";
}

TEST(CandidatesTest, ListsMissingAndNewerFiles) {
    const FILETIME noon = UtcTime(2024, 3, 1, 12);
    struct Case {
        const char* what;
        const wchar_t* target;
        int source_seconds;  // Later than the target.
        bool overwrite;
        bool listed;
    };
    for (const Case& test :
         {Case{"missing", L"other.qvj", 0, false, true}, Case{"equal", L"JOB.qvj", 0, true, false},
          Case{"9 s", L"JOB.qvj", 9, true, false}, Case{"10 s", L"JOB.qvj", 10, true, true},
          Case{"10 s, kept", L"JOB.qvj", 10, false, false}, Case{"older", L"JOB.qvj", -60, true, false}}) {
        Comparison comparison{};
        comparison.types.qvj = true;
        comparison.overwrite_old_files = test.overwrite;
        comparison.pc = TableOf(L"job.QVJ", AddSeconds(noon, test.source_seconds));
        comparison.device = TableOf(test.target, noon);
        std::vector<sFileDate> found(3);
        EXPECT_TRUE(BuildCandidates(comparison, comparison.pc, comparison.device, found));
        ASSERT_EQ(found.size(), test.listed ? 1U : 0U) << test.what;
        if (test.listed) {
            EXPECT_EQ(found[0].first_text, L"job.QVJ");
            EXPECT_FALSE(found[0].ticked);
        }
        comparison.stopped = true;
        EXPECT_FALSE(BuildCandidates(comparison, comparison.pc, comparison.device, found));
    }
}

TEST(CandidatesTest, TakesOutOneEntryForEachName) {
    std::vector<sFileDate> entries = {{L"a", {}}, {L"B", {}}, {L"b", {}}, {L"c", {}}};
    RemoveCandidates(entries, {L"b", L"C", L"x"});
    ASSERT_EQ(entries.size(), 2U);
    EXPECT_EQ(entries[0].first_text, L"a");
    EXPECT_EQ(entries[1].first_text, L"b");
}

TEST(CandidatesTest, NoPcFolderIsNotTheRootOfTheDrive) {
    EXPECT_EQ(ListPcJobFolder(L"").rows, 0);
}

}  // namespace orvane::testing
