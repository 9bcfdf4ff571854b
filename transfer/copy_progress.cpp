#include "transfer/copy_progress.h"

#include <array>

#include "res/ids.h"

namespace orvane {

namespace {

// How long to wait for the window to come up. Far more than a slow machine needs: it only keeps a window
// system that does not answer from holding up the copy.
constexpr DWORD kOpenLimitMs = 10'000;
constexpr DWORD kCloseLimitMs = 2'000;
constexpr DWORD kPollMs = 100;

}  // namespace

CopyProgress::CopyProgress(CopyDirection direction)
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
