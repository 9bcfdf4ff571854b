// The folder device, called through the program's own Remote API: its sessions, settings and faults, and what
// can be reached, found and changed on it.
#include <gtest/gtest.h>

#include <algorithm>
#include <thread>

#include "device/remote_api.h"
#include "tests/support/dialog_script.h"
#include "tests/support/folder_device.h"

namespace orvane::testing {
namespace {

using StringList = std::vector<std::wstring>;

// A device with one session open on the test's thread.
class FolderDeviceTest : public ::testing::Test {
  protected:
    FolderDeviceTest() { Connect(); }

    // Opens one more session; what CeRapiInitEx and then the connection answered.
    HRESULT Connect() {
        rapi::InitRecord record{sizeof(rapi::InitRecord), nullptr, E_FAIL};
        const HRESULT result = CeRapiInitEx(&record);
        if (FAILED(result)) {
            return result;
        }
        EXPECT_EQ(WaitForSingleObject(record.init_event, 5000), WAIT_OBJECT_0);
        return record.init_result;
    }
    // Closes all sessions and opens one, so that changed settings are read.
    void Reconnect() {
        device_.CloseSessions();
        EXPECT_EQ(Connect(), S_OK);
    }
    HANDLE Open(const std::wstring& path, DWORD access, DWORD creation, DWORD share = 0) {
        return CeCreateFile(path.c_str(), access, share, nullptr, creation, FILE_ATTRIBUTE_NORMAL, nullptr);
    }
    // Creates the file with this content through the device. False when a call failed.
    bool WriteNew(const std::wstring& path, std::string_view content) {
        const HANDLE file = Open(path, GENERIC_WRITE, CREATE_NEW);
        return file != INVALID_HANDLE_VALUE && Write(file, content) && CeCloseHandle(file);
    }
    bool Write(HANDLE file, std::string_view bytes) {
        DWORD written = 0;
        return CeWriteFile(file, bytes.data(), static_cast<DWORD>(bytes.size()), &written, nullptr) &&
               written == bytes.size();
    }
    // The names that CeFindAllFiles gives, in alphabetical order; nothing when it fails.
    std::optional<StringList> Names(const std::wstring& pattern) {
        DWORD count = 0;
        rapi::FindData* found = nullptr;
        if (!CeFindAllFiles(pattern.c_str(), rapi::kFindName, &count, &found)) {
            return std::nullopt;
        }
        StringList names;
        std::for_each(found, found + count, [&](const auto& entry) { names.push_back(entry.name); });
        std::sort(names.begin(), names.end());
        EXPECT_EQ(CeRapiFreeBuffer(found), S_OK);
        return names;
    }
    // The error of a call that must have failed; 0 for one that did not.
    DWORD ErrorOf(BOOL done) { return done ? 0 : CeGetLastError(); }
    DWORD ErrorOf(HANDLE handle) { return handle != INVALID_HANDLE_VALUE ? 0 : CeGetLastError(); }

    FolderDevice device_;
};
using Session = FolderDeviceTest;
using Fault = FolderDeviceTest;
using DevicePath = FolderDeviceTest;
using DeviceFile = FolderDeviceTest;

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

TEST_F(Fault, SettingsThatCannotBeUnderstoodOpenNoSession) {
    device_.CloseSessions();
    for (const auto& [name, text] : {std::pair{L"CAPACITY", L"12k"},
                                     {L"REFUSE", L"CeWritFile=5"},
                                     {L"SHORT", L"CeCopyFile=5"},
                                     {L"EXTRA_ENTRIES", L"\\Jobs|a|hidden"}}) {
        device_.Set(name, text);
        EXPECT_EQ(Connect(), HRESULT_FROM_WIN32(ERROR_BAD_CONFIGURATION)) << ::testing::PrintToString(text);
        device_.Clear(name);
    }
    device_.Set(L"ROOT", device_.PcPath(L"\\pulled out"));
    EXPECT_EQ(Connect(), HRESULT_FROM_WIN32(ERROR_DEVICE_NOT_CONNECTED));
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
    EXPECT_EQ(ErrorOf(CeCreateDirectory(L"\\2", nullptr)), DWORD{ERROR_DEVICE_NOT_CONNECTED});
    EXPECT_EQ(ErrorOf(CeCreateDirectory(L"\\3", nullptr)), DWORD{ERROR_DEVICE_NOT_CONNECTED});
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
    const std::tuple<std::wstring, StringList, std::size_t, DWORD> expected[] = {
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
        EXPECT_EQ(std::tie(line.function, line.arguments, line.sessions, line.error), expected[i]) << i;
    }
}

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

TEST_F(DevicePath, ListingsAreOfTheDeviceUnlessMadeHostile) {
    for (const wchar_t* name : {L"a.qvj", L"B.QVJ", L"a.qvj.001", L"sub\\c"}) {
        WriteTextFile(device_.PcPath(L"\\Jobs\\") + name, "");
    }
    for (const wchar_t* name : {L"dot.", L"con.txt"}) {  // No device can hold these.
        WriteTextFile(L"\\\\?\\" + device_.PcPath(L"\\Jobs\\") + name, "");
    }
    EXPECT_EQ(Names(L"\\Jobs\\*"), (StringList{L"B.QVJ", L"a.qvj", L"a.qvj.001", L"sub"}));
    EXPECT_EQ(Names(L"\\J*\\a.qvj"), std::nullopt);
    device_.Set(L"EXTRA_ENTRIES",
                L"\\Jobs|..\\evil.qvj; \\jobs|;\\Jobs|..|folder;\\|top.qvj"
                L";\\Jobs|full.|unterminated,size=5000000000");
    Reconnect();
    EXPECT_EQ(Names(L"\\*.qvj"), StringList{L"top.qvj"});
    DWORD count = 0;
    rapi::FindData* found = nullptr;
    ASSERT_TRUE(CeFindAllFiles(L"\\Jobs\\*", 0xBF, &count, &found));
    ASSERT_EQ(count, 8U);
    EXPECT_STREQ(found[4].name, L"..\\evil.qvj");
    EXPECT_STREQ(found[5].name, L"");
    EXPECT_EQ(found[6].attributes, DWORD{FILE_ATTRIBUTE_DIRECTORY});
    EXPECT_EQ(std::wstring_view(found[7].name, MAX_PATH).find(L'\0'), std::wstring_view::npos);
    EXPECT_EQ(found[7].size_high, 1U);
    EXPECT_EQ(CeRapiFreeBuffer(found), S_OK);
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
    const auto room = [] {
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
