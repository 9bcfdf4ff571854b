// What can be reached, found and changed, by its path and by a handle, and the room that it takes.
#include "tests/folder_device/fixture.h"
#include "tests/support/dialog_script.h"

namespace orvane::testing {
namespace {

using DevicePath = FolderDeviceTest;
using DeviceFile = FolderDeviceTest;

TEST_F(DevicePath, RefusedOnesTouchNothing) {
    const std::wstring outside = device_.Root() + L"_outside.txt";
    const std::pair<std::wstring, DWORD> cases[] = {
        {L"C:\\a.txt", ERROR_INVALID_NAME},
        {L"\\\\server\\share\\a.txt", ERROR_INVALID_NAME},
        {L"\\..\\" + outside.substr(outside.rfind(L'\\') + 1), ERROR_INVALID_NAME},
        {L"\\f\\.. \\a.txt", ERROR_INVALID_NAME},
        {L"\\a.txt\\", ERROR_INVALID_NAME},
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
    const std::size_t name = path.rfind(L'\\');
    if (path.find(L'~', name) == std::wstring::npos) {
        GTEST_SKIP() << "no short names to be had here";
    }
    const std::wstring folder(path, path.rfind(L'\\', name - 1), name - path.rfind(L'\\', name - 1));
    for (const std::wstring& alias :
         {folder + L"\\a long file name.qvj", L"\\a long folder name" + path.substr(name)}) {
        EXPECT_EQ(ErrorOf(Open(alias, GENERIC_WRITE, CREATE_ALWAYS)), DWORD{ERROR_INVALID_NAME}) << alias;
        EXPECT_EQ(Names(alias), std::nullopt) << alias;
    }
    EXPECT_EQ(ReadTextFile(file), "kept");
}

TEST_F(DevicePath, LinksLeadNowhere) {
    const TempFolder elsewhere;
    WriteTextFile(elsewhere / L"a.txt", "kept");
    const std::wstring link = device_.PcPath(L"\\link");  // Made by a process that is not waited for.
    if (!MakeLink(link, elsewhere.Path()) || !WaitUntil([&] { return Exists(link); })) {
        GTEST_SKIP() << "no link to be had here";
    }
    EXPECT_EQ(Names(L"\\*"), StringList{});
    EXPECT_EQ(ErrorOf(Open(L"\\link\\a.txt", GENERIC_WRITE, CREATE_ALWAYS)), DWORD{ERROR_ACCESS_DENIED});
    EXPECT_EQ(ReadTextFile(elsewhere / L"a.txt"), "kept");
}

TEST_F(DevicePath, PatternsAreOfNamesAsTheyStand) {
    for (const wchar_t* name : {L"a.qvj", L"B.QVJ", L"a.qvj.001", L"long name.qvjx", L"noext", L"sub\\c"}) {
        WriteTextFile(device_.PcPath(L"\\Jobs\\") + name, "");
    }
    for (const wchar_t* name : {L"dot.", L"blank ", L"con.txt"}) {  // No device can hold these.
        CloseHandle(CreateFileW((L"\\\\?\\" + device_.PcPath(L"\\Jobs\\") + name).c_str(), GENERIC_WRITE, 0,
                                nullptr, CREATE_NEW, 0, nullptr));
    }
    const std::pair<const wchar_t*, std::optional<StringList>> cases[] = {
        {L"\\Jobs\\*", StringList{L"B.QVJ", L"a.qvj", L"a.qvj.001", L"long name.qvjx", L"noext", L"sub"}},
        {L"\\Jobs", StringList{L"Jobs"}},
        {L"\\Jobs\\", std::nullopt},
        {L"\\J*\\a.qvj", std::nullopt},
    };
    for (const auto& [pattern, names] : cases) {
        EXPECT_EQ(Names(pattern), names) << pattern;
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
    EXPECT_EQ(CeRapiFreeBuffer(found), S_OK);
    EXPECT_EQ(CeRapiFreeBuffer(found), E_INVALIDARG) << "listings are freed once only";
}

TEST_F(DeviceFile, WhatIsThereIsNotLostByACall) {
    for (const auto& [name, content] :
         {std::pair{L"\\a.txt", "a"}, {L"\\b.txt", "b"}, {L"\\full\\c.txt", "c"}, {L"\\locked.txt", "l"}}) {
        WriteTextFile(device_.PcPath(name), content);
    }
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
        {"write what is open to read", ErrorOf(Write(open, "x")), ERROR_ACCESS_DENIED},
    };
    for (const auto& [call, error, expected] : calls) {
        EXPECT_EQ(error, expected) << call;
    }
    EXPECT_EQ(ListTree(device_.Root()), before);
    for (const auto& [name, content] :
         {std::pair{L"\\a.txt", "a"}, {L"\\b.txt", "b"}, {L"\\locked.txt", "l"}}) {
        EXPECT_EQ(ReadTextFile(device_.PcPath(name)), content);
    }
}

TEST_F(DeviceFile, TimesAreTheDevicesUntilTheyAreSet) {
    const FILETIME old = UtcTime(2001, 1, 1);
    WriteTextFile(device_.PcPath(L"\\a.txt"), "old", old);
    device_.Set(L"CLOCK_OFFSET", L"-90000");
    Reconnect();
    const HANDLE file = Open(L"\\a.txt", GENERIC_READ | GENERIC_WRITE, CREATE_ALWAYS);
    FILETIME now;
    GetSystemTimeAsFileTime(&now);
    for (int writes = 0; writes < 2; ++writes) {
        FILETIME creation{};
        FILETIME last_write{};
        EXPECT_TRUE(CeGetFileTime(file, &creation, nullptr, &last_write));
        for (const FILETIME& time : {creation, last_write}) {
            EXPECT_NEAR((static_cast<double>(TicksOf(time)) - static_cast<double>(TicksOf(now))) / 1e7,
                        -90000, 5);
        }
        ASSERT_TRUE(Write(file, "a"));
    }
    // A time that is set is a time, whatever the clock shows; later writes change nothing.
    EXPECT_TRUE(CeSetFileTime(file, nullptr, nullptr, &old));
    EXPECT_TRUE(Write(file, "b"));
    EXPECT_TRUE(CeCloseHandle(file));
    EXPECT_EQ(TicksOf(LastWriteTime(device_.PcPath(L"\\a.txt"))), TicksOf(old));
}

TEST_F(DeviceFile, AFullStorageRefusesAndHasRoomAgain) {
    WriteTextFile(device_.PcPath(L"\\Jobs\\old.bin"), std::string(60, 'o'));
    device_.Set(L"CAPACITY", L"100");
    Reconnect();
    const auto room = [this] {
        ULARGE_INTEGER left{};
        EXPECT_TRUE(CeGetDiskFreeSpaceEx(L"\\Jobs", &left, nullptr, nullptr));
        return left.QuadPart;
    };
    const HANDLE file = Open(L"\\new.bin", GENERIC_WRITE, CREATE_NEW);
    EXPECT_TRUE(Write(file, std::string(30, 'n')));
    EXPECT_EQ(ErrorOf(Write(file, "12345678901")), DWORD{ERROR_DISK_FULL});
    EXPECT_EQ(room(), 10U);
    EXPECT_TRUE(CeCloseHandle(file));
    EXPECT_EQ(ErrorOf(CeCopyFile(L"\\new.bin", L"\\copy.bin", TRUE)), DWORD{ERROR_DISK_FULL});
    EXPECT_TRUE(CeDeleteFile(L"\\Jobs\\old.bin"));
    EXPECT_EQ(room(), 70U);
    EXPECT_TRUE(CeCopyFile(L"\\new.bin", L"\\copy.bin", TRUE));
    EXPECT_TRUE(CeCloseHandle(Open(L"\\copy.bin", GENERIC_WRITE, CREATE_ALWAYS)));
    EXPECT_EQ(room(), 70U);
    // What was put there past the device counts from the next session on.
    WriteTextFile(device_.PcPath(L"\\Jobs\\past.bin"), std::string(150, 'p'));
    Reconnect();
    EXPECT_EQ(room(), 0U);
}

}  // namespace
}  // namespace orvane::testing
