#include "settings/options_dialog.h"

#include <algorithm>
#include <array>

#include "browse/browse_dialog.h"
#include "browse/folder_dialog.h"
#include "qelutils/xlate.h"
#include "res/ids.h"

namespace orvane {

namespace {

using S = SyncSettings;

struct Box {
    int id;
    std::int32_t S::*flag;
};

// The type boxes in the order in which they stand in the dialog.
enum Type : unsigned { kQvj, kTn3, kRd3, kPt3, kLn3, kJpg, kBmp, kImg, kXml, kTp3, kWkf, kTxt, kTypeCount };

constexpr unsigned Bit(Type type) {
    return 1U << type;
}

constexpr unsigned kEveryType = (1U << kTypeCount) - 1;
constexpr unsigned kNoHandler = 0;

// What a click on a type box does to "All files.": the box `own`, unticked, clears it; ticked together with
// all of `required`, it ticks it. That the handlers differ, and that the one for ".txt" looks at the ".wkf"
// box, is meant.
struct TypeBox {
    Box box;
    Type own;
    unsigned required;
};

constexpr std::array<TypeBox, kTypeCount> kTypeBoxes = {{
    {{IDC_OPTIONS_QVJ, &S::sync_qvj_files}, kQvj, kEveryType},
    {{IDC_OPTIONS_TN3, &S::sync_tn3_files}, kTn3, kEveryType},
    {{IDC_OPTIONS_RD3, &S::sync_rd3_files}, kRd3, kEveryType},
    {{IDC_OPTIONS_PT3, &S::sync_pt3_files}, kPt3, kEveryType},
    {{IDC_OPTIONS_LN3, &S::sync_ln3_files}, kLn3, kEveryType},
    {{IDC_OPTIONS_JPG, &S::sync_jpg_files}, kJpg, kEveryType},
    {{IDC_OPTIONS_BMP, &S::sync_bmp_files}, kBmp, kNoHandler},
    {{IDC_OPTIONS_IMG, &S::sync_img_files}, kImg, kEveryType & ~Bit(kBmp)},
    {{IDC_OPTIONS_XML, &S::sync_xml_files}, kXml, kEveryType & ~Bit(kBmp)},
    {{IDC_OPTIONS_TP3, &S::sync_tp3_files}, kTp3, kEveryType & ~Bit(kBmp)},
    {{IDC_OPTIONS_WKF, &S::sync_wkf_files}, kWkf, kEveryType & ~Bit(kBmp)},
    {{IDC_OPTIONS_TXT, &S::sync_txt_files}, kWkf, kEveryType & ~(Bit(kBmp) | Bit(kTxt))},
}};

constexpr std::array<Box, 5> kOtherBoxes = {{
    {IDC_OPTIONS_ALL_FILES, &S::sync_all_files},
    {IDC_OPTIONS_OVERWRITE, &S::overwrite_old_files},
    {IDC_OPTIONS_WARN, &S::overwrite_warn},
    {IDC_OPTIONS_BACKUP, &S::overwrite_bkp},
    {IDC_OPTIONS_START_FILE_VIEW, &S::start_file_view},
}};

// Matches no file, so that only folders are listed.
constexpr const wchar_t* kNoFilePattern = L"*.asdfdfsasdf";

SyncSettings InitialValues(const SyncSettingsBlock& block) {
    SyncSettings values = SettingsOf(block);
    if (values.overwrite_old_files == 0) {
        values.overwrite_warn = 0;
        values.overwrite_bkp = 0;
    }
    values.start_file_view = ReadStartFileView() ? 1 : 0;
    return values;
}

}  // namespace

COptionsDlg::COptionsDlg(const SyncSettingsBlock& block, HWND parent)
    : Dialog(IDD_OPTIONS, parent),
      values_(InitialValues(block)),
      auto_start_at_start_(ReadAutoStart() ? 1 : 0),
      auto_start_(auto_start_at_start_) {}

void COptionsDlg::DoDataExchange(ui::DataExchange& exchange) {
    exchange.Text(IDC_OPTIONS_PC_FOLDER, values_.sync_path_dt);
    exchange.Text(IDC_OPTIONS_DEVICE_FOLDER, values_.sync_path_ce);
    for (const TypeBox& type : kTypeBoxes) {
        exchange.Check(type.box.id, values_.*type.box.flag);
    }
    for (const Box& box : kOtherBoxes) {
        exchange.Check(box.id, values_.*box.flag);
    }
    exchange.Check(IDC_OPTIONS_AUTO_START, auto_start_);
}

bool COptionsDlg::OnInitDialog() {
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
            TickAllTypes(1);
            return true;
        case IDC_OPTIONS_ALL_FILES:
            UpdateData(true);
            TickAllTypes(values_.sync_all_files);
            return true;
        case IDC_OPTIONS_OVERWRITE:
            OnOverwrite();
            return true;
        default:
            return OnTypeBox(id);
    }
}

bool COptionsDlg::OnTypeBox(int id) {
    const auto* type = std::find_if(kTypeBoxes.begin(), kTypeBoxes.end(),
                                    [id](const TypeBox& candidate) { return candidate.box.id == id; });
    if (type == kTypeBoxes.end() || type->required == kNoHandler) {
        return false;
    }
    UpdateData(true);
    unsigned ticked = 0;
    for (unsigned i = 0; i < kTypeCount; ++i) {
        ticked |= (values_.*kTypeBoxes[i].box.flag != 0 ? 1U : 0U) << i;
    }
    if ((ticked & Bit(type->own)) == 0) {
        values_.sync_all_files = 0;
    } else if ((ticked & type->required) == type->required) {
        values_.sync_all_files = 1;
    }
    UpdateData(false);
    return true;
}

void COptionsDlg::TickAllTypes(std::int32_t value) {
    for (const TypeBox& type : kTypeBoxes) {
        values_.*type.box.flag = value;
    }
    UpdateData(false);
}

void COptionsDlg::OnOverwrite() {
    UpdateData(true);
    if (values_.overwrite_old_files == 0) {
        values_.overwrite_bkp = 0;  // The warn box keeps its tick.
    }
    EnableOverwriteBoxes();
    UpdateData(false);
}

void COptionsDlg::EnableOverwriteBoxes() {
    const BOOL enable = values_.overwrite_old_files != 0;
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
