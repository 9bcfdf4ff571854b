#include "transfer/transfer_dialog.h"

#include <algorithm>
#include <utility>

#include "device/clock_check.h"
#include "device/connect.h"
#include "platform/paths.h"
#include "platform/text_case.h"
#include "qelutils/xlate.h"
#include "res/ids.h"
#include "settings/options_dialog.h"
#include "transfer/copy_progress.h"
#include "transfer/job_folders.h"
#include "transfer/selected_copy.h"
#include "ui/waiting.h"

namespace orvane {

namespace {

struct Column {
    qel_text::TextKey title;
    int width;  // Pixels at 100 %.
};
constexpr std::array<Column, 3> kColumns = {
    {{XlateKey(L"File Name"), 300}, {XlateKey(L"Date"), 130}, {XlateKey(L" "), 20}}};

// A kind that needs an extra value, whatever it is.
constexpr DWORD kColumnWithExtra = 0x2;
constexpr INT_PTR kExtra = 1;

void InsertColumn(HWND list, int index, const Column& column) {
    std::wstring title = Xlate(column.title);
    LVCOLUMNW item{};
    item.mask = LVCF_FMT | LVCF_WIDTH | LVCF_TEXT;
    item.fmt = LVCFMT_LEFT;
    item.cx = ui::Scaled(column.width, ui::DpiOf(list));
    item.pszText = title.data();
    SendMessageW(list, LVM_INSERTCOLUMNW, static_cast<WPARAM>(index), reinterpret_cast<LPARAM>(&item));
}

void InsertTab(HWND tabs, int index, qel_text::TextKey text) {
    std::wstring title = Xlate(text);
    TCITEMW item{};
    item.mask = TCIF_TEXT;
    item.pszText = title.data();
    SendMessageW(tabs, TCM_INSERTITEMW, static_cast<WPARAM>(index), reinterpret_cast<LPARAM>(&item));
}

bool SameFolder(std::wstring_view a, std::wstring_view b) {
    return EqualIgnoringCase(WithoutTrailingBackslashes(a), WithoutTrailingBackslashes(b));
}

}  // namespace

CCeFileTransfDlg::CCeFileTransfDlg(const SyncSettingsBlock& settings, bool date_check_done, HWND parent)
    : ui::Dialog(IDD_TRANSFER, parent),
      settings_(SettingsOf(settings)),
      date_check_done_(date_check_done),
      pages_{Page{.list_id = IDC_TRANSFER_PC_LIST,
                  .from_id = IDC_TRANSFER_PC_FROM,
                  .folder_id = IDC_TRANSFER_PC_FOLDER,
                  .all_id = IDC_TRANSFER_PC_ALL},
             Page{.list_id = IDC_TRANSFER_DEVICE_LIST,
                  .from_id = IDC_TRANSFER_DEVICE_FROM,
                  .folder_id = IDC_TRANSFER_DEVICE_FOLDER,
                  .all_id = IDC_TRANSFER_DEVICE_ALL}} {}

void CCeFileTransfDlg::DoDataExchange(ui::DataExchange& exchange) {
    for (Page& page : pages_) {
        exchange.Check(page.all_id, page.all_ticked);
    }
}

bool CCeFileTransfDlg::OnInitDialog() {
    UpdateData(true);
    for (Page& page : pages_) {
        SetUpList(page);
    }
    // Meant for the PC's list alone; text columns of this kind look like all others.
    pages_[kPcPage].list.SetColumnKind(0, kColumnWithExtra, kExtra);
    pages_[kPcPage].list.SetColumnKind(1, kColumnWithExtra, kExtra);
    ShowFolders();
    SetUpTabs();
    if (!IsWindowVisible(Parent())) {
        ShowInTaskBar();
    }
    const Busy busy(*this);
    ShowPainted();
    if (!date_check_done_) {
        const ui::WaitCursor wait;
        if (CheckDeviceDateTimeForFileView(Handle(), device_tree_.StopEvent()) == 0) {
            End(0);
            return true;
        }
    }
    OnRefresh();
    return true;
}

void CCeFileTransfDlg::OnCancel() {
    if (!busy_) {
        Dialog::OnCancel();
    }
}

bool CCeFileTransfDlg::OnKey(UINT key) {
    const bool with_control = GetKeyState(VK_CONTROL) < 0;
    if (key == VK_F5 && !with_control) {
        OnClicked(IDC_TRANSFER_REFRESH);
        return true;
    }
    if (key == 'A' && with_control) {
        OnTickPage();
        return true;
    }
    return false;
}

// The dialog is the program's only window, and has the button and icon that its owner would have.
void CCeFileTransfDlg::ShowInTaskBar() {
    SetWindowLongPtrW(Handle(), GWL_EXSTYLE, GetWindowLongPtrW(Handle(), GWL_EXSTYLE) | WS_EX_APPWINDOW);
    icons_.Set(Handle(), IDI_APPLICATION_ICON);
}

void CCeFileTransfDlg::SetUpList(Page& page) {
    HWND list = Item(page.list_id);
    for (std::size_t column = 0; column < kColumns.size(); ++column) {
        InsertColumn(list, static_cast<int>(column), kColumns[column]);
    }
    page.list.Attach(list);
    page.list.SetItems(page.candidates);
    page.list.SetColumnCount(kColumns.size());
    page.list.SetSortEnabled(true);
    page.list.SetColumnKind(2, kColumnCheckBox);
    page.list.SetNotifyWindow(Handle());
}

void CCeFileTransfDlg::SetUpTabs() {
    tabs_.Attach(Item(IDC_TRANSFER_TABS));
    // The item that is at its place already moves on.
    InsertTab(tabs_.Handle(), 0, XlateKey(L"Mobile Device"));
    InsertTab(tabs_.Handle(), 0, XlateKey(L"PC"));
    for (const int number : {kDevicePage, kPcPage}) {
        const Page& page = pages_[static_cast<std::size_t>(number)];
        for (const int id : {page.list_id, page.from_id, page.folder_id, page.all_id, IDC_TRANSFER_COPY}) {
            tabs_.AttachControlToTab(Item(id), number);
        }
    }
    tabs_.SetCurSel(kPcPage);
    current_page_ = kPcPage;
    tabs_.SetNotifyWindow(Handle());
}

void CCeFileTransfDlg::ShowFolders() {
    SetDlgItemTextW(Handle(), IDC_TRANSFER_PC_FOLDER, settings_.sync_path_dt.c_str());
    SetDlgItemTextW(Handle(), IDC_TRANSFER_DEVICE_FOLDER, settings_.sync_path_ce.c_str());
}

bool CCeFileTransfDlg::OnClicked(int id) {
    if (busy_) {
        return true;
    }
    switch (id) {
        case IDC_TRANSFER_REFRESH:
            UpdateData(true);
            OnRefresh();
            return true;
        case IDC_TRANSFER_SETTINGS:
            OnSettings();
            return true;
        case IDC_TRANSFER_COPY:
            OnCopySelected();
            return true;
        case IDC_TRANSFER_COPY_ALL:
            OnCopyAll(/*ticked_only=*/true);
            return true;
        case IDC_TRANSFER_SYNCHRONIZE:
            OnCopyAll(/*ticked_only=*/false);
            return true;
        case IDC_TRANSFER_PC_ALL:
            OnSelectAll(pages_[kPcPage]);
            return true;
        case IDC_TRANSFER_DEVICE_ALL:
            OnSelectAll(pages_[kDevicePage]);
            return true;
        case IDC_TRANSFER_CLOSE:
            UpdateData(true);
            OnCancel();
            return true;
        default:
            return false;
    }
}

std::optional<LRESULT> CCeFileTransfDlg::OnMessage(UINT message, WPARAM wparam, LPARAM lparam) {
    switch (message) {
        case kTabPageChanged:
            OnPageChanged(static_cast<int>(lparam));
            return 0;
        case kListDoubleClick:
            OnListDoubleClick(reinterpret_cast<HWND>(lparam));
            return 0;
        case kListItemsDrawn:
            OnListItemsDrawn(reinterpret_cast<HWND>(lparam));
            return 0;
        case kListingReady:
            if (wparam != 0 || !ready_listing_) {
                return std::nullopt;
            }
            OnListingReady(lparam == 0 ? kDevicePage : kPcPage);
            return 0;
        case WM_DPICHANGED:
            if (icons_.Big() != nullptr) {
                icons_.Set(Handle(), IDI_APPLICATION_ICON);
            }
            return std::nullopt;
        case WM_SYSCOLORCHANGE:
            // Top-level windows alone are told.
            for (HWND control : {tabs_.Handle(), pages_[0].list.Handle(), pages_[1].list.Handle()}) {
                SendMessageW(control, message, wparam, lparam);
            }
            return std::nullopt;
        default:
            return std::nullopt;
    }
}

void CCeFileTransfDlg::OnRefresh() {
    const Busy busy(*this);
    const ui::WaitCursor wait;
    for (Page& page : pages_) {
        page.candidates.clear();
        page.list.SetItems(page.candidates);
    }
    // What the buttons show goes with the empty lists until others are delivered.
    OnPageChanged(current_page_);
    ReadListings();
    for (const int id : {IDC_TRANSFER_REFRESH, IDC_TRANSFER_SETTINGS, IDC_TRANSFER_CLOSE}) {
        EnableItem(id, true);
    }
    EnableItem(IDC_TRANSFER_COPY_ALL, false);
    EnableItem(IDC_TRANSFER_SYNCHRONIZE, AnyCandidates());
    UpdateData(false);
}

// The lists stay empty when a folder was not read, which the user has been told, or when the user wanted to
// leave: the dialog ends then.
void CCeFileTransfDlg::ReadListings() {
    Comparison comparison = {.types = settings_.types, .overwrite_old_files = settings_.overwrite_old_files};
    std::vector<sFileDate> from_pc;
    std::vector<sFileDate> from_device;
    const auto build = [&] {
        BuildCandidates(comparison, comparison.pc, comparison.device, from_pc);
        BuildCandidates(comparison, comparison.device, comparison.pc, from_device);
    };
    const ui::Waited waited =
        ReadJobFolders(Handle(), settings_, device_tree_, XlateKey(L"Failed to read from remote device."),
                       comparison.pc, comparison.device, build);
    ShowFolders();
    if (waited != ui::Waited::kDone) {
        if (waited == ui::Waited::kClosed) {
            Dialog::OnCancel();
        }
        return;
    }
    ready_listing_ = std::move(from_pc);
    SendMessageW(Handle(), kListingReady, 0, 1);
    ready_listing_ = std::move(from_device);
    SendMessageW(Handle(), kListingReady, 0, 0);
}

void CCeFileTransfDlg::OnListingReady(int number) {
    Page& page = pages_[static_cast<std::size_t>(number)];
    // The list must not hold on to entries that are about to end.
    std::vector<sFileDate> none;
    page.list.SetItems(none);
    page.candidates = std::move(*ready_listing_);
    ready_listing_.reset();
    page.list.SetItems(page.candidates);
    OnPageChanged(static_cast<int>(SendMessageW(tabs_.Handle(), TCM_GETCURSEL, 0, 0)));
    InvalidateRect(Handle(), nullptr, TRUE);
}

void CCeFileTransfDlg::OnPageChanged(int number) {
    if (number != kPcPage && number != kDevicePage) {
        return;
    }
    current_page_ = number;
    Page& page = pages_[static_cast<std::size_t>(number)];
    SetDlgItemTextW(Handle(), IDC_TRANSFER_COPY,
                    Xlate(number == kPcPage ? XlateKey(L"Copy Selected File(s) from PC to Device")
                                            : XlateKey(L"Copy Selected File(s) from Device to PC"))
                        .c_str());
    // Which of the entries are ticked counts as soon as the list has been drawn.
    const bool has_items = page.list.ItemCount() > 0;
    EnableItem(IDC_TRANSFER_COPY, has_items);
    EnableItem(page.all_id, has_items);
    if (!has_items) {
        page.all_ticked = false;
        UpdateData(false);
    }
    EnableItem(IDC_TRANSFER_SYNCHRONIZE, AnyCandidates());
}

void CCeFileTransfDlg::OnListDoubleClick(HWND list) {
    Page* page = PageOfList(list);
    if (page == nullptr || busy_) {
        return;
    }
    UpdateData(true);
    const auto selected = static_cast<int>(
        SendMessageW(list, LVM_GETNEXTITEM, static_cast<WPARAM>(-1), MAKELPARAM(LVNI_SELECTED, 0)));
    page->list.FlipTick(selected);
    UpdateData(false);
}

// Comes once for each round of painting, also after every change of a tick. It may come late: for a page
// that is no longer shown, or whose entries have all been copied since. Then it says nothing about what is
// on the screen.
void CCeFileTransfDlg::OnListItemsDrawn(HWND list) {
    const Page* drawn = PageOfList(list);
    if (drawn == nullptr || drawn != &pages_[static_cast<std::size_t>(current_page_)] ||
        drawn->list.ItemCount() == 0) {
        return;
    }
    UpdateData(true);
    for (Page& page : pages_) {
        page.all_ticked = page.AllTicked();
    }
    EnableItem(IDC_TRANSFER_COPY, drawn->HasTicked());
    if (pages_[kPcPage].HasTicked() || pages_[kDevicePage].HasTicked()) {
        EnableItem(IDC_TRANSFER_COPY_ALL, true);
    }
    UpdateData(false);
}

void CCeFileTransfDlg::OnSelectAll(Page& page) {
    UpdateData(true);
    page.list.TickAll(page.all_ticked);
}

// As a press on the box "Select all file(s)" of the page that is shown.
void CCeFileTransfDlg::OnTickPage() {
    Page& page = pages_[static_cast<std::size_t>(current_page_)];
    if (!busy_ && page.list.ItemCount() > 0) {
        page.all_ticked = true;
        UpdateData(false);
        OnSelectAll(page);
    }
}

void CCeFileTransfDlg::OnSettings() {
    SyncSettings changed = settings_;
    if (!RunOptions(changed)) {
        return;
    }
    const bool other_folders = !SameFolder(changed.sync_path_dt, settings_.sync_path_dt) ||
                               !SameFolder(changed.sync_path_ce, settings_.sync_path_ce);
    settings_ = std::move(changed);
    ShowFolders();
    if (other_folders) {
        OnRefresh();
    }
}

bool CCeFileTransfDlg::RunOptions(SyncSettings& settings) {
    const auto saved = orvane::RunOptions(Handle(), RefreshSettingsBlock(settings));
    settings = saved.value_or(settings);
    return saved.has_value();
}

void CCeFileTransfDlg::OnCopySelected() {
    if (current_page_ != kPcPage && current_page_ != kDevicePage) {
        return;
    }
    UpdateData(true);
    {
        const Busy busy(*this);
        const ui::WaitCursor wait;
        CopyFiles(current_page_, Chosen(pages_[static_cast<std::size_t>(current_page_)], true),
                  /*more_follows=*/false);
    }
    EnableItem(IDC_TRANSFER_COPY_ALL, AnyCandidates());
    UpdateData(false);
}

void CCeFileTransfDlg::OnCopyAll(bool ticked_only) {
    const Busy busy(*this);
    const ui::WaitCursor wait;
    std::vector<sFileDate> from_pc = Chosen(pages_[kPcPage], ticked_only);
    std::vector<sFileDate> from_device = Chosen(pages_[kDevicePage], ticked_only);
    if (CopyFiles(kPcPage, std::move(from_pc), /*more_follows=*/!from_device.empty())) {
        CopyFiles(kDevicePage, std::move(from_device), /*more_follows=*/false);
    }
    EnableItem(IDC_TRANSFER_COPY_ALL, AnyCandidates());
    if (!AnyCandidates()) {
        EnableItem(IDC_TRANSFER_SYNCHRONIZE, false);
    }
}

// In the order in which the list shows the entries.
std::vector<sFileDate> CCeFileTransfDlg::Chosen(const Page& page, bool ticked_only) const {
    std::vector<sFileDate> files;
    const int count = page.list.ItemCount();
    for (int index = 0; index < count; ++index) {
        const SortedListRecord* record = page.list.RecordAt(index);
        if (record != nullptr && (record->ticked || !ticked_only)) {
            files.push_back(static_cast<const sFileDate&>(*record));
        }
    }
    return files;
}

// Copies the files of one page to the other side. False when nothing may follow: the device is gone, or the
// user does not want more. A stop question that is still open is waited for, but only if something follows.
bool CCeFileTransfDlg::CopyFiles(int number, std::vector<sFileDate> files, bool more_follows) {
    if (files.empty()) {
        return true;
    }
    DeviceSession session(device_tree_.StopEvent());
    if (!session) {
        TellEnd(XlateKey(L"Communication Error."));
        return false;
    }
    Page& page = pages_[static_cast<std::size_t>(number)];
    const auto direction = static_cast<Direction>(number);
    CopyProgress progress(direction);
    const CancelEvent stop(device_tree_.StopEvent());
    const TransferOutcome outcome = CopySelectedFiles(
        {.direction = direction,
         .folders = {settings_.sync_path_dt, settings_.sync_path_ce},
         .files = std::move(files),
         .warn_before_replacing = settings_.overwrite_warn,
         .companions = {.overwrite_old_files = settings_.overwrite_old_files, .own_rows = settings_.types},
         .stop = stop},
        progress);
    // Before anything can paint the list, which shows the entries where they lie.
    RemoveCandidates(page.candidates, outcome.copied);
    page.list.SetItems(page.candidates);
    ui::DropPendingInput();
    if (outcome.disk_full) {
        TellEnd(direction == Direction::kPcToDevice ? XlateKey(L"Device Disk Full!")
                                                    : XlateKey(L"PC Disk Full!"));
    } else if (outcome.connection_lost) {
        TellEnd(XlateKey(L"Communication Error."));
    }
    bool go_on = !outcome.connection_lost;
    if (go_on && more_follows) {
        go_on = progress.MayGoOn();
        ui::DropPendingInput();  // What came while the question was open.
    }
    progress.Close();
    session.Close();
    FinishCopy(page);
    return go_on;
}

// Why a copy came to its end ahead of time.
void CCeFileTransfDlg::TellEnd(qel_text::TextKey text) {
    // The progress window, which belongs to another thread, would cover the box.
    SetForegroundWindow(Handle());
    ui::ShowMessageBox(Handle(), Xlate(text), MB_OK | MB_ICONINFORMATION, Xlate(L"Copying File"));
}

void CCeFileTransfDlg::FinishCopy(Page& page) {
    const bool has_items = page.list.ItemCount() > 0;
    if (&page == &pages_[static_cast<std::size_t>(current_page_)]) {
        EnableItem(IDC_TRANSFER_COPY, has_items);
    }
    EnableItem(page.all_id, has_items);
    if (!has_items) {
        page.all_ticked = false;
    }
    UpdateData(false);
}

bool CCeFileTransfDlg::AnyCandidates() const {
    return std::any_of(pages_.begin(), pages_.end(),
                       [](const Page& page) { return !page.candidates.empty(); });
}

CCeFileTransfDlg::Page* CCeFileTransfDlg::PageOfList(HWND list) {
    const auto page = std::find_if(pages_.begin(), pages_.end(),
                                   [list](const Page& each) { return each.list.Handle() == list; });
    return list == nullptr || page == pages_.end() ? nullptr : &*page;
}

void CCeFileTransfDlg::EnableItem(int id, bool enable) {
    HWND item = Item(id);
    if (!enable && item == GetFocus()) {
        SendMessageW(Handle(), WM_NEXTDLGCTL, 0, FALSE);
    }
    EnableWindow(item, enable);
}

}  // namespace orvane
