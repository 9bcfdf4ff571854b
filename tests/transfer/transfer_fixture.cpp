#include "tests/transfer/transfer_fixture.h"

#include <commctrl.h>

#include <algorithm>

#include "transfer/transfer_dialog.h"

namespace orvane::testing {

namespace {

constexpr ULONGLONG kPatienceMs = 30'000;

class TestedDialog : public CCeFileTransfDlg {
  public:
    TestedDialog(const SyncSettingsBlock& settings, bool date_check_done,
                 const std::function<bool(SyncSettingsBlock&)>& options, std::atomic<HWND>& opened)
        : CCeFileTransfDlg(settings, date_check_done, nullptr), options_(options), opened_(opened) {}

  protected:
    bool OnInitDialog() override {
        const bool set_focus = CCeFileTransfDlg::OnInitDialog();
        opened_ = Handle();
        return set_focus;
    }
    bool RunOptions(SyncSettingsBlock& settings) override { return options_(settings); }

  private:
    const std::function<bool(SyncSettingsBlock&)>& options_;
    std::atomic<HWND>& opened_;
};

}  // namespace

TransferRun::TransferRun(const SyncSettingsBlock& settings, bool date_check_done,
                         std::function<bool(SyncSettingsBlock&)> options)
    : thread_([=, this] { Run(settings, date_check_done, options); }) {
    WaitUntil([this] { return HasEnded() || window_ != nullptr; });
}

TransferRun::~TransferRun() {
    Result();
}

INT_PTR TransferRun::Result() {
    if (thread_.joinable()) {
        if (!HasEnded()) {
            PressAndGoOn(IDC_TRANSFER_CLOSE);
        }
        thread_.join();
    }
    return result_;
}

void TransferRun::Run(const SyncSettingsBlock& settings, bool date_check_done,
                      const std::function<bool(SyncSettingsBlock&)>& options) {
    const INITCOMMONCONTROLSEX controls = {sizeof(INITCOMMONCONTROLSEX), ICC_WIN95_CLASSES};
    InitCommonControlsEx(&controls);
    TestedDialog dialog(settings, date_check_done, options, window_);
    result_ = dialog.DoModal();
    ended_ = true;
}

std::wstring TransferRun::Text(int id) const {
    wchar_t text[512] = {};
    SendMessageW(Item(id), WM_GETTEXT, std::size(text), reinterpret_cast<LPARAM>(text));
    return text;
}

Names TransferRun::Column(int list_id, int column) const {
    Names texts;
    const LRESULT count = SendMessageW(Item(list_id), LVM_GETITEMCOUNT, 0, 0);
    for (LRESULT row = 0; row < count; ++row) {
        wchar_t text[512] = {};
        LVITEMW item{};
        item.iSubItem = column;
        item.pszText = text;
        item.cchTextMax = static_cast<int>(std::size(text));
        SendMessageW(Item(list_id), LVM_GETITEMTEXTW, static_cast<WPARAM>(row),
                     reinterpret_cast<LPARAM>(&item));
        texts.emplace_back(text);
    }
    return texts;
}

void TransferRun::Press(int id) const {
    SendMessageW(Item(id), BM_CLICK, 0, 0);
}

void TransferRun::PressAndGoOn(int id) const {
    PostMessageW(window_, WM_COMMAND, MAKEWPARAM(id, BN_CLICKED), reinterpret_cast<LPARAM>(Item(id)));
}

void TransferRun::Tick(int list_id, const std::wstring& name) const {
    const Names names = Column(list_id);
    const auto row = std::find(names.begin(), names.end(), name) - names.begin();
    ASSERT_LT(row, std::ssize(names)) << "not listed";
    LVITEMW item{};
    item.state = item.stateMask = LVIS_SELECTED | LVIS_FOCUSED;
    SendMessageW(Item(list_id), LVM_SETITEMSTATE, static_cast<WPARAM>(row), reinterpret_cast<LPARAM>(&item));
    SendMessageW(Item(list_id), WM_KEYDOWN, VK_SPACE, 1);
}

void TransferRun::SelectPage(int page) const {
    HWND tabs = Item(IDC_TRANSFER_TABS);
    SendMessageW(tabs, TCM_SETCURFOCUS, static_cast<WPARAM>(page), 0);
    EXPECT_TRUE(WaitUntil([&] {
        return Text(IDC_TRANSFER_COPY).ends_with(page == 0 ? L"from PC to Device" : L"from Device to PC");
    }));
}

bool TransferRun::WaitUntil(const std::function<bool()>& condition) {
    const ULONGLONG end = GetTickCount64() + kPatienceMs;
    while (!condition()) {
        if (GetTickCount64() >= end) {
            return false;
        }
        Sleep(5);
    }
    return true;
}

HWND ProgressWindow() {
    HWND found = nullptr;
    EnumWindows(
        [](HWND window, LPARAM result) -> BOOL {
            DWORD process = 0;
            GetWindowThreadProcessId(window, &process);
            const bool is_progress = process == GetCurrentProcessId() && IsWindowVisible(window) &&
                                     GetDlgItem(window, IDC_COPY_CANCEL) != nullptr;
            if (is_progress) {
                *reinterpret_cast<HWND*>(result) = window;
            }
            return !is_progress;
        },
        reinterpret_cast<LPARAM>(&found));
    return found;
}

TransferTest::TransferTest() {
    MakeFolder(OnDevice(L""));
    SyncSettings settings;
    settings.sync_path_dt = pc_.Path() + L"\\";
    settings.sync_path_ce = L"\\Jobs\\";
    settings.overwrite_old_files = 1;
    for (auto flag :
         {&SyncSettings::sync_qvj_files, &SyncSettings::sync_tn3_files, &SyncSettings::sync_jpg_files,
          &SyncSettings::sync_wkf_files, &SyncSettings::sync_txt_files}) {
        settings.*flag = 1;
    }
    RefreshSettingsBlock(settings, settings_);
}

void TransferTest::PutOnPc(const std::wstring& name, int seconds) const {
    WriteTextFile(OnPc(name), "from the PC", AddSeconds(noon_, seconds));
}

void TransferTest::PutOnDevice(const std::wstring& name, int seconds) const {
    WriteTextFile(OnDevice(name), "from the device", AddSeconds(noon_, seconds));
}

}  // namespace orvane::testing
