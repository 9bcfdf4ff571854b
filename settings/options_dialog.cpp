#include "settings/options_dialog.h"

#include <algorithm>

#include "browse/browse_dialog.h"
#include "browse/folder_dialog.h"
#include "qelutils/xlate.h"
#include "res/ids.h"

namespace orvane {

namespace {

// What a click on a type's box does to "All files.": the box of the type `read`, unticked, clears it; ticked
// together with all others but the `overlooked`, it ticks it.
struct AllFilesRule {
    std::size_t read;
    FileTypes overlooked;
};

// That the boxes differ is meant: the bitmaps' does nothing, those behind it overlook the bitmaps, and the
// one for ".txt" looks at the ".wkf" box in place of itself.
std::optional<AllFilesRule> RuleOf(std::size_t clicked) {
    constexpr std::size_t kBmp = RowOfType(L".bmp");
    constexpr std::size_t kTxt = RowOfType(L".txt");
    if (clicked == kBmp) {
        return std::nullopt;
    }
    const std::size_t read = clicked == kTxt ? RowOfType(L".wkf") : clicked;
    return AllFilesRule{read, FileTypes().set(kBmp, clicked > kBmp).set(kTxt, clicked == kTxt)};
}

// Matches no file, so that only folders are listed.
constexpr const wchar_t* kNoFilePattern = L"*.asdfdfsasdf";

SyncSettings InitialValues(const SyncSettingsBlock& block) {
    SyncSettings values = SettingsOf(block);
    values.overwrite_warn &= values.overwrite_old_files;
    values.overwrite_bkp &= values.overwrite_old_files;
    values.start_file_view = ReadStartFileView();
    return values;
}

}  // namespace

COptionsDlg::COptionsDlg(const SyncSettingsBlock& block, HWND parent)
    : Dialog(IDD_OPTIONS, parent),
      values_(InitialValues(block)),
      auto_start_at_start_(ReadAutoStart()),
      auto_start_(auto_start_at_start_) {}

void COptionsDlg::DoDataExchange(ui::DataExchange& exchange) {
    exchange.Text(IDC_OPTIONS_PC_FOLDER, values_.sync_path_dt);
    exchange.Text(IDC_OPTIONS_DEVICE_FOLDER, values_.sync_path_ce);
    for (std::size_t row = 0; row < kFileTypes.size(); ++row) {
        bool takes_part = values_.types[row];
        exchange.Check(kFileTypes[row].box, takes_part);
        values_.types[row] = takes_part;
    }
    for (const FlagSetting& setting : kFlagSettings) {
        exchange.Check(setting.box, values_.*setting.flag);
    }
    exchange.Check(IDC_OPTIONS_AUTO_START, auto_start_);
}

bool COptionsDlg::OnInitDialog() {
    SendMessageW(Item(IDC_OPTIONS_PC_FOLDER), EM_LIMITTEXT, kMaxPcFolderChars, 0);
    SendMessageW(Item(IDC_OPTIONS_DEVICE_FOLDER), EM_LIMITTEXT, kMaxDeviceFolderChars, 0);
    EnableOverwriteBoxes();
    return true;
}

void COptionsDlg::OnCancel() {
    auto_start_ = auto_start_at_start_;
    Dialog::OnCancel();
}

bool COptionsDlg::OnClicked(int id) {
    switch (id) {
        case IDC_OPTIONS_DEVICE_BROWSE:
            OnBrowseDevice();
            return true;
        case IDC_OPTIONS_PC_BROWSE:
            OnBrowsePc();
            return true;
        case IDC_OPTIONS_SELECT_ALL:
            UpdateData(true);  // Showing the values must not undo what was typed.
            TickAllTypes(true);
            return true;
        case IDC_OPTIONS_ALL_FILES:
            UpdateData(true);
            TickAllTypes(values_.all_files);
            return true;
        case IDC_OPTIONS_OVERWRITE:
            OnOverwrite();
            return true;
        default:
            return OnTypeBox(id);
    }
}

bool COptionsDlg::OnTypeBox(int id) {
    const auto type = std::ranges::find(kFileTypes, id, &FileType::box);
    if (type == kFileTypes.end()) {
        return false;
    }
    const auto rule = RuleOf(static_cast<std::size_t>(type - kFileTypes.begin()));
    if (!rule) {
        return false;
    }
    UpdateData(true);
    if (!values_.types[rule->read]) {
        values_.all_files = false;
    } else if ((values_.types | rule->overlooked).all()) {
        values_.all_files = true;
    }
    UpdateData(false);
    return true;
}

void COptionsDlg::TickAllTypes(bool tick) {
    values_.types = tick ? FileTypes().set() : FileTypes();
    UpdateData(false);
}

void COptionsDlg::OnOverwrite() {
    UpdateData(true);
    values_.overwrite_bkp &= values_.overwrite_old_files;  // The warn box keeps its tick.
    EnableOverwriteBoxes();
    UpdateData(false);
}

void COptionsDlg::EnableOverwriteBoxes() {
    const BOOL enable = values_.overwrite_old_files;
    EnableWindow(Item(IDC_OPTIONS_WARN), enable);
    EnableWindow(Item(IDC_OPTIONS_BACKUP), enable);
}

void COptionsDlg::OnBrowseDevice() {
    UpdateData(true);
    CCeBrowseDlg browser(1, 0, {kNoFilePattern}, Xlate(L"Mobile Device Browse"), values_.sync_path_ce,
                         Handle());
    // Nothing is chosen where the device could not be read: the field stays as it was then.
    if (browser.DoModal() == IDOK && !browser.ResultFolder().empty()) {
        values_.sync_path_ce = browser.ResultFolder();
    }
    UpdateData(false);
}

// The control values are not taken first: what was typed since the last exchange gives way to the members
// when the chosen folder is shown. That is meant.
void COptionsDlg::OnBrowsePc() {
    CFolderDialog chooser(values_.sync_path_dt, values_.sync_path_dt, 1, L"", nullptr);
    chooser.SetChosenDirectory(values_.sync_path_dt);
    if (chooser.DoModal() == IDOK) {
        values_.sync_path_dt = chooser.Chosen().folder;
        UpdateData(false);
    }
}

std::optional<SyncSettings> RunOptions(HWND owner, const SyncSettingsBlock& block) {
    COptionsDlg dialog(block, owner);
    std::optional<SyncSettings> saved;
    if (dialog.DoModal() == IDOK) {
        saved = dialog.Values();
        SaveSettings(*saved);
    }
    WriteAutoStart(dialog.AutoStart(), owner);
    return saved;
}

}  // namespace orvane
