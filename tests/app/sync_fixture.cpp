#include "tests/app/sync_fixture.h"

#include <commctrl.h>

#include <algorithm>

#include "app/application.h"
#include "app/sync_dialog.h"
#include "jobs/file_types.h"
#include "platform/resources.h"
#include "settings/settings_store.h"

namespace orvane::testing {

namespace {

constexpr const wchar_t* kKey = L"Software\\Veltrano\\CE Devices";
constexpr const wchar_t* kComplete = L"Synchronization complete.";

}  // namespace

DialogRun::DialogRun() : thread_([this] { Run(); }) {
    WaitUntil([this] {
        window_ = FindWindowW(L"Qel_Orvanelink", nullptr);
        return HasEnded() || FileView() != nullptr ||
               (IsWindowVisible(window_) && !Text(IDC_SYNC_CANCEL_EXIT).empty());
    });
}

DialogRun::~DialogRun() {
    if (!HasEnded()) {
        PostMessageW(window_, WM_COMMAND, IDCANCEL, 0);
    }
    thread_.join();
}

void DialogRun::Run() {
    RegisterDialogClass();
    CWendlowDlg dialog;
    dialog.DoModal();
    ended_ = true;
    EXPECT_TRUE(WaitUntil([&] { return !dialog.HasRunningWorker(); }));
}

Lines DialogRun::Log() const {
    HWND list = Item(IDC_SYNC_LOG);
    Lines lines(static_cast<std::size_t>(SendMessageW(list, LB_GETCOUNT, 0, 0)));
    for (WPARAM line = 0; line < lines.size(); ++line) {
        wchar_t text[512] = {};
        SendMessageW(list, LB_GETTEXT, line, reinterpret_cast<LPARAM>(text));
        lines[line] = text;
    }
    return lines;
}

bool DialogRun::IsBarVisible() const {
    return IsWindowVisible(Item(IDC_SYNC_PROGRESS)) != FALSE;
}

LRESULT DialogRun::BarMaximum() const {
    return SendMessageW(Item(IDC_SYNC_PROGRESS), PBM_GETRANGE, FALSE, 0);
}

std::ptrdiff_t DialogRun::Completions() const {
    const Lines log = Log();
    return std::count(log.begin(), log.end(), kComplete);
}

void DialogRun::Synchronize() const {
    const std::ptrdiff_t before = Completions();
    Press(IDC_SYNC_START);
    ASSERT_TRUE(WaitUntil([this] { return Text(IDC_SYNC_STATUS) == kComplete && !IsBarVisible(); }));
    ASSERT_EQ(Completions(), before + 1);
}

HWND FileView() {
    HWND view = FindWindowW(L"#32770", L"File Transfer - Copy From");
    return view != nullptr && IsWindowVisible(view) ? view : nullptr;
}

void SyncTest::SetUp() {
    MakeFolder(OnDevice(L""));
    Setting(L"SyncPath_DT", pc_.Path() + L"\\");
    Setting(L"SyncPath_CE", L"\\Jobs\\");
    for (const FileType& type : kFileTypes) {
        Setting(ResourceString(type.setting), L"1");
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

void SyncTest::PutNewerOnPc(const std::wstring& name) const {
    PutOnPc(name, "newer", AddSeconds(noon_, 60));
    PutOnDevice(name, "older", noon_);
}

void SyncTest::PutManyOnPc(int count) const {
    for (int i = 0; i < count; ++i) {
        PutOnPc(L"new_" + std::to_wstring(i) + L".qvj", "content", noon_);
    }
}

}  // namespace orvane::testing
