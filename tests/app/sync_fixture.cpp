#include "tests/app/sync_fixture.h"

#include <commctrl.h>

#include <algorithm>

#include "app/application.h"
#include "app/sync_dialog.h"
#include "res/ids.h"
#include "settings/registry_strings.h"

namespace orvane::testing {

namespace {

constexpr const wchar_t* kKey = L"Software\\Veltrano\\CE Devices";
constexpr const wchar_t* kComplete = L"Synchronization complete.";
constexpr ULONGLONG kPatienceMs = 30'000;

std::wstring ListLine(HWND list, LRESULT line) {
    const LRESULT length = SendMessageW(list, LB_GETTEXTLEN, static_cast<WPARAM>(line), 0);
    std::wstring text(static_cast<std::size_t>(length) + 1, L'\0');
    SendMessageW(list, LB_GETTEXT, static_cast<WPARAM>(line), reinterpret_cast<LPARAM>(text.data()));
    text.resize(static_cast<std::size_t>(length));
    return text;
}

}  // namespace

DialogRun::DialogRun() : thread_([this] { Run(); }) {
    WaitUntil([this] {
        return HasEnded() || FileView() != nullptr ||
               (window_ != nullptr && IsWindowVisible(window_) && !Text(IDC_SYNC_CANCEL_EXIT).empty());
    });
}

DialogRun::~DialogRun() {
    if (!HasEnded()) {
        PostMessageW(window_, WM_COMMAND, IDCANCEL, 0);
    }
    thread_.join();
}

void DialogRun::Run() {
    const INITCOMMONCONTROLSEX controls = {sizeof(INITCOMMONCONTROLSEX), ICC_WIN95_CLASSES};
    InitCommonControlsEx(&controls);
    RegisterDialogClass();
    CWendlowDlg dialog;
    // The window exists only inside DoModal: a helper thread looks for it.
    std::atomic<bool> done{false};
    std::thread finder([&] {
        while (!done && window_ == nullptr) {
            window_ = dialog.Handle();
            Sleep(1);
        }
    });
    dialog.DoModal();
    ended_ = true;
    done = true;
    finder.join();
    EXPECT_TRUE(WaitUntil([&] { return !dialog.HasRunningWorker(); }));
}

void DialogRun::Press(int id) const {
    SendMessageW(GetDlgItem(window_, id), BM_CLICK, 0, 0);
}

std::wstring DialogRun::Text(int id) const {
    wchar_t text[512] = {};
    SendMessageW(GetDlgItem(window_, id), WM_GETTEXT, std::size(text), reinterpret_cast<LPARAM>(text));
    return text;
}

std::vector<std::wstring> DialogRun::Log() const {
    HWND list = GetDlgItem(window_, IDC_SYNC_LOG);
    const LRESULT count = SendMessageW(list, LB_GETCOUNT, 0, 0);
    std::vector<std::wstring> lines;
    for (LRESULT line = 0; line < count; ++line) {
        lines.push_back(ListLine(list, line));
    }
    return lines;
}

bool DialogRun::IsBarVisible() const {
    return IsWindowVisible(GetDlgItem(window_, IDC_SYNC_PROGRESS)) != FALSE;
}

LRESULT DialogRun::BarPosition() const {
    return SendMessageW(GetDlgItem(window_, IDC_SYNC_PROGRESS), PBM_GETPOS, 0, 0);
}

LRESULT DialogRun::BarMaximum() const {
    return SendMessageW(GetDlgItem(window_, IDC_SYNC_PROGRESS), PBM_GETRANGE, FALSE, 0);
}

std::ptrdiff_t DialogRun::Completions() const {
    const std::vector<std::wstring> log = Log();
    return std::count(log.begin(), log.end(), kComplete);
}

void DialogRun::Synchronize() const {
    const std::ptrdiff_t before = Completions();
    Press(IDC_SYNC_START);
    ASSERT_TRUE(WaitForText(IDC_SYNC_STATUS, kComplete));
    ASSERT_TRUE(WaitUntil([this] { return !IsBarVisible(); }));
    ASSERT_EQ(Completions(), before + 1);
}

bool DialogRun::WaitUntil(const std::function<bool()>& condition) {
    const ULONGLONG end = GetTickCount64() + kPatienceMs;
    while (!condition()) {
        if (GetTickCount64() >= end) {
            return false;
        }
        Sleep(5);
    }
    return true;
}

bool DialogRun::WaitForText(int id, const std::wstring& text) const {
    return WaitUntil([&] { return Text(id) == text; });
}

HWND FileView() {
    HWND view = FindWindowW(L"#32770", L"File Transfer - Copy From");
    return view != nullptr && IsWindowVisible(view) ? view : nullptr;
}

void SyncTest::SetUp() {
    MakeFolder(OnDevice(L""));
    Setting(L"SyncPath_DT", pc_.Path() + L"\\");
    Setting(L"SyncPath_CE", L"\\Jobs\\");
    for (const wchar_t* type :
         {L"qvj", L"tn3", L"rd3", L"pt3", L"ln3", L"jpg", L"bmp", L"img", L"xml", L"tp3", L"wkf", L"txt"}) {
        Setting(std::wstring(L"Sync_") + type + L"_files", L"1");
    }
    Setting(L"Overwrite_old_files", L"1");
}

void SyncTest::Setting(const std::wstring& name, const std::wstring& text) {
    EXPECT_TRUE(RegWriteString(HKEY_CURRENT_USER, kKey, name, text));
}

void SyncTest::PutOnPc(const std::wstring& name, std::string_view content, const FILETIME& time) const {
    WriteTextFile(OnPc(name), content, time);
}

void SyncTest::PutOnDevice(const std::wstring& name, std::string_view content, const FILETIME& time) const {
    WriteTextFile(OnDevice(name), content, time);
}

void SyncTest::PutManyOnPc(int count) const {
    for (int i = 0; i < count; ++i) {
        PutOnPc(L"new_" + std::to_wstring(i) + L".qvj", "content", noon_);
    }
}

}  // namespace orvane::testing
