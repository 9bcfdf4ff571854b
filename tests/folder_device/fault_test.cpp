// Sessions, settings and the faults that they ask for.
#include <thread>

#include "tests/folder_device/fixture.h"

namespace orvane::testing {
namespace {

using Fault = FolderDeviceTest;
using Session = FolderDeviceTest;

TEST_F(Session, AreCountedPerThread) {
    ASSERT_TRUE(WriteNew(L"\\a.txt", "a"));
    EXPECT_EQ(Connect(), S_OK);
    EXPECT_EQ(CeRapiUninit(), S_OK);
    EXPECT_TRUE(Names(L"\\*"));
    std::thread([this] {
        EXPECT_EQ(ErrorOf(CeDeleteFile(L"\\a.txt")), DWORD{ERROR_NOT_CONNECTED});
        EXPECT_EQ(CeRapiGetError(), HRESULT_FROM_WIN32(ERROR_NOT_CONNECTED));
        EXPECT_EQ(Connect(), S_OK);
        EXPECT_TRUE(Names(L"\\*"));  // The thread ends with its session open.
    }).join();
    Open(L"\\a.txt", GENERIC_WRITE, OPEN_EXISTING);
    EXPECT_FALSE(DeleteFileW(device_.PcPath(L"\\a.txt").c_str()));
    EXPECT_EQ(CeRapiUninit(), S_OK);
    EXPECT_EQ(CeRapiUninit(), E_FAIL);
    // No session is left in the process: its files are closed, and a new setting is read.
    EXPECT_TRUE(DeleteFileW(device_.PcPath(L"\\a.txt").c_str()));
    device_.Set(L"CONNECT_DELAY", L"150");
    rapi::InitRecord late{sizeof(rapi::InitRecord), nullptr, S_OK};
    ASSERT_EQ(CeRapiInitEx(&late), S_OK);
    EXPECT_FALSE(Names(L"\\*"));
}

TEST_F(Session, OfManyThreadsWorkAtOnce) {
    device_.CloseSessions();
    device_.Set(L"CAPACITY", L"1000000");
    std::vector<std::thread> threads;
    for (int i = 0; i < 4; ++i) {
        threads.emplace_back([this, path = L"\\" + std::to_wstring(i) + L".txt"] {
            for (int round = 0; round < 50; ++round) {
                EXPECT_EQ(Connect(), S_OK);
                EXPECT_TRUE(WriteNew(path, "content"));
                EXPECT_TRUE(CeDeleteFile(path.c_str()));
                EXPECT_EQ(CeRapiUninit(), S_OK);
            }
        });
    }
    for (std::thread& thread : threads) {
        thread.join();
    }
    EXPECT_EQ(ListTree(device_.Root()), StringList{});
}

TEST_F(Fault, SettingsThatCannotBeUnderstoodOpenNoSession) {
    const std::pair<const wchar_t*, const wchar_t*> cases[] = {
        {L"CAPACITY", L"12k"},
        {L"REFUSE", L"CeWritFile=5"},
        {L"SHORT", L"CeCopyFile=5"},
        {L"EXTRA_ENTRIES", L"\\Jobs|a|hidden"},
        {L"TRACE", L"Z:\\no\\such\\folder\\trace.txt"},
    };
    device_.CloseSessions();
    for (const auto& [name, text] : cases) {
        device_.Set(name, text);
        EXPECT_EQ(Connect(), HRESULT_FROM_WIN32(ERROR_BAD_CONFIGURATION)) << ::testing::PrintToString(text);
        device_.Clear(name);
    }
    device_.Set(L"ROOT", device_.PcPath(L"\\pulled out"));
    EXPECT_EQ(Connect(), HRESULT_FROM_WIN32(ERROR_DEVICE_NOT_CONNECTED));
}

TEST_F(Fault, TheFileBesideTheDllCountsWhereTheEnvironmentIsSilent) {
    wchar_t dll[MAX_PATH];
    GetModuleFileNameW(GetModuleHandleW(L"RAPI.DLL"), dll, MAX_PATH);
    const std::wstring ini =
        std::wstring(dll).substr(0, std::wstring(dll).rfind(L'\\')) + L"\\folder_device.ini";
    ASSERT_FALSE(Exists(ini)) << "the test writes and removes it";
    device_.CloseSessions();
    // ROOT is in the environment.
    WriteTextFile(ini, "[other]\nCAPACITY=1\n[Folder_Device]\ncapacity = 4096\nROOT=nowhere\n");
    for (const auto& [text, expected] : {std::pair{L"", 4096U}, {L"0x20", 32U}}) {
        *text == L'\0' ? device_.Clear(L"CAPACITY") : device_.Set(L"CAPACITY", text);
        Reconnect();
        ULARGE_INTEGER bytes{};
        EXPECT_TRUE(CeGetDiskFreeSpaceEx(nullptr, nullptr, &bytes, nullptr));
        EXPECT_EQ(bytes.QuadPart, expected);
    }
    DeleteFileW(ini.c_str());
}

TEST_F(Fault, TheNamedCallIsRefusedAndNoOther) {
    device_.Set(L"REFUSE",
                L"CeCreateDirectory#2=5; CeDeleteFile@\\A.qvj=32 ;"
                L"CeWriteFile#3@\\r=x.txt=23;*@\\cursed=1392");
    Reconnect();
    EXPECT_TRUE(CeCreateDirectory(L"\\1", nullptr));
    EXPECT_EQ(ErrorOf(CeCreateDirectory(L"\\2", nullptr)), DWORD{ERROR_ACCESS_DENIED});
    EXPECT_EQ(CeRapiGetError(), S_OK) << "the device was reached";
    EXPECT_TRUE(CeCreateDirectory(L"\\2", nullptr));
    ASSERT_TRUE(WriteNew(L"\\a.qvj", "content"));
    ASSERT_TRUE(WriteNew(L"\\b.qvj", "content"));
    EXPECT_EQ(ErrorOf(CeDeleteFile(L"\\a.QVJ")), DWORD{ERROR_SHARING_VIOLATION});
    EXPECT_TRUE(CeDeleteFile(L"\\b.qvj"));
    const HANDLE file = Open(L"\\r=x.txt", GENERIC_WRITE, CREATE_NEW);
    for (const DWORD error : {DWORD{0}, DWORD{0}, DWORD{ERROR_CRC}, DWORD{0}}) {
        EXPECT_EQ(ErrorOf(Write(file, "x")), error);
    }
    EXPECT_EQ(ErrorOf(CeCreateDirectory(L"\\cursed", nullptr)), DWORD{ERROR_FILE_CORRUPT});
}

TEST_F(Fault, AVanishedDeviceStaysAway) {
    device_.Set(L"VANISH", L"2");
    Reconnect();
    EXPECT_TRUE(CeCreateDirectory(L"\\1", nullptr));
    for (const wchar_t* path : {L"\\2", L"\\3"}) {
        EXPECT_EQ(ErrorOf(CeCreateDirectory(path, nullptr)), DWORD{ERROR_DEVICE_NOT_CONNECTED});
        EXPECT_EQ(CeRapiGetError(), HRESULT_FROM_WIN32(ERROR_DEVICE_NOT_CONNECTED));
    }
    device_.CloseSessions();
    EXPECT_EQ(Connect(), HRESULT_FROM_WIN32(ERROR_DEVICE_NOT_CONNECTED));
}

TEST_F(Fault, ACallMayFallShortOrLoseItsReply) {
    device_.Set(L"SHORT", L"CeWriteFile#2=3; CeReadFile@\\a.txt=2");
    device_.Set(L"LOSE_REPLY", L"CeWriteFile#3=1117;CeCreateFile@\\lost.txt=1117;CeReadFile#2=5");
    Reconnect();
    const HANDLE file = Open(L"\\a.txt", GENERIC_READ | GENERIC_WRITE, CREATE_NEW);
    DWORD moved = 0;
    for (const auto& [error, bytes] : {std::pair{0U, 5U}, {0U, 3U}, {1117U, 0U}, {0U, 5U}}) {
        EXPECT_EQ(ErrorOf(CeWriteFile(file, "12345", 5, &moved, nullptr)), error);
        EXPECT_EQ(moved, bytes);
    }
    CeSetFilePointer(file, 0, nullptr, FILE_BEGIN);
    char bytes[8] = {};
    for (const auto& [error, count] : {std::pair{0U, 2U}, {5U, 0U}, {0U, 2U}}) {
        EXPECT_EQ(ErrorOf(CeReadFile(file, bytes, sizeof(bytes), &moved, nullptr)), error);
        EXPECT_EQ(moved, count);
    }
    EXPECT_STREQ(bytes, "51") << "what the lost reply held is passed over";
    EXPECT_EQ(ErrorOf(Open(L"\\lost.txt", GENERIC_WRITE, CREATE_NEW)), DWORD{ERROR_IO_DEVICE});
    EXPECT_EQ(Names(L"\\*"), (StringList{L"a.txt", L"lost.txt"}));
    device_.CloseSessions();
    EXPECT_EQ(ReadTextFile(device_.PcPath(L"\\a.txt")), "123451231234512345");
    device_.Set(L"LOSE_CALL", L"2");
    Reconnect();
    EXPECT_TRUE(CeDeleteFile(L"\\lost.txt"));
    EXPECT_EQ(ErrorOf(CeDeleteFile(L"\\a.txt")), DWORD{ERROR_ACCESS_DENIED});
    EXPECT_EQ(Names(L"\\*"), StringList{});
}

TEST_F(Fault, TheProcessEndsAtTheCallOfThatNumber) {
    device_.Set(L"END_PROCESS", L"2");
    Reconnect();
    EXPECT_TRUE(CeCreateDirectory(L"\\1", nullptr));
    EXPECT_EXIT(CeRemoveDirectory(L"\\1"), ::testing::ExitedWithCode(99), "");
}

TEST_F(Fault, TheTraceTellsEveryCall) {
    device_.StartTrace();
    Reconnect();
    const HANDLE made = Open(L"\\J\u00F6b.txt", GENERIC_WRITE, CREATE_NEW);
    EXPECT_TRUE(Write(made, "12345"));
    std::thread([] { CeMoveFile(L"\\a\t", nullptr); }).join();
    device_.CloseSessions();

    const std::vector<TraceLine> lines = device_.Trace();
    ASSERT_EQ(lines.size(), 6U);
    // A handle, followed by the path that it is open on.
    const std::wstring open_file = lines[2].arguments[0];
    EXPECT_TRUE(open_file.starts_with(L"0x") && open_file.ends_with(L" \\J\u00F6b.txt"));
    const struct {
        const wchar_t* function;
        StringList arguments;
        std::size_t sessions;
        DWORD error;
    } expected[] = {
        {L"CeRapiInitEx", {}, 1, 0},
        {L"CeCreateFile", {L"\\J\u00F6b.txt", L"0x40000000", L"0x0", L"0x1", L"0x80"}, 1, 0},
        {L"CeWriteFile", {open_file, L"0x5"}, 1, 0},
        {L"CeMoveFile", {L"\\a?", L"(null)"}, 0, ERROR_NOT_CONNECTED},
        {L"CeRapiUninit", {}, 0, 0},
        {L"CeRapiUninit", {}, 0, 0x80004005},
    };
    for (std::size_t i = 0; i < lines.size(); ++i) {
        const TraceLine& line = lines[i];
        EXPECT_EQ(line.thread == GetCurrentThreadId(), line.function != L"CeMoveFile") << i;
        EXPECT_EQ(
            std::tie(line.function, line.arguments, line.sessions, line.error),
            std::tuple(expected[i].function, expected[i].arguments, expected[i].sessions, expected[i].error))
            << i;
    }
}

}  // namespace
}  // namespace orvane::testing
