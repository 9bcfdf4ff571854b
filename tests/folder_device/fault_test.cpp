#include <cwchar>
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
        {L"CAPACITY", L"12k"},          {L"CLOCK_OFFSET", L"1.5"},
        {L"CALL_DELAY", L"4294967296"}, {L"CONNECT_DELAY", L"Never"},
        {L"REFUSE", L"CeWritFile=5"},   {L"REFUSE", L"CeWriteFile#3"},
        {L"EXTRA_ENTRIES", L"\\Jobs"},  {L"EXTRA_ENTRIES", L"\\Jobs|a|hidden"},
        {L"FOUND_NULL", L"2"},          {L"TRACE", L"Z:\\no\\such\\folder\\trace.txt"},
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
                L"CeCreateDirectory#2=5; CeDeleteFile@\\Jobs\\A.qvj=32 ;CeWriteFile@\\w=x.txt=1117;"
                L"CeReadFile#2@\\r.txt=23;CeRapiInvoke=0x80070490;*@\\cursed=1392");
    Reconnect();
    EXPECT_TRUE(CeCreateDirectory(L"\\Jobs", nullptr));
    EXPECT_EQ(ErrorOf(CeCreateDirectory(L"\\2", nullptr)), DWORD{ERROR_ACCESS_DENIED});
    EXPECT_EQ(CeRapiGetError(), S_OK) << "the device was reached";
    EXPECT_TRUE(CeCreateDirectory(L"\\2", nullptr));
    for (const wchar_t* path : {L"\\Jobs\\a.qvj", L"\\Jobs\\b.qvj", L"\\r.txt"}) {
        ASSERT_TRUE(WriteNew(path, "content"));
    }
    EXPECT_EQ(ErrorOf(CeDeleteFile(L"\\jobs\\a.QVJ")), DWORD{ERROR_SHARING_VIOLATION});
    EXPECT_TRUE(CeDeleteFile(L"\\Jobs\\b.qvj"));
    EXPECT_FALSE(WriteNew(L"\\w=x.txt", "content"));
    EXPECT_EQ(CeGetLastError(), DWORD{ERROR_IO_DEVICE});
    const HANDLE file = Open(L"\\r.txt", GENERIC_READ, OPEN_EXISTING);
    for (const DWORD error : {DWORD{0}, DWORD{ERROR_CRC}, DWORD{0}}) {
        char byte = 0;
        DWORD read = 0;
        EXPECT_EQ(ErrorOf(CeReadFile(file, &byte, 1, &read, nullptr)), error);
    }
    EXPECT_EQ(CeRapiInvoke(L"a.dll", L"f", 0, nullptr, nullptr, nullptr, nullptr, 0),
              static_cast<HRESULT>(0x80070490));
    EXPECT_EQ(ErrorOf(CeCreateDirectory(L"\\cursed", nullptr)), DWORD{ERROR_FILE_CORRUPT});
}

TEST_F(Fault, AVanishedDeviceStaysAway) {
    ASSERT_TRUE(WriteNew(L"\\a.txt", "content"));
    device_.Set(L"VANISH", L"3");
    Reconnect();
    const HANDLE file = Open(L"\\a.txt", GENERIC_READ, OPEN_EXISTING);
    char byte = 0;
    DWORD read = 0;
    EXPECT_TRUE(CeReadFile(file, &byte, 1, &read, nullptr));
    EXPECT_EQ(ErrorOf(CeReadFile(file, &byte, 1, &read, nullptr)), DWORD{ERROR_DEVICE_NOT_CONNECTED});
    EXPECT_EQ(CeRapiGetError(), HRESULT_FROM_WIN32(ERROR_DEVICE_NOT_CONNECTED));
    EXPECT_EQ(Names(L"\\*"), std::nullopt);
    device_.CloseSessions();
    EXPECT_EQ(Connect(), HRESULT_FROM_WIN32(ERROR_DEVICE_NOT_CONNECTED));
    EXPECT_EQ(device_.CloseSessions(), 1);
    device_.Clear(L"VANISH");
    EXPECT_EQ(Connect(), S_OK);
    EXPECT_TRUE(CeDeleteFile(L"\\a.txt"));
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
    wchar_t open_file[64];  // A handle, followed by the path that it is open on.
    std::swprintf(open_file, std::size(open_file), L"0x%llx \\J\u00F6b.txt",
                  static_cast<unsigned long long>(reinterpret_cast<std::uintptr_t>(made)));
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
    ASSERT_EQ(lines.size(), std::size(expected));
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
