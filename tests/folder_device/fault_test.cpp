#include <thread>

#include "tests/folder_device/fixture.h"

namespace orvane::testing {
namespace {

using Fault = FolderDeviceTest;

TEST_F(Fault, SettingsThatCannotBeUnderstoodOpenNoSession) {
    const struct {
        const wchar_t* name;
        const wchar_t* text;
    } cases[] = {
        {L"CAPACITY", L"12k"},
        {L"CLOCK_OFFSET", L"1.5"},
        {L"CALL_DELAY", L"4294967296"},
        {L"CONNECT_DELAY", L"Never"},
        {L"REFUSE", L"CeWritFile=5"},
        {L"REFUSE", L"CeWriteFile#3"},
        {L"SHORT", L"CeCopyFile=5"},
        {L"EXTRA_ENTRIES", L"\\Jobs"},
        {L"EXTRA_ENTRIES", L"\\Jobs|a|hidden"},
        {L"FOUND_NULL", L"2"},
        {L"TRACE", L"Z:\\no\\such\\folder\\trace.txt"},
    };
    device_.CloseSessions();
    for (const auto& [name, text] : cases) {
        device_.Set(name, text);
        EXPECT_EQ(Connect(), HRESULT_FROM_WIN32(ERROR_BAD_CONFIGURATION)) << ::testing::PrintToString(text);
        device_.Clear(name);
    }
    EXPECT_EQ(Connect(), S_OK);
}

TEST_F(Fault, TheNamedCallIsRefusedAndNoOther) {
    device_.Set(L"REFUSE",
                L"CeCreateDirectory#2=5; CeDeleteFile@\\A.qvj=32 ;CeWriteFile@\\w=x.txt=1117;"
                L"CeWriteFile#3@\\r.txt=23;CeRapiInvoke=0x80070490;*@\\cursed=1392");
    Reconnect();
    EXPECT_TRUE(CeCreateDirectory(L"\\1", nullptr));
    EXPECT_EQ(ErrorOf(CeCreateDirectory(L"\\2", nullptr)), DWORD{ERROR_ACCESS_DENIED});
    EXPECT_EQ(CeRapiGetError(), S_OK) << "the device was reached";
    EXPECT_TRUE(CeCreateDirectory(L"\\2", nullptr));
    ASSERT_TRUE(WriteNew(L"\\a.qvj", "content"));
    ASSERT_TRUE(WriteNew(L"\\b.qvj", "content"));
    EXPECT_EQ(ErrorOf(CeDeleteFile(L"\\a.QVJ")), DWORD{ERROR_SHARING_VIOLATION});
    EXPECT_TRUE(CeDeleteFile(L"\\b.qvj"));
    EXPECT_FALSE(WriteNew(L"\\w=x.txt", "content"));
    EXPECT_EQ(CeGetLastError(), DWORD{ERROR_IO_DEVICE});
    const HANDLE file = Open(L"\\r.txt", GENERIC_WRITE, CREATE_NEW);
    for (const DWORD error : {DWORD{0}, DWORD{0}, DWORD{ERROR_CRC}, DWORD{0}}) {
        EXPECT_EQ(ErrorOf(Write(file, "x")), error);
    }
    EXPECT_EQ(CeRapiInvoke(L"a.dll", L"f", 0, nullptr, nullptr, nullptr, nullptr, 0),
              static_cast<HRESULT>(0x80070490));
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
    EXPECT_EQ(device_.CloseSessions(), 1);
    device_.Set(L"VANISH_DELAY", L"150");  // Silent now: callers are kept waiting, and connections.
    device_.Set(L"VANISH", L"1");
    EXPECT_EQ(Connect(), S_OK);
    const ULONGLONG begin = GetTickCount64();
    EXPECT_EQ(ErrorOf(CeRemoveDirectory(L"\\1")), DWORD{ERROR_DEVICE_NOT_CONNECTED});
    EXPECT_GE(GetTickCount64() - begin, 100U) << "a clock of 16 ms shows a little less";
    device_.CloseSessions();
    rapi::InitRecord record{sizeof(rapi::InitRecord), nullptr, S_OK};
    ASSERT_EQ(CeRapiInitEx(&record), S_OK);
    EXPECT_EQ(WaitForSingleObject(record.init_event, 300), DWORD{WAIT_TIMEOUT});
    device_.Clear(L"VANISH");
    Reconnect();
    EXPECT_TRUE(CeRemoveDirectory(L"\\1"));
}

TEST_F(Fault, ACallMayFallShortOrLoseItsReply) {
    device_.Set(L"SHORT", L"CeWriteFile#2=3; CeReadFile@\\a.txt=2");
    device_.Set(L"LOSE_REPLY",
                L"CeWriteFile#3=1117;CeCreateFile@\\lost.txt=1117;CeFindAllFiles#1=5;CeReadFile#2=5");
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
    EXPECT_EQ(Names(L"\\*"), std::nullopt);
    EXPECT_EQ(Names(L"\\*"), (StringList{L"a.txt", L"lost.txt"}));
    device_.CloseSessions();
    EXPECT_EQ(ReadTextFile(device_.PcPath(L"\\a.txt")), "123451231234512345");
}

TEST_F(Fault, TheCallOfThatNumberIsStruck) {
    for (const wchar_t* setting : {L"FAIL_CALL", L"LOSE_CALL"}) {
        SCOPED_TRACE(::testing::PrintToString(setting));
        device_.Clear(L"FAIL_CALL");
        device_.Set(setting, L"2");
        Reconnect();
        const std::wstring folder = std::wstring(L"\\") + setting;
        EXPECT_TRUE(CeCreateDirectory(folder.c_str(), nullptr));
        EXPECT_EQ(ErrorOf(CeRemoveDirectory(folder.c_str())), DWORD{ERROR_ACCESS_DENIED});
        EXPECT_TRUE(CeCreateDirectory(L"\\3", nullptr));
        EXPECT_TRUE(CeRemoveDirectory(L"\\3"));
    }
    EXPECT_EQ(ListTree(device_.Root()), StringList{L"FAIL_CALL\\"});
}

// Runs in a child process only, with the settings that it inherits.
TEST(FaultChild, DISABLED_MakesThreeFolders) {
    rapi::InitRecord record{sizeof(rapi::InitRecord), nullptr, S_OK};
    ASSERT_EQ(CeRapiInitEx(&record), S_OK);
    for (const wchar_t* path : {L"\\1", L"\\2", L"\\3"}) {
        CeCreateDirectory(path, nullptr);
    }
}

TEST_F(Fault, TheProcessEndsBeforeTheCallOfThatNumber) {
    device_.Set(L"END_PROCESS", L"2");
    wchar_t program[MAX_PATH];
    GetModuleFileNameW(nullptr, program, MAX_PATH);
    std::wstring command = L"tests --gtest_also_run_disabled_tests --gtest_filter=FaultChild.*";
    STARTUPINFOW start{};
    start.cb = sizeof(start);
    PROCESS_INFORMATION child{};
    ASSERT_TRUE(CreateProcessW(program, command.data(), nullptr, nullptr, FALSE, 0, nullptr, nullptr, &start,
                               &child));
    EXPECT_EQ(WaitForSingleObject(child.hProcess, 20000), WAIT_OBJECT_0);
    DWORD code = 0;
    GetExitCodeProcess(child.hProcess, &code);
    CloseHandle(child.hProcess);
    CloseHandle(child.hThread);
    EXPECT_EQ(code, 99U);
    EXPECT_EQ(ListTree(device_.Root()), StringList{L"1\\"});
}

// The file beside the DLL, which the test must not find and does not leave behind.
class IniFile : public FolderDeviceTest {
  protected:
    void SetUp() override {
        wchar_t dll[MAX_PATH];
        GetModuleFileNameW(GetModuleHandleW(L"RAPI.DLL"), dll, MAX_PATH);
        path_ = std::wstring(dll).substr(0, std::wstring(dll).rfind(L'\\')) + L"\\folder_device.ini";
        ASSERT_FALSE(Exists(path_)) << "the test writes and removes it";
    }
    void TearDown() override { DeleteFileW(path_.c_str()); }

    std::wstring path_;
};

TEST_F(IniFile, CountsWhereTheEnvironmentIsSilent) {
    device_.CloseSessions();
    for (const std::string& text : {std::string("\xFF\xFE[\0]\0", 6), std::string((4 << 20) + 1, '\n')}) {
        WriteTextFile(path_, text);
        EXPECT_EQ(Connect(), HRESULT_FROM_WIN32(ERROR_BAD_CONFIGURATION)) << text.size();
    }
    // ROOT is in the environment.
    WriteTextFile(path_, "[other]\nCAPACITY=1\n[Folder_Device]\ncapacity = 4096\nROOT=nowhere\n");
    const auto total = [this] {
        Reconnect();
        ULARGE_INTEGER bytes{};
        EXPECT_TRUE(CeGetDiskFreeSpaceEx(nullptr, nullptr, &bytes, nullptr));
        return bytes.QuadPart;
    };
    EXPECT_EQ(total(), 4096U);
    device_.Set(L"CAPACITY", L"0x20");
    EXPECT_EQ(total(), 32U);
    device_.Set(L"CAPACITY", L"");
    EXPECT_GT(total(), 4096U) << "an empty text is the default, no gap for the file to fill";
}

TEST_F(Fault, TheTraceTellsEveryCall) {
    device_.StartTrace();
    Reconnect();
    EXPECT_EQ(Open(L"\\J\u00F6b\t.txt", GENERIC_READ, OPEN_EXISTING, FILE_SHARE_READ), INVALID_HANDLE_VALUE);
    const HANDLE made = Open(L"\\J\u00F6b.txt", GENERIC_WRITE, CREATE_NEW);
    EXPECT_TRUE(Write(made, "12345"));
    std::thread([] { CeMoveFile(L"\\a", nullptr); }).join();
    device_.CloseSessions();

    const std::vector<TraceLine> lines = device_.Trace();
    ASSERT_EQ(lines.size(), 7U);
    // A handle, followed by the path that it is open on.
    const std::wstring open_file = lines[3].arguments[0];
    EXPECT_TRUE(open_file.starts_with(L"0x") && open_file.ends_with(L" \\J\u00F6b.txt"));
    const struct {
        const wchar_t* function;
        StringList arguments;
        DWORD error;
    } expected[] = {
        {L"CeRapiInitEx", {}, 0},
        {L"CeCreateFile", {L"\\J\u00F6b?.txt", L"0x80000000", L"0x1", L"0x3", L"0x80"}, ERROR_INVALID_NAME},
        {L"CeCreateFile", {L"\\J\u00F6b.txt", L"0x40000000", L"0x0", L"0x1", L"0x80"}, 0},
        {L"CeWriteFile", {open_file, L"0x5"}, 0},
        {L"CeMoveFile", {L"\\a", L"(null)"}, ERROR_NOT_CONNECTED},
        {L"CeRapiUninit", {}, 0},
        {L"CeRapiUninit", {}, 0x80004005},
    };
    for (std::size_t i = 0; i < lines.size(); ++i) {
        SCOPED_TRACE(i);
        EXPECT_EQ(lines[i].thread == GetCurrentThreadId(), lines[i].function != L"CeMoveFile");
        EXPECT_EQ(lines[i].function, expected[i].function);
        EXPECT_EQ(lines[i].arguments, expected[i].arguments);
        EXPECT_EQ(lines[i].error, expected[i].error);
    }
}

}  // namespace
}  // namespace orvane::testing
