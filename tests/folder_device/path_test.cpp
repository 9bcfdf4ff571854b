// What can be reached, found and changed by its path.
#include "tests/folder_device/fixture.h"

namespace orvane::testing {
namespace {

using DevicePath = FolderDeviceTest;

TEST_F(DevicePath, RefusedOnesTouchNothing) {
    const std::wstring outside = device_.Root() + L"_outside.txt";
    const struct {
        std::wstring path;
        DWORD error;
    } cases[] = {
        {L"C:\\a.txt", ERROR_INVALID_NAME},
        {L"\\f/a.txt", ERROR_INVALID_NAME},
        {L"\\\\server\\share\\a.txt", ERROR_INVALID_NAME},
        {L"\\..\\" + outside.substr(outside.rfind(L'\\') + 1), ERROR_INVALID_NAME},
        {L"\\f\\.. \\a.txt", ERROR_INVALID_NAME},
        {L"\\a.txt\\", ERROR_INVALID_NAME},
        {L"\\a.txt.", ERROR_INVALID_NAME},
        {L"\\a.txt:stream", ERROR_INVALID_NAME},
        {L"\\a\t.txt", ERROR_INVALID_NAME},
        {L"\\a\xD800.txt", ERROR_INVALID_NAME},
        {L"\\f\\con.txt", ERROR_INVALID_NAME},
        {L"\\" + std::wstring(256, L'n'), ERROR_FILENAME_EXCED_RANGE},
        {L"\\missing\\a.txt", ERROR_PATH_NOT_FOUND},
        {L"\\kept.txt\\a.txt", ERROR_PATH_NOT_FOUND},
    };
    ASSERT_TRUE(CeCreateDirectory(L"\\f", nullptr));
    ASSERT_TRUE(WriteNew(L"\\kept.txt", "kept"));
    WriteTextFile(outside, "outside");
    for (const auto& [path, error] : cases) {
        SCOPED_TRACE(::testing::PrintToString(path));
        const wchar_t* const text = path.c_str();
        EXPECT_EQ(ErrorOf(Open(path, GENERIC_WRITE, OPEN_ALWAYS)), error);
        EXPECT_EQ(ErrorOf(CeDeleteFile(text)), error);
        EXPECT_EQ(ErrorOf(CeCreateDirectory(text, nullptr)), error);
        EXPECT_EQ(ErrorOf(CeMoveFile(L"\\kept.txt", text)), error);
        EXPECT_EQ(ErrorOf(CeCopyFile(L"\\kept.txt", text, TRUE)), error);
    }
    EXPECT_EQ(ListTree(device_.Root()), (StringList{L"f\\", L"kept.txt"}));
    EXPECT_EQ(ReadTextFile(outside), "outside");
    DeleteFileW(outside.c_str());
}

TEST_F(DevicePath, AShortNameReachesNothing) {
    const std::wstring file = device_.PcPath(L"\\a long folder name\\a long file name.qvj");
    WriteTextFile(file, "kept");
    wchar_t short_path[MAX_PATH] = L"";
    GetShortPathNameW(file.c_str(), short_path, MAX_PATH);
    const std::wstring path = short_path;
    const std::size_t last = path.rfind(L'\\');
    if (path.find(L'~', last) == std::wstring::npos) {
        GTEST_SKIP() << "no short names to be had here";
    }
    for (const std::wstring& alias :
         {path.substr(path.rfind(L'\\', last - 1), last - path.rfind(L'\\', last - 1)) +
              L"\\a long file name.qvj",
          L"\\a long folder name" + path.substr(last)}) {
        SCOPED_TRACE(::testing::PrintToString(alias));
        EXPECT_EQ(ErrorOf(Open(alias, GENERIC_WRITE, CREATE_ALWAYS)), DWORD{ERROR_INVALID_NAME});
        EXPECT_EQ(Names(alias), std::nullopt);
    }
    EXPECT_EQ(ReadTextFile(file), "kept");
}

TEST_F(DevicePath, TheLongestOneWorksBelowALongRoot) {
    // The PC's path is then far longer than the PC's own limit.
    std::wstring root = device_.Root();
    for (int i = 0; i < 3; ++i) {
        root += L"\\" + std::wstring(80, L'r');
        ASSERT_TRUE(CreateDirectoryW((L"\\\\?\\" + root).c_str(), nullptr));
    }
    device_.Set(L"ROOT", root);
    Reconnect();
    const std::wstring folder = L"\\" + std::wstring(128, L'd');
    const std::wstring name(129, L'f');
    ASSERT_TRUE(CeCreateDirectory(folder.c_str(), nullptr));
    ASSERT_TRUE(WriteNew(folder + L"\\" + name, "long"));
    EXPECT_EQ(Names(folder + L"\\*"), StringList{name});
    EXPECT_TRUE(CeDeleteFile((folder + L"\\" + name).c_str()));
}

TEST_F(DevicePath, LinksLeadNowhere) {
    // Wine shows the links of the system below it, which has one in its root folder.
    device_.Set(L"ROOT", L"Z:\\");
    if (!Exists(L"Z:\\bin\\true")) {
        GTEST_SKIP() << "no link to be had here";
    }
    Reconnect();
    const std::optional<StringList> names = Names(L"\\*");
    ASSERT_TRUE(names);
    EXPECT_EQ(std::count(names->begin(), names->end(), L"usr"), 1);
    EXPECT_EQ(std::count(names->begin(), names->end(), L"bin"), 0);
    EXPECT_EQ(Names(L"\\bin\\*"), std::nullopt);
    EXPECT_EQ(ErrorOf(Open(L"\\bin\\true", GENERIC_READ, OPEN_EXISTING)), DWORD{ERROR_ACCESS_DENIED});
}

TEST_F(DevicePath, PatternsAreOfNamesAsTheyStand) {
    for (const wchar_t* name : {L"a.qvj", L"B.QVJ", L"a.qvj.001", L"long name.qvjx", L"noext"}) {
        WriteTextFile(device_.PcPath(L"\\Jobs\\") + name, "");
    }
    for (const wchar_t* name : {L"dot.", L"blank ", L"con.txt"}) {  // No device can hold these.
        CloseHandle(CreateFileW((L"\\\\?\\" + device_.PcPath(L"\\Jobs\\") + name).c_str(), GENERIC_WRITE, 0,
                                nullptr, CREATE_NEW, 0, nullptr));
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

TEST_F(DevicePath, ListingsCanBeMadeHostile) {
    WriteTextFile(device_.PcPath(L"\\Jobs\\real.qvj"), "");
    device_.Set(L"EXTRA_ENTRIES",
                L"\\Jobs|..\\evil.qvj; \\jobs|;\\Jobs|..|folder;\\|top.qvj"
                L";\\Jobs|full.|unterminated,size=5000000000");
    Reconnect();
    EXPECT_EQ(Names(L"\\*.qvj"), StringList{L"top.qvj"});
    DWORD count = 0;
    rapi::FindData* found = nullptr;
    ASSERT_TRUE(CeFindAllFiles(L"\\Jobs\\*", 0xBF, &count, &found));
    ASSERT_EQ(count, 5U);
    EXPECT_STREQ(found[1].name, L"..\\evil.qvj");
    EXPECT_STREQ(found[2].name, L"");
    EXPECT_EQ(found[3].attributes, DWORD{FILE_ATTRIBUTE_DIRECTORY});
    EXPECT_EQ(std::wstring_view(found[4].name, MAX_PATH).find(L'\0'), std::wstring_view::npos);
    EXPECT_EQ(found[4].size_high, 1U);
    EXPECT_EQ(found[4].object_id, 0U) << "not asked for";
    EXPECT_EQ(CeRapiFreeBuffer(found), S_OK);
    EXPECT_EQ(CeRapiFreeBuffer(found), E_INVALIDARG) << "listings are freed once only";
}

TEST_F(DevicePath, WhatIsThereIsNotLostByACall) {
    WriteTextFile(device_.PcPath(L"\\a.txt"), "a");
    WriteTextFile(device_.PcPath(L"\\b.txt"), "b");
    WriteTextFile(device_.PcPath(L"\\full\\c.txt"), "c");
    WriteTextFile(device_.PcPath(L"\\locked.txt"), "l");
    SetFileAttributesW(device_.PcPath(L"\\locked.txt").c_str(), FILE_ATTRIBUTE_READONLY);
    const StringList before = ListTree(device_.Root());
    const HANDLE open =
        Open(L"\\full\\c.txt", GENERIC_READ, OPEN_EXISTING, FILE_SHARE_READ | FILE_SHARE_DELETE);
    const std::tuple<const char*, DWORD, DWORD> calls[] = {
        {"remove a full folder", ErrorOf(CeRemoveDirectory(L"\\full")), ERROR_DIR_NOT_EMPTY},
        {"delete a read-only file", ErrorOf(CeDeleteFile(L"\\locked.txt")), ERROR_ACCESS_DENIED},
        {"move over a file", ErrorOf(CeMoveFile(L"\\a.txt", L"\\b.txt")), ERROR_ALREADY_EXISTS},
        {"copy over, forbidden", ErrorOf(CeCopyFile(L"\\a.txt", L"\\b.txt", TRUE)), ERROR_FILE_EXISTS},
        {"copy over read-only", ErrorOf(CeCopyFile(L"\\a.txt", L"\\locked.txt", FALSE)), ERROR_ACCESS_DENIED},
        {"copy onto itself", ErrorOf(CeCopyFile(L"\\a.txt", L"\\A.TXT", FALSE)), ERROR_SHARING_VIOLATION},
        {"delete an open file", ErrorOf(CeDeleteFile(L"\\full\\c.txt")), ERROR_SHARING_VIOLATION},
        {"open as new", ErrorOf(Open(L"\\a.txt", GENERIC_WRITE, CREATE_NEW)), ERROR_FILE_EXISTS},
        {"empty a read-only one", ErrorOf(Open(L"\\locked.txt", GENERIC_READ, CREATE_ALWAYS)),
         ERROR_ACCESS_DENIED},
        {"write what is open to read", Write(open, "x") ? 0 : CeGetLastError(), ERROR_ACCESS_DENIED},
    };
    for (const auto& [call, error, expected] : calls) {
        EXPECT_EQ(error, expected) << call;
    }
    EXPECT_EQ(ListTree(device_.Root()), before);
    EXPECT_EQ(ReadTextFile(device_.PcPath(L"\\a.txt")), "a");
    EXPECT_EQ(ReadTextFile(device_.PcPath(L"\\b.txt")), "b");
    EXPECT_EQ(ReadTextFile(device_.PcPath(L"\\locked.txt")), "l");
    SetFileAttributesW(device_.PcPath(L"\\locked.txt").c_str(), FILE_ATTRIBUTE_NORMAL);
}

}  // namespace
}  // namespace orvane::testing
