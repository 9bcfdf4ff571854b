#include "browse/load_progress_dialog.h"

#include <array>
#include <utility>

#include "res/ids.h"
#include "ui/screen.h"

namespace orvane {

namespace {

constexpr UINT_PTR kFrameTimer = 1;
constexpr UINT kFrameMs = 1000;
constexpr std::array kFrames = {IDI_LOAD_FRAME_5, IDI_LOAD_FRAME_1, IDI_LOAD_FRAME_2, IDI_LOAD_FRAME_3,
                                IDI_LOAD_FRAME_4};

}  // namespace

CLoadProgressDlg::CLoadProgressDlg(std::wstring text, HWND parent)
    : Dialog(IDD_LOAD_PROGRESS, parent), text_(std::move(text)) {}

bool CLoadProgressDlg::OnInitDialog() {
    SetDlgItemTextW(Handle(), IDC_LOAD_TEXT, text_.c_str());
    ShowFrame();
    SetTimer(Handle(), kFrameTimer, kFrameMs, nullptr);
    return true;
}

std::optional<LRESULT> CLoadProgressDlg::OnMessage(UINT message, WPARAM /*wparam*/, LPARAM /*lparam*/) {
    if (message == WM_TIMER) {
        frame_ = (frame_ + 1) % kFrames.size();
        ShowFrame();
    }
    return std::nullopt;
}

void CLoadProgressDlg::ShowFrame() {
    icon_ = ui::ShowIcon(Item(IDC_LOAD_ICON), kFrames[frame_]);
}

}  // namespace orvane
