#include <cstdio>
#include <functional>
#include <map>

#include "benchmark/cases.h"
#include "benchmark/dialog_thread.h"
#include "benchmark/json_line.h"
#include "benchmark/stopwatch.h"
#include "res/ids.h"
#include "transfer/transfer_dialog.h"

namespace orvane::bench {

namespace {

// Runs the std::function that lParam points to on the window's thread.
constexpr UINT kRunFunction = WM_APP + 100;

class MeasuredView : public CCeFileTransfDlg {
  public:
    MeasuredView() : CCeFileTransfDlg(RefreshSettingsBlock(LoadSettings()), true, nullptr) {}

    bool IsReady() const { return ready_; }
    // The time that the last listing took from its delivery to the filled list.
    LONGLONG FillTicks() const { return fill_ticks_; }

  protected:
    bool OnInitDialog() override {
        const bool set_focus = CCeFileTransfDlg::OnInitDialog();
        ready_ = true;
        return set_focus;
    }
    std::optional<LRESULT> OnMessage(UINT message, WPARAM wparam, LPARAM lparam) override {
        if (message == kRunFunction) {
            (*reinterpret_cast<const std::function<void()>*>(lparam))();
            return 0;
        }
        const LONGLONG start = Now();
        const auto result = CCeFileTransfDlg::OnMessage(message, wparam, lparam);
        if (message == kListingReady && result) {
            fill_ticks_ = Now() - start;
        }
        return result;
    }

  private:
    std::atomic<bool> ready_{false};
    std::atomic<LONGLONG> fill_ticks_{0};
};

// Handles all that waits for the window's thread, the painting included.
void Settle(HWND window) {
    for (int round = 0; round < 2; ++round) {
        MSG message;
        while (PeekMessageW(&message, nullptr, 0, 0, PM_REMOVE)) {
            TranslateMessage(&message);
            DispatchMessageW(&message);
        }
        RedrawWindow(window, nullptr, nullptr, RDW_UPDATENOW | RDW_ALLCHILDREN);
    }
}

class View {
  public:
    bool IsUp() const { return !thread_.HasEnded(); }
    HWND Item(int id) const { return thread_.Item(id); }
    LONGLONG FillTicks() const { return thread_.Get().FillTicks(); }
    LRESULT Count(int list_id) const { return SendMessageW(Item(list_id), LVM_GETITEMCOUNT, 0, 0); }

    // How long the user waits for what an action does to be on the screen.
    double Time(const std::function<void()>& action) const {
        double ms = 0;
        const std::function<void()> timed = [&] {
            Settle(thread_.Window());
            const LONGLONG start = Now();
            action();
            Settle(thread_.Window());
            ms = Milliseconds(Now() - start);
        };
        SendMessageW(thread_.Window(), kRunFunction, 0, reinterpret_cast<LPARAM>(&timed));
        return ms;
    }
    double Press(int id) const {
        return Time([&] { SendMessageW(Item(id), BM_CLICK, 0, 0); });
    }
    double SelectPage(int page) const {
        return Time(
            [&] { SendMessageW(Item(IDC_TRANSFER_TABS), TCM_SETCURFOCUS, static_cast<WPARAM>(page), 0); });
    }
    double ClickHeader(int list_id, int x) const {
        return Time([&] {
            auto* header = reinterpret_cast<HWND>(SendMessageW(Item(list_id), LVM_GETHEADER, 0, 0));
            SendMessageW(header, WM_LBUTTONDOWN, MK_LBUTTON, MAKELPARAM(x, 5));
            SendMessageW(header, WM_LBUTTONUP, 0, MAKELPARAM(x, 5));
        });
    }
    double TickRow(int list_id, int row) const {
        HWND list = Item(list_id);
        LVITEMW item{};
        item.state = item.stateMask = LVIS_SELECTED | LVIS_FOCUSED;
        SendMessageW(list, LVM_SETITEMSTATE, static_cast<WPARAM>(row), reinterpret_cast<LPARAM>(&item));
        return Time([&] { SendMessageW(list, WM_KEYDOWN, VK_SPACE, 1); });
    }
    double DoubleClick(int list_id) const {
        HWND list = Item(list_id);
        return Time([&] { SendMessageW(list, WM_LBUTTONDBLCLK, MK_LBUTTON, MAKELPARAM(20, 50)); });
    }
    double RepaintAll() const {
        return Time([&] {
            RedrawWindow(thread_.Window(), nullptr, nullptr,
                         RDW_INVALIDATE | RDW_ERASE | RDW_UPDATENOW | RDW_ALLCHILDREN);
        });
    }

  private:
    DialogThread<MeasuredView> thread_;
};

}  // namespace

bool RunLists(const std::wstring& pc_folder) {
    UseBenchSettings(pc_folder, /*with_backup=*/false);
    const View view;
    if (!view.IsUp() || view.Count(IDC_TRANSFER_DEVICE_LIST) == 0) {
        std::fputs("the manual view did not come up with its lists filled\n", stderr);
        return false;
    }
    constexpr int kRuns = 3;
    constexpr int kPcPage = 0;
    constexpr int kDevicePage = 1;
    constexpr int kInNameColumn = 20;  // Pixels from the left.
    constexpr int kInDateColumn = 320;
    constexpr int kInTickColumn = 440;
    for (int run = 0; run < kRuns; ++run) {
        JsonLine line;
        if (run == 0) {
            line.Add("first_fill_ms", Milliseconds(view.FillTicks()));
        }
        line.Add("refresh_ms", view.Press(IDC_TRANSFER_REFRESH));
        line.Add("refill_ms", Milliseconds(view.FillTicks()));
        line.Add("to_device_page_ms", view.SelectPage(kDevicePage));
        line.Add("select_all_ms", view.Press(IDC_TRANSFER_DEVICE_ALL));
        line.Add("select_none_ms", view.Press(IDC_TRANSFER_DEVICE_ALL));
        line.Add("tick_ms", view.TickRow(IDC_TRANSFER_DEVICE_LIST, 3));
        line.Add("double_click_ms", view.DoubleClick(IDC_TRANSFER_DEVICE_LIST));
        line.Add("sort_by_date_ms", view.ClickHeader(IDC_TRANSFER_DEVICE_LIST, kInDateColumn));
        line.Add("sort_by_name_ms", view.ClickHeader(IDC_TRANSFER_DEVICE_LIST, kInNameColumn));
        line.Add("sort_reverse_ms", view.ClickHeader(IDC_TRANSFER_DEVICE_LIST, kInNameColumn));
        line.Add("sort_by_tick_ms", view.ClickHeader(IDC_TRANSFER_DEVICE_LIST, kInTickColumn));
        line.Add("repaint_ms", view.RepaintAll());
        line.Add("to_pc_page_ms", view.SelectPage(kPcPage));
        line.Add("rows", static_cast<double>(view.Count(IDC_TRANSFER_DEVICE_LIST)));
        line.Print();
    }
    return true;
}

}  // namespace orvane::bench
