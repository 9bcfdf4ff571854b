#include "tests/folder_device/fixture.h"

namespace orvane::testing {
namespace {

using DevicePath = FolderDeviceTest;

TEST_F(DevicePath, RefusedOnesTouchNothing) {
    const std::wstring outside = device_.Root() + L"_outside.txt";
    const std::wstring long_name(256, L'n');
    const struct {
        std::wstring path;
        DWORD error;
    } cases[] = {
        {L"", ERROR_INVALID_NAME},
        {L"C:\\a.txt", ERROR_INVALID_NAME},
        {L"\\f/a.txt", ERROR_INVALID_NAME},
        {L"\\\\server\\share\\a.txt", ERROR_INVALID_NAME},
        {L"\\..\\" + outside.substr(outside.rfind(L'\\') + 1), ERROR_INVALID_NAME},
        {L"\\f\\..\\a.txt", ERROR_INVALID_NAME},
        {L"\\f\\.. \\a.txt", ERROR_INVALID_NAME},
        {L"\\f\\\\a.txt", ERROR_INVALID_NAME},
        {L"\\a.txt\\", ERROR_INVALID_NAME},
        {L"\\a.txt.", ERROR_INVALID_NAME},
        {L"\\a.txt:stream", ERROR_INVALID_NAME},
        {L"\\a*.txt", ERROR_INVALID_NAME},
        {L"\\a\t.txt", ERROR_INVALID_NAME},
        {L"\\a\xD800.txt", ERROR_INVALID_NAME},
        {L"\\NUL", ERROR_INVALID_NAME},
        {L"\\f\\con.txt", ERROR_INVALID_NAME},
        {L"\\COM\u00B2.txt", ERROR_INVALID_NAME},
        {L"\\" + long_name, ERROR_FILENAME_EXCED_RANGE},
        {L"\\missing\\a.txt", ERROR_PATH_NOT_FOUND},
        {L"\\kept.txt\\a.txt", ERROR_PATH_NOT_FOUND},
    };
    ASSERT_TRUE(CeCreateDirectory(L"\\f", nullptr));
    ASSERT_TRUE(WriteNew(L"\\kept.txt", "kept"));
    WriteTextFile(outside, "outside");
    rapi::FindData data;
    for (const auto& [path, error] : cases) {
        SCOPED_TRACE(::testing::PrintToString(path));
        const wchar_t* const text = path.c_str();
        EXPECT_EQ(ErrorOf(Open(text, GENERIC_WRITE, OPEN_ALWAYS)), error);
        EXPECT_EQ(ErrorOf(CeDeleteFile(text)), error);
        EXPECT_EQ(ErrorOf(CeCreateDirectory(text, nullptr)), error);
        EXPECT_EQ(ErrorOf(CeRemoveDirectory(text)), error);
        EXPECT_EQ(ErrorOf(CeMoveFile(L"\\kept.txt", text)), error);
        EXPECT_EQ(ErrorOf(CeCopyFile(L"\\kept.txt", text, TRUE)), error);
        EXPECT_EQ(ErrorOf(CeCopyFile(text, L"\\copy.txt", TRUE)), error);
        // A pattern may hold wildcards, and one that ends in "\" finds nothing.
        if (path.find_first_of(L"*?") == std::wstring::npos && !path.ends_with(L'\\')) {
            EXPECT_EQ(ErrorOf(CeFindFirstFile(text, &data)), error);
        }
    }
    EXPECT_EQ(ListTree(device_.Root()), (StringList{L"f\\", L"kept.txt"}));
    EXPECT_EQ(ReadTextFile(outside), "outside");
    DeleteFileW(outside.c_str());
}

TEST_F(DevicePath, AShortNameReachesNothing) {
    ASSERT_TRUE(CeCreateDirectory(L"\\a long folder name", nullptr));
    ASSERT_TRUE(WriteNew(L"\\a long folder name\\a long file name.qvj", "kept"));
    const std::wstring file = device_.PcPath(L"\\a long folder name\\a long file name.qvj");
    wchar_t short_path[MAX_PATH] = L"";
    GetShortPathNameW(file.c_str(), short_path, MAX_PATH);
    const std::wstring file_alias = std::wstring(short_path).substr(std::wstring(short_path).rfind(L'\\'));
    *wcsrchr(short_path, L'\\') = L'\0';
    const std::wstring folder_alias = std::wstring(short_path).substr(std::wstring(short_path).rfind(L'\\'));
    if (file_alias.find(L'~') == std::wstring::npos) {
        GTEST_SKIP() << "no short names to be had here";
    }
    for (const std::wstring& path :
         {folder_alias + L"\\a long file name.qvj", L"\\a long folder name" + file_alias}) {
        SCOPED_TRACE(::testing::PrintToString(path));
        rapi::FindData data;
        EXPECT_EQ(ErrorOf(Open(path.c_str(), GENERIC_WRITE, CREATE_ALWAYS)), DWORD{ERROR_INVALID_NAME});
        EXPECT_EQ(ErrorOf(CeDeleteFile(path.c_str())), DWORD{ERROR_INVALID_NAME});
        EXPECT_EQ(ErrorOf(CeFindFirstFile(path.c_str(), &data)), DWORD{ERROR_INVALID_NAME});
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
    const std::wstring file = folder + L"\\" + std::wstring(129, L'f');
    ASSERT_EQ(file.size(), 259U);
    ASSERT_TRUE(CeCreateDirectory(folder.c_str(), nullptr));
    ASSERT_TRUE(WriteNew(file.c_str(), "long"));
    EXPECT_EQ(Names((folder + L"\\*").c_str()), StringList{file.substr(130)});
    EXPECT_TRUE(CeDeleteFile(file.c_str()));
}

TEST_F(DevicePath, NamesThatADeviceCannotHoldAreLeftOut) {
    const std::wstring folder = L"\\\\?\\" + device_.Root() + L"\\";
    for (const wchar_t* name : {L"good.txt", L"dot.", L"blank ", L"con.txt"}) {
        const HANDLE file =
            CreateFileW((folder + name).c_str(), GENERIC_WRITE, 0, nullptr, CREATE_NEW, 0, nullptr);
        ASSERT_NE(file, INVALID_HANDLE_VALUE) << GetLastError();
        CloseHandle(file);
    }
    EXPECT_EQ(Names(L"\\*"), StringList{L"good.txt"});
}

}  // namespace
}  // namespace orvane::testing
