#include <thread>

#include "tests/folder_device/fixture.h"

namespace orvane::testing {
namespace {

using Session = FolderDeviceTest;

TEST_F(Session, AreCountedPerThread) {
    EXPECT_EQ(Connect(), S_OK);
    EXPECT_EQ(CeRapiUninit(), S_OK);
    EXPECT_TRUE(Names(L"\\*"));
    std::thread([this] {
        EXPECT_FALSE(Names(L"\\*"));
        EXPECT_EQ(CeGetLastError(), DWORD{ERROR_NOT_CONNECTED});
        EXPECT_EQ(CeRapiUninit(), E_FAIL);
        EXPECT_EQ(Connect(), S_OK);
        EXPECT_TRUE(Names(L"\\*"));  // The thread ends with its session open.
    }).join();
    EXPECT_EQ(CeRapiUninit(), S_OK);
    EXPECT_EQ(CeRapiUninit(), E_FAIL);
    // No session is left in the process, so a new setting is read.
    device_.Set(L"INIT_RESULT", L"0x80070005");
    EXPECT_EQ(Connect(), E_ACCESSDENIED);
}

TEST_F(Session, OutsideOfOneEveryCallToTheDeviceFails) {
    ASSERT_TRUE(WriteNew(L"\\a.txt", "a"));
    device_.CloseSessions();
    EXPECT_FALSE(CeDeleteFile(L"\\a.txt"));
    EXPECT_NE(CeRegCloseKey(HKEY_CURRENT_USER), 0);
    EXPECT_EQ(Open(L"\\a.txt", GENERIC_READ, OPEN_EXISTING), INVALID_HANDLE_VALUE);
    EXPECT_EQ(CeGetLastError(), DWORD{ERROR_NOT_CONNECTED});
    EXPECT_EQ(CeRapiGetError(), HRESULT_FROM_WIN32(ERROR_NOT_CONNECTED));
    EXPECT_TRUE(Exists(device_.PcPath(L"\\a.txt")));
}

TEST_F(Session, AConnectionCanBeLateFailOrStayAway) {
    device_.CloseSessions();
    device_.Set(L"CONNECT_DELAY", L"150");
    rapi::InitRecord late{sizeof(rapi::InitRecord), nullptr, S_OK};
    ASSERT_EQ(CeRapiInitEx(&late), S_OK);
    EXPECT_EQ(WaitForSingleObject(late.init_event, 0), DWORD{WAIT_TIMEOUT});
    EXPECT_FALSE(Names(L"\\*"));
    EXPECT_EQ(WaitForSingleObject(late.init_event, 5000), WAIT_OBJECT_0);
    EXPECT_EQ(late.init_result, S_OK);
    EXPECT_TRUE(Names(L"\\*"));
    device_.CloseSessions();

    device_.Set(L"CONNECT_RESULT", L"0x80004005");
    EXPECT_EQ(Connect(), E_FAIL);
    EXPECT_FALSE(Names(L"\\*"));
    EXPECT_EQ(device_.CloseSessions(), 1);
    device_.Clear(L"CONNECT_RESULT");
    device_.Set(L"CONNECT_DELAY", L"never");
    ASSERT_EQ(CeRapiInitEx(&late), S_OK);
    EXPECT_EQ(WaitForSingleObject(late.init_event, 200), DWORD{WAIT_TIMEOUT});
    EXPECT_EQ(CeRapiUninit(), S_OK);
    device_.Clear(L"CONNECT_DELAY");
    device_.Set(L"ROOT", device_.PcPath(L"\\pulled out"));
    EXPECT_EQ(Connect(), HRESULT_FROM_WIN32(ERROR_DEVICE_NOT_CONNECTED));
}

TEST_F(Session, ManyThreadsWorkAtOnce) {
    device_.CloseSessions();
    device_.Set(L"CAPACITY", L"1000000");
    std::vector<std::thread> threads;
    for (int i = 0; i < 4; ++i) {
        threads.emplace_back([this, i] {
            const std::wstring path = L"\\" + std::to_wstring(i) + L".txt";
            for (int round = 0; round < 50; ++round) {
                EXPECT_EQ(Connect(), S_OK);
                EXPECT_TRUE(WriteNew(path.c_str(), "content"));
                EXPECT_TRUE(Names(L"\\*.txt"));
                EXPECT_TRUE(CeDeleteFile(path.c_str()));
                EXPECT_EQ(CeRapiUninit(), S_OK);
            }
        });
    }
    for (std::thread& thread : threads) {
        thread.join();
    }
    EXPECT_EQ(Connect(), S_OK);
    EXPECT_EQ(Names(L"\\*"), StringList{});
}

TEST_F(Session, ForeignCodeIsNeverRun) {
    WriteTextFile(device_.PcPath(L"\\Windows\\there.dll"), "MZ");
    for (const auto& [dll, error] : {std::pair{L"there.dll", ERROR_BAD_EXE_FORMAT},
                                     {L"kernel32.dll", ERROR_FILE_NOT_FOUND},
                                     {L"..\\there.dll", ERROR_INVALID_NAME}}) {
        EXPECT_EQ(CeRapiInvoke(dll, L"Run", 0, nullptr, nullptr, nullptr, nullptr, 0),
                  HRESULT_FROM_WIN32(static_cast<DWORD>(error)));
    }
}

}  // namespace
}  // namespace orvane::testing
