#include "transfer/copy_progress.h"

#include <array>

#include "qelutils/text_format.h"
#include "qelutils/xlate.h"
#include "res/ids.h"

namespace orvane {

namespace {

// How long to wait for the window to come up. Far more than a slow machine needs: it only keeps a window
// system that does not answer from holding up the copy.
constexpr DWORD kOpenLimitMs = 10'000;
constexpr DWORD kCloseLimitMs = 2'000;
constexpr DWORD kPollMs = 100;

}  // namespace

CCeShwCopyFileDlg::CCeShwCopyFileDlg(Direction direction)
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

std::wstring CopyProgressTitle(int number, int count, Direction direction) {
    const bool to_pc = direction == Direction::kDeviceToPc;
    const std::wstring direction_text =
        Xlate(to_pc ? XlateKey(L"From Device to PC") : XlateKey(L"From PC to Device"));
    // The doubled brace stands for one; the single one at the end stays as it is.
    return qel_text::detail::qel_safefmt_impl(
        // Translators: file {1} of {2}, {3} is the direction; the braces around it all are meant.
        Xlate(L"{{Copying File {1}/{2}  - {3}}"),
        {qel_formats::IntToString(number), qel_formats::IntToString(count), direction_text});
}

CopyProgress::CopyProgress(Direction direction)
    : dialog_(direction), thread_(CreateThread(nullptr, 0, Run, &dialog_, 0, nullptr)) {
    if (thread_) {
        // The thread ends at once when the dialog cannot be created.
        const std::array<HANDLE, 2> events = {dialog_.ReadyEvent(), thread_.Get()};
        WaitForMultipleObjects(static_cast<DWORD>(events.size()), events.data(), FALSE, kOpenLimitMs);
    }
}

CopyProgress::~CopyProgress() {
    Close();
    if (thread_ && WaitForSingleObject(thread_.Get(), kCloseLimitMs) != WAIT_OBJECT_0) {
        // The dialog object goes with this one, so its thread must not run on. A thread that is ended by
        // force inside the window system may hold one of its locks, which is why it got the time to end by
        // itself.
        TerminateThread(thread_.Get(), 0);
        // Ends because a thread that is being terminated runs no further code.
        WaitForSingleObject(thread_.Get(), INFINITE);
    }
}

DWORD WINAPI CopyProgress::Run(void* dialog) noexcept {
    constexpr DWORD kExitCode = 1;
    if (dialog != nullptr) {
        static_cast<CCeShwCopyFileDlg*>(dialog)->DoModal();
    }
    return kExitCode;
}

bool CopyProgress::MayGoOn() const {
    // Ends with the user's answer, or with the thread that asks.
    while (dialog_.GetStopState() == StopState::kAsking &&
           WaitForSingleObject(thread_.Get(), kPollMs) == WAIT_TIMEOUT) {
    }
    return dialog_.GetStopState() != StopState::kStopped;
}

void CopyProgress::ShowFile(const std::wstring& from, const std::wstring& to, const std::wstring& name,
                            int index, int count) const {
    SendText(IDC_COPY_FROM, from);
    SendText(IDC_COPY_TO, to);
    SendText(IDC_COPY_FILE, name);
    Send(kCopySetCount, static_cast<WPARAM>(index), count);
}

bool CopyProgress::AskReplace(const std::wstring& question) const {
    return Send(kCopyAskReplace, 0, reinterpret_cast<LPARAM>(question.c_str())) != 0;
}

void CopyProgress::Close() const {
    Send(kCopyClose, 0, 0);
}

// Returns when the window has handled the message. Its thread always gets there: it has a message loop, and
// so have the questions it shows. Without a window, 0.
LRESULT CopyProgress::Send(UINT message, WPARAM wparam, LPARAM lparam) const {
    HWND window = dialog_.Handle();
    return window != nullptr ? SendMessageW(window, message, wparam, lparam) : 0;
}

void CopyProgress::SendText(int id, const std::wstring& text) const {
    Send(kCopySetText, static_cast<WPARAM>(id), reinterpret_cast<LPARAM>(text.c_str()));
}

}  // namespace orvane
