#include "transfer/copy_progress_dialog.h"

#include "qelutils/text_format.h"
#include "qelutils/xlate.h"
#include "res/ids.h"

namespace orvane {

CCeShwCopyFileDlg::CCeShwCopyFileDlg(CopyDirection direction)
    : ui::Dialog(IDD_COPY_PROGRESS), direction_(direction), ready_(NewManualResetEvent()) {}

bool CCeShwCopyFileDlg::OnInitDialog() {
    SetForegroundWindow(Handle());
    SetEvent(ready_.Get());
    return true;
}

bool CCeShwCopyFileDlg::OnClicked(int id) {
    if (id == IDC_COPY_CANCEL) {
        OnStop();
        return true;
    }
    return false;
}

std::optional<LRESULT> CCeShwCopyFileDlg::OnMessage(UINT message, WPARAM wparam, LPARAM lparam) {
    switch (message) {
        case kCopySetText:
            SetDlgItemTextW(Handle(), static_cast<int>(wparam), reinterpret_cast<const wchar_t*>(lparam));
            return 0;
        case kCopySetCount:
            OnSetCount(static_cast<int>(wparam), static_cast<int>(lparam));
            return 0;
        case kCopyClose:
            OnClose();
            return 0;
        case kCopyAskReplace:
            return OnAskReplace(reinterpret_cast<const wchar_t*>(lparam)) ? 1 : 0;
        default:
            return std::nullopt;
    }
}

// The file in hand is copied to its end whatever is answered: the state is looked at between files only.
void CCeShwCopyFileDlg::OnStop() {
    if (stop_state_ != StopState::kRunning) {
        return;
    }
    stop_state_ = StopState::kAsking;
    const int answer = ui::ShowMessageBox(Handle(), Xlate(L"Would you like to stop the file copy?"),
                                          MB_YESNO | MB_ICONQUESTION, Xlate(L"Copying File"));
    if (answer == IDYES) {
        stop_state_ = StopState::kStopped;
        End(0);
    } else {
        stop_state_ = StopState::kRunning;
    }
}

void CCeShwCopyFileDlg::OnSetCount(int index, int count) {
    SetWindowTextW(Handle(), CopyProgressTitle(index + 1, count, direction_).c_str());
}

bool CCeShwCopyFileDlg::OnAskReplace(const std::wstring& question) {
    return ui::ShowMessageBox(Handle(), question,
                              MB_OKCANCEL | MB_ICONQUESTION | MB_DEFBUTTON2 | MB_SYSTEMMODAL,
                              Xlate(L"Synchronization - Warning")) != IDCANCEL;
}

// The stop question may still be open when the last file is done. Its answer no longer matters (who has more
// to copy has waited for it), and as long as it is open the thread cannot end: it is taken away.
void CCeShwCopyFileDlg::OnClose() {
    if (HWND popup = GetLastActivePopup(Handle()); popup != nullptr && popup != Handle()) {
        EndDialog(popup, IDNO);
    }
    End(0);
}

std::wstring CopyProgressTitle(int number, int count, CopyDirection direction) {
    const bool to_pc = direction == CopyDirection::kDeviceToPc;
    const std::wstring direction_text =
        Xlate(to_pc ? XlateKey(L"From Device to PC") : XlateKey(L"From PC to Device"));
    // The doubled brace stands for one; the single one at the end stays as it is.
    return qel_text::detail::qel_safefmt_impl(
        // Translators: file {1} of {2}, {3} is the direction; the braces around it all are meant.
        Xlate(L"{{Copying File {1}/{2}  - {3}}"),
        {qel_formats::IntToString(number), qel_formats::IntToString(count), direction_text});
}

}  // namespace orvane
