#include "tests/folder_device/fixture.h"

namespace orvane::testing {
namespace {

using Folder = FolderDeviceTest;

TEST_F(Folder, CallsByNameFailAsADeviceDoes) {
    WriteTextFile(device_.PcPath(L"\\a.txt"), "a");
    WriteTextFile(device_.PcPath(L"\\b.txt"), "b");
    WriteTextFile(device_.PcPath(L"\\full\\c.txt"), "c");
    WriteTextFile(device_.PcPath(L"\\locked.txt"), "l");
    MakeFolder(device_.PcPath(L"\\empty"));
    SetFileAttributesW(device_.PcPath(L"\\locked.txt").c_str(), FILE_ATTRIBUTE_READONLY);
    const StringList before = ListTree(device_.Root());
    constexpr DWORD kRead = GENERIC_READ;
    const HANDLE open = Open(L"\\full\\c.txt", kRead, OPEN_EXISTING, FILE_SHARE_READ | FILE_SHARE_DELETE);
    const struct {
        const char* call;
        DWORD error;
        DWORD expected;
    } calls[] = {
        {"create folder again", ErrorOf(CeCreateDirectory(L"\\empty", nullptr)), ERROR_ALREADY_EXISTS},
        {"create two levels", ErrorOf(CeCreateDirectory(L"\\x\\y", nullptr)), ERROR_PATH_NOT_FOUND},
        {"remove the root", ErrorOf(CeRemoveDirectory(L"\\")), ERROR_ACCESS_DENIED},
        {"remove a full folder", ErrorOf(CeRemoveDirectory(L"\\full")), ERROR_DIR_NOT_EMPTY},
        {"remove a file as folder", ErrorOf(CeRemoveDirectory(L"\\a.txt")), ERROR_DIRECTORY},
        {"delete a folder", ErrorOf(CeDeleteFile(L"\\empty")), ERROR_ACCESS_DENIED},
        {"delete a read-only file", ErrorOf(CeDeleteFile(L"\\locked.txt")), ERROR_ACCESS_DENIED},
        {"move over a file", ErrorOf(CeMoveFile(L"\\a.txt", L"\\b.txt")), ERROR_ALREADY_EXISTS},
        {"copy a folder", ErrorOf(CeCopyFile(L"\\full", L"\\c", FALSE)), ERROR_ACCESS_DENIED},
        {"copy over, forbidden", ErrorOf(CeCopyFile(L"\\a.txt", L"\\b.txt", TRUE)), ERROR_FILE_EXISTS},
        {"copy over read-only", ErrorOf(CeCopyFile(L"\\a.txt", L"\\locked.txt", FALSE)), ERROR_ACCESS_DENIED},
        {"copy onto itself", ErrorOf(CeCopyFile(L"\\a.txt", L"\\A.TXT", FALSE)), ERROR_SHARING_VIOLATION},
        {"delete an open file", ErrorOf(CeDeleteFile(L"\\full\\c.txt")), ERROR_SHARING_VIOLATION},
        {"move an open file", ErrorOf(CeMoveFile(L"\\full\\c.txt", L"\\d")), ERROR_SHARING_VIOLATION},
        {"open an open one alone", ErrorOf(Open(L"\\full\\c.txt", kRead, OPEN_EXISTING)),
         ERROR_SHARING_VIOLATION},
        {"open what is not there", ErrorOf(Open(L"\\none", kRead, OPEN_EXISTING)), ERROR_FILE_NOT_FOUND},
        {"open a folder", ErrorOf(Open(L"\\empty", kRead, OPEN_EXISTING)), ERROR_ACCESS_DENIED},
        {"open as new", ErrorOf(Open(L"\\a.txt", GENERIC_WRITE, CREATE_NEW)), ERROR_FILE_EXISTS},
        {"empty a read-only one", ErrorOf(Open(L"\\locked.txt", kRead, CREATE_ALWAYS)), ERROR_ACCESS_DENIED},
        {"open with other rights", ErrorOf(Open(L"\\a.txt", kRead | FILE_APPEND_DATA, OPEN_EXISTING)),
         ERROR_INVALID_PARAMETER},
        {"write what is open to read", Write(open, "x") ? 0 : CeGetLastError(), ERROR_ACCESS_DENIED},
    };
    for (const auto& [call, error, expected] : calls) {
        EXPECT_EQ(error, expected) << call;
    }
    EXPECT_FALSE(CeMoveFile(L"\\full", L"\\full\\inner"));
    EXPECT_EQ(ListTree(device_.Root()), before);
    EXPECT_EQ(ReadTextFile(device_.PcPath(L"\\a.txt")), "a");
    EXPECT_EQ(ReadTextFile(device_.PcPath(L"\\b.txt")), "b");
    EXPECT_EQ(ReadTextFile(device_.PcPath(L"\\locked.txt")), "l");
    SetFileAttributesW(device_.PcPath(L"\\locked.txt").c_str(), FILE_ATTRIBUTE_NORMAL);
}

TEST_F(Folder, IsFilledRearrangedAndEmptied) {
    const FILETIME written = UtcTime(2017, 1, 2, 3, 4, 6);
    ASSERT_TRUE(CeCreateDirectory(L"\\a", nullptr));
    WriteTextFile(device_.PcPath(L"\\a\\1.txt"), "one", written);
    EXPECT_TRUE(CeCopyFile(L"\\a\\1.txt", L"\\a\\2.txt", TRUE));
    EXPECT_TRUE(CeMoveFile(L"\\a\\1.txt", L"\\3.txt"));
    EXPECT_TRUE(CeMoveFile(L"\\a", L"\\b"));
    EXPECT_EQ(ListTree(device_.Root()), (StringList{L"3.txt", L"b\\", L"b\\2.txt"}));
    EXPECT_EQ(ReadTextFile(device_.PcPath(L"\\b\\2.txt")), "one");
    EXPECT_EQ(TicksOf(LastWriteTime(device_.PcPath(L"\\b\\2.txt"))), TicksOf(written));
    EXPECT_TRUE(CeCopyFile(L"\\b\\2.txt", L"\\3.txt", FALSE));
    EXPECT_TRUE(CeDeleteFile(L"\\b\\2.txt"));
    EXPECT_TRUE(CeRemoveDirectory(L"\\b"));
    EXPECT_EQ(ListTree(device_.Root()), StringList{L"3.txt"});
}

// Runs a program of the system below Wine in the folder. Such a process gives no handle to wait for: within
// two seconds the link is there, or gone, or never will be.
void RunUnix(const std::wstring& folder, std::wstring command, const std::wstring& link, bool there) {
    STARTUPINFOW start{};
    start.cb = sizeof(start);
    PROCESS_INFORMATION process{};
    const std::wstring program = L"Z:\\bin\\" + command.substr(0, command.find(L' '));
    CreateProcessW(program.c_str(), command.data(), nullptr, nullptr, FALSE, 0, nullptr, folder.c_str(),
                   &start, &process);
    for (int i = 0; i < 200 && Exists(link) != there; ++i) {
        Sleep(10);
    }
}

TEST_F(Folder, LinksLeadNowhere) {
    const TempFolder outside;
    WriteTextFile(outside / L"secret.txt", "secret");
    const std::wstring link = device_.PcPath(L"\\link");
    // Wine has no links of its own but shows those of the system below it.
    const bool wine = GetProcAddress(GetModuleHandleW(L"kernel32.dll"), "wine_get_unix_file_name") != nullptr;
    if (wine) {
        const std::wstring target = L"../" + outside.Path().substr(outside.Path().rfind(L'\\') + 1);
        RunUnix(device_.Root(), L"ln -s " + target + L" link", link, true);
    } else {
        // A folder, and without administrator's rights where that is allowed.
        CreateSymbolicLinkW(link.c_str(), outside.Path().c_str(), 0x1 | 0x2);
    }
    if (!Exists(link)) {
        GTEST_SKIP() << "no links to be had here";
    }
    rapi::FindData data;
    EXPECT_EQ(Names(L"\\*"), StringList{});
    EXPECT_EQ(ErrorOf(Open(L"\\link\\secret.txt", GENERIC_READ, OPEN_EXISTING)), DWORD{ERROR_ACCESS_DENIED});
    EXPECT_EQ(ErrorOf(CeDeleteFile(L"\\link\\secret.txt")), DWORD{ERROR_ACCESS_DENIED});
    EXPECT_EQ(ErrorOf(CeFindFirstFile(L"\\link\\*", &data)), DWORD{ERROR_ACCESS_DENIED});
    EXPECT_EQ(ErrorOf(CeCreateDirectory(L"\\link\\made", nullptr)), DWORD{ERROR_ACCESS_DENIED});
    EXPECT_EQ(ListTree(outside.Path()), StringList{L"secret.txt"});
    if (wine) {
        RunUnix(device_.Root(), L"rm link", link, false);  // Wine would remove what the link leads to.
    } else {
        RemoveDirectoryW(link.c_str());
    }
}

TEST_F(Folder, AFullStorageRefusesAndHasRoomAgain) {
    WriteTextFile(device_.PcPath(L"\\Jobs\\old.bin"), std::string(60, 'o'));
    device_.Set(L"CAPACITY", L"100");
    Reconnect();
    const auto room = [this] {
        ULARGE_INTEGER left{};
        EXPECT_TRUE(CeGetDiskFreeSpaceEx(L"\\Jobs", &left, nullptr, nullptr));
        return left.QuadPart;
    };
    EXPECT_EQ(room(), 40U);
    const HANDLE file = Open(L"\\new.bin", GENERIC_WRITE, CREATE_NEW);
    EXPECT_TRUE(Write(file, std::string(30, 'n')));
    DWORD written = 99;
    EXPECT_FALSE(CeWriteFile(file, "12345678901", 11, &written, nullptr));
    EXPECT_EQ(CeGetLastError(), DWORD{ERROR_DISK_FULL});
    EXPECT_EQ(written, 0U);
    EXPECT_EQ(room(), 10U);
    // Writing over what is there takes no room; a gap does.
    CeSetFilePointer(file, 0, nullptr, FILE_BEGIN);
    EXPECT_TRUE(Write(file, std::string(40, 'm')));
    EXPECT_EQ(room(), 0U);
    CeSetFilePointer(file, 500, nullptr, FILE_BEGIN);
    EXPECT_FALSE(Write(file, "x"));
    EXPECT_TRUE(CeCloseHandle(file));
    EXPECT_EQ(ErrorOf(CeCopyFile(L"\\new.bin", L"\\copy.bin", TRUE)), DWORD{ERROR_DISK_FULL});
    EXPECT_FALSE(Exists(device_.PcPath(L"\\copy.bin")));

    EXPECT_TRUE(CeDeleteFile(L"\\Jobs\\old.bin"));
    EXPECT_EQ(room(), 60U);
    EXPECT_TRUE(CeCopyFile(L"\\new.bin", L"\\copy.bin", TRUE));
    EXPECT_EQ(room(), 20U);
    EXPECT_TRUE(CeCloseHandle(Open(L"\\copy.bin", GENERIC_WRITE, CREATE_ALWAYS)));
    EXPECT_TRUE(CeCloseHandle(Open(L"\\new.bin", GENERIC_WRITE, TRUNCATE_EXISTING)));
    EXPECT_EQ(room(), 100U);
    // What was put there past the device counts from the next session on.
    WriteTextFile(device_.PcPath(L"\\Jobs\\past.bin"), std::string(150, 'p'));
    Reconnect();
    EXPECT_EQ(room(), 0U);
}

}  // namespace
}  // namespace orvane::testing
