// The manual view of both job folders.
#pragma once

#include <array>
#include <optional>
#include <string>
#include <utility>
#include <vector>

#include "controls/page_tab.h"
#include "controls/record_list.h"
#include "device/device_tree_reader.h"
#include "qelutils/xlate.h"
#include "settings/settings_store.h"
#include "transfer/candidates.h"
#include "transfer/copy_progress.h"
#include "ui/dialog.h"
#include "ui/screen.h"

namespace orvane {

// Sent by the dialog to itself when the entries of a list are ready; wParam 0, lParam 0 for the device's list
// and 1 for the PC's. Without a listing on its way this number is the dialog manager's own DM_SETDEFID.
inline constexpr UINT kListingReady = WM_USER + 1;

// The "File Transfer - Copy From" dialog: on one page the PC's files that would be copied to the device, on
// the other the device's files that would be copied to the PC. The user ticks files and has them copied,
// which happens on the dialog's thread; only the progress window has a thread of its own, and the job folders
// are read on a worker. F5 refreshes, Ctrl+A ticks all entries of the page. A modal dialog on the
// user-interface thread. It ends with 0 at once when the user declines the clock check.
class CCeFileTransfDlg : public ui::Dialog {
  public:
    // `date_check_done` leaves the clock check out.
    CCeFileTransfDlg(const SyncSettingsBlock& settings, bool date_check_done, HWND parent);

    // The settings as they are now; the caller takes them back when the dialog has ended.
    SyncSettingsBlock Settings() const { return RefreshSettingsBlock(settings_); }

  protected:
    bool OnInitDialog() override;
    void OnCancel() override;
    bool OnKey(UINT key) override;
    bool OnClicked(int id) override;
    std::optional<LRESULT> OnMessage(UINT message, WPARAM wparam, LPARAM lparam) override;
    void DoDataExchange(ui::DataExchange& exchange) override;

    // Lets the user change the settings and stores them. True when `settings` may have changed.
    virtual bool RunOptions(SyncSettings& settings);

  private:
    // A page with its list. Its number is that of the tab and of the direction in which its files go.
    struct Page {
        int list_id;
        int from_id;
        int folder_id;
        int all_id;
        USortedListCtrl list{};
        std::vector<sFileDate> candidates{};
        bool all_ticked = false;  // The "Select all file(s)" value.

        bool HasTicked() const { return list.TickedCount() > 0; }
        bool AllTicked() const { return list.TickedCount() == candidates.size(); }
    };
    static constexpr int kPcPage = 0;
    static constexpr int kDevicePage = 1;

    // Initialisation.
    void ShowInTaskBar();
    void SetUpList(Page& page);
    void SetUpTabs();
    void ShowFolders();

    // One thing at a time: while it lives the user's commands are dropped, those included that reach the
    // dialog as sent messages.
    class Busy {
      public:
        explicit Busy(CCeFileTransfDlg& dialog)
            : dialog_(dialog), before_(std::exchange(dialog.busy_, true)) {}
        ~Busy() { dialog_.busy_ = before_; }
        Busy(const Busy&) = delete;
        Busy& operator=(const Busy&) = delete;

      private:
        CCeFileTransfDlg& dialog_;
        const bool before_;
    };

    // Commands.
    void OnRefresh();
    void OnSettings();
    void OnCopySelected();
    void OnCopyAll(bool ticked_only);
    void OnSelectAll(Page& page);
    void OnTickPage();

    // Messages.
    void OnPageChanged(int number);
    void OnListDoubleClick(HWND list);
    void OnListItemsDrawn(HWND list);
    void OnListingReady(int number);

    void ReadListings();
    std::vector<sFileDate> Chosen(const Page& page, bool ticked_only) const;
    bool CopyFiles(int number, std::vector<sFileDate> files, bool more_follows);
    void TellEnd(qel_text::TextKey text);
    void FinishCopy(Page& page);
    bool AnyCandidates() const;
    Page* PageOfList(HWND list);
    // EnableWindow, without leaving the keyboard focus on a disabled control.
    void EnableItem(int id, bool enable);

    SyncSettings settings_;
    const bool date_check_done_;
    DeviceTreeReader device_tree_;  // Its stop event serves all operations on the device.
    bool busy_ = false;
    ui::WindowIcons icons_;  // When the dialog stands in for the main window; empty otherwise.
    int current_page_ = -1;
    CSTabCtrl tabs_;
    std::array<Page, 2> pages_;
    std::optional<std::vector<sFileDate>> ready_listing_;  // While kListingReady is on its way.
};

}  // namespace orvane
