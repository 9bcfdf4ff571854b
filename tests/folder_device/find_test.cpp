#include <algorithm>

#include "tests/folder_device/fixture.h"

namespace orvane::testing {
namespace {

using StringList = std::vector<std::wstring>;

class Find : public FolderDeviceTest {
  protected:
    // The names that a search gives one by one; nothing when it finds none.
    std::optional<StringList> Search(const wchar_t* pattern) {
        rapi::FindData data;
        const HANDLE search = CeFindFirstFile(pattern, &data);
        if (search == INVALID_HANDLE_VALUE) {
            return std::nullopt;
        }
        StringList names;
        do {
            names.emplace_back(data.name);
        } while (CeFindNextFile(search, &data));
        EXPECT_EQ(CeGetLastError(), DWORD{ERROR_NO_MORE_FILES});
        EXPECT_TRUE(CeFindClose(search));
        std::sort(names.begin(), names.end());
        return names;
    }
};

TEST_F(Find, PatternsAreOfNamesAsTheyStand) {
    for (const wchar_t* name : {L"a.qvj", L"B.QVJ", L"a.qvj.001", L"long name.qvjx", L"noext"}) {
        WriteTextFile(device_.PcPath(L"\\Jobs\\") + name, name == std::wstring(L"noext") ? "12345" : "");
    }
    MakeFolder(device_.PcPath(L"\\Jobs\\sub"));
    const StringList all = {L"B.QVJ", L"a.qvj", L"a.qvj.001", L"long name.qvjx", L"noext", L"sub"};
    const struct {
        const wchar_t* pattern;
        StringList names;
    } cases[] = {
        {L"\\Jobs\\*", all},
        {L"\\Jobs\\*.qvj", {L"B.QVJ", L"a.qvj"}},
        {L"\\JOBS\\?.q*", {L"B.QVJ", L"a.qvj", L"a.qvj.001"}},
        {L"\\Jobs\\*a*e*x", {L"long name.qvjx"}},
        {L"\\Jobs", {L"Jobs"}},
        {L"\\Jobs\\*.bmp", {}},
        {L"\\Jobs\\sub\\*", {}},
    };
    for (const auto& [pattern, names] : cases) {
        SCOPED_TRACE(::testing::PrintToString(pattern));
        EXPECT_EQ(Names(pattern), names);
        EXPECT_EQ(Search(pattern), names.empty() ? std::nullopt : std::optional(names));
    }
    const struct {
        const wchar_t* pattern;
        DWORD error;
    } refused[] = {
        {L"\\Jobs\\", ERROR_FILE_NOT_FOUND},  {L"\\None\\*", ERROR_PATH_NOT_FOUND},
        {L"\\J*\\a.qvj", ERROR_INVALID_NAME}, {L"\\Jobs\\..\\*", ERROR_INVALID_NAME},
        {nullptr, ERROR_INVALID_PARAMETER},
    };
    for (const auto& [pattern, error] : refused) {
        EXPECT_EQ(Search(pattern), std::nullopt);
        EXPECT_EQ(CeGetLastError(), error);
        EXPECT_EQ(Names(pattern), std::nullopt);
        EXPECT_EQ(CeGetLastError(), error);
    }
}

TEST_F(Find, OnlyTheFieldsAskedForAreFilled) {
    const FILETIME written = UtcTime(2018, 3, 4, 5, 6, 8);
    WriteTextFile(device_.PcPath(L"\\a.txt"), "123", written);
    const auto find = [&](DWORD flags) {
        DWORD count = 0;
        rapi::FindData* found = nullptr;
        EXPECT_TRUE(CeFindAllFiles(L"\\a.txt", flags, &count, &found));
        EXPECT_EQ(count, 1U);
        const rapi::FindData data = count == 1 ? *found : rapi::FindData{};
        EXPECT_EQ(CeRapiFreeBuffer(found), S_OK);
        return data;
    };
    const rapi::FindData all = find(0xFF);
    EXPECT_EQ(all.size_low, 3U);
    EXPECT_EQ(TicksOf(all.last_write_time), TicksOf(written));
    EXPECT_EQ(all.attributes & FILE_ATTRIBUTE_DIRECTORY, 0U);
    EXPECT_NE(all.attributes, 0U);
    EXPECT_NE(all.object_id, 0U);
    EXPECT_STREQ(all.name, L"a.txt");
    EXPECT_EQ(find(0xBF).object_id, 0U);
    const rapi::FindData size = find(rapi::kFindSizeLow);
    EXPECT_EQ(size.size_low, 3U);
    EXPECT_STREQ(size.name, L"");
    EXPECT_EQ(TicksOf(size.last_write_time), 0U);
}

TEST_F(Find, ListingsCanBeMadeHostile) {
    WriteTextFile(device_.PcPath(L"\\Jobs\\real.qvj"), "");
    device_.Set(
        L"EXTRA_ENTRIES",
        L"\\Jobs|..\\evil.qvj; \\jobs|;\\Jobs|..|folder;\\Jobs|CON;\\Jobs|full.|unterminated,size=5000000000"
        L";\\|top.qvj");
    Reconnect();
    DWORD count = 0;
    rapi::FindData* found = nullptr;
    ASSERT_TRUE(CeFindAllFiles(L"\\Jobs\\*", 0xBF, &count, &found));
    ASSERT_EQ(count, 6U);
    EXPECT_STREQ(found[0].name, L"real.qvj");
    EXPECT_STREQ(found[1].name, L"..\\evil.qvj");
    EXPECT_STREQ(found[2].name, L"");
    EXPECT_STREQ(found[3].name, L"..");
    EXPECT_EQ(found[3].attributes, DWORD{FILE_ATTRIBUTE_DIRECTORY});
    EXPECT_STREQ(found[4].name, L"CON");
    EXPECT_EQ(std::wstring_view(found[5].name, MAX_PATH).find(L'\0'), std::wstring_view::npos);
    EXPECT_EQ(std::wstring_view(found[5].name, 7), L"full.fu");
    EXPECT_EQ(found[5].size_high, 1U);
    EXPECT_EQ(found[5].size_low, 705032704U);
    EXPECT_EQ(CeRapiFreeBuffer(found), S_OK);
    EXPECT_EQ(Search(L"\\*.qvj"), StringList{L"top.qvj"});

    device_.Set(L"FOUND_COUNT", L"0xFFFFFFFF");
    device_.Set(L"FOUND_NULL", L"1");
    Reconnect();
    ASSERT_TRUE(CeFindAllFiles(L"\\Jobs\\*", 0xBF, &count, &found));
    EXPECT_EQ(count, MAXDWORD);
    EXPECT_EQ(found, nullptr);
}

}  // namespace
}  // namespace orvane::testing
