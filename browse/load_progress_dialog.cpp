#include "browse/load_progress_dialog.h"

#include <utility>

#include "platform/resources.h"
#include "res/ids.h"

namespace orvane {

namespace {

constexpr UINT_PTR kFrameTimer = 1;
constexpr UINT kFrameMs = 1000;

}  // namespace

// The template shows the fifth frame, so that the first timer message brings the sequence back to its
// second place: the counter moves before the picture does.
CLoadProgressDlg::CLoadProgressDlg(std::wstring text, HWND parent)
    : Dialog(IDD_LOAD_PROGRESS, parent),
      text_(std::move(text)),
      icons_{LoadOwnedIcon(IDI_LOAD_FRAME_5), LoadOwnedIcon(IDI_LOAD_FRAME_1),
             LoadOwnedIcon(IDI_LOAD_FRAME_2), LoadOwnedIcon(IDI_LOAD_FRAME_3),
             LoadOwnedIcon(IDI_LOAD_FRAME_4)} {}

bool CLoadProgressDlg::OnInitDialog() {
    SetDlgItemTextW(Handle(), IDC_LOAD_TEXT, text_.c_str());
    SetTimer(Handle(), kFrameTimer, kFrameMs, nullptr);
    return true;
}

std::optional<LRESULT> CLoadProgressDlg::OnMessage(UINT message, WPARAM /*wparam*/, LPARAM /*lparam*/) {
    if (message == WM_TIMER) {
        ShowNextFrame();
    }
    return std::nullopt;
}

void CLoadProgressDlg::ShowNextFrame() {
    frame_ = (frame_ + 1) % icons_.size();
    SendDlgItemMessageW(Handle(), IDC_LOAD_ICON, STM_SETICON, reinterpret_cast<WPARAM>(icons_[frame_].Get()),
                        0);
}

}  // namespace orvane
