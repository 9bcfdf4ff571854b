#include "tests/folder_device/fixture.h"

namespace orvane::testing {
namespace {

using Find = FolderDeviceTest;

TEST_F(Find, PatternsAreOfNamesAsTheyStand) {
    for (const wchar_t* name : {L"a.qvj", L"B.QVJ", L"a.qvj.001", L"long name.qvjx", L"noext"}) {
        WriteTextFile(device_.PcPath(L"\\Jobs\\") + name, "");
    }
    MakeFolder(device_.PcPath(L"\\Jobs\\sub"));
    const struct {
        const wchar_t* pattern;
        StringList names;
        DWORD error;
    } cases[] = {
        {L"\\Jobs\\*", {L"B.QVJ", L"a.qvj", L"a.qvj.001", L"long name.qvjx", L"noext", L"sub"}, 0},
        {L"\\Jobs\\*.qvj", {L"B.QVJ", L"a.qvj"}, 0},
        {L"\\JOBS\\?.q*", {L"B.QVJ", L"a.qvj", L"a.qvj.001"}, 0},
        {L"\\Jobs\\*a*e*x", {L"long name.qvjx"}, 0},
        {L"\\Jobs", {L"Jobs"}, 0},
        {L"\\Jobs\\sub\\*", {}, 0},
        {L"\\Jobs\\", {}, ERROR_FILE_NOT_FOUND},
        {L"\\None\\*", {}, ERROR_PATH_NOT_FOUND},
        {L"\\J*\\a.qvj", {}, ERROR_INVALID_NAME},
        {L"\\Jobs\\..\\*", {}, ERROR_INVALID_NAME},
    };
    for (const auto& [pattern, names, error] : cases) {
        SCOPED_TRACE(::testing::PrintToString(pattern));
        EXPECT_EQ(Names(pattern), error != 0 ? std::nullopt : std::optional(names));
        EXPECT_TRUE(error == 0 || CeGetLastError() == error);
        rapi::FindData data;
        const HANDLE search = CeFindFirstFile(pattern, &data);
        EXPECT_EQ(search != INVALID_HANDLE_VALUE, !names.empty());
        for (std::size_t left = names.size(); left > 0; --left) {
            EXPECT_EQ(std::count(names.begin(), names.end(), data.name), 1);
            EXPECT_EQ(ErrorOf(CeFindNextFile(search, &data)), left > 1 ? 0U : ERROR_NO_MORE_FILES);
        }
    }
}

TEST_F(Find, OnlyTheFieldsAskedForAreFilled) {
    const FILETIME written = UtcTime(2018, 3, 4, 5, 6, 8);
    WriteTextFile(device_.PcPath(L"\\a.txt"), "123", written);
    for (const DWORD flags : {DWORD{0xFF}, DWORD{rapi::kFindSizeLow}}) {
        DWORD count = 0;
        rapi::FindData* found = nullptr;
        ASSERT_TRUE(CeFindAllFiles(L"\\a.txt", flags, &count, &found));
        ASSERT_EQ(count, 1U);
        const bool all = flags == 0xFF;
        EXPECT_EQ(found->size_low, 3U);
        EXPECT_EQ(TicksOf(found->last_write_time), all ? TicksOf(written) : 0);
        EXPECT_EQ(found->attributes != 0, all);
        EXPECT_EQ(found->object_id != 0, all);
        EXPECT_STREQ(found->name, all ? L"a.txt" : L"");
        EXPECT_EQ(CeRapiFreeBuffer(found), S_OK);
    }
}

TEST_F(Find, ListingsCanBeMadeHostile) {
    WriteTextFile(device_.PcPath(L"\\Jobs\\real.qvj"), "");
    device_.Set(L"EXTRA_ENTRIES",
                L"\\Jobs|..\\evil.qvj; \\jobs|;\\Jobs|..|folder;\\Jobs|full.|unterminated,size=5000000000"
                L";\\|top.qvj");
    Reconnect();
    DWORD count = 0;
    rapi::FindData* found = nullptr;
    ASSERT_TRUE(CeFindAllFiles(L"\\Jobs\\*", 0xBF, &count, &found));
    ASSERT_EQ(count, 5U);
    EXPECT_STREQ(found[0].name, L"real.qvj");
    EXPECT_STREQ(found[1].name, L"..\\evil.qvj");
    EXPECT_STREQ(found[2].name, L"");
    EXPECT_STREQ(found[3].name, L"..");
    EXPECT_EQ(found[3].attributes, DWORD{FILE_ATTRIBUTE_DIRECTORY});
    EXPECT_EQ(std::wstring_view(found[4].name, MAX_PATH).find(L'\0'), std::wstring_view::npos);
    EXPECT_EQ(std::wstring_view(found[4].name, 7), L"full.fu");
    EXPECT_EQ(found[4].size_high, 1U);
    EXPECT_EQ(found[4].size_low, 705032704U);
    EXPECT_EQ(CeRapiFreeBuffer(found), S_OK);
    EXPECT_EQ(Names(L"\\*.qvj"), StringList{L"top.qvj"});
}

}  // namespace
}  // namespace orvane::testing
