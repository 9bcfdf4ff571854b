// The options dialog.
#pragma once

#include <windows.h>

#include <optional>

#include "settings/settings_store.h"
#include "ui/dialog.h"

namespace orvane {

// Shows the settings and, after OK, hands back what the user made of them; it stores nothing itself.
class COptionsDlg : public ui::Dialog {
  public:
    // Takes the initial state from the block, and Start_File_View and the auto-start entry from the registry.
    COptionsDlg(const SyncSettingsBlock& block, HWND parent);

    // The folders as typed and all flags; meaningful after IDOK.
    const SyncSettings& Values() const { return values_; }
    // Whether the program is to start when a device connects: the box after OK, the entry as it was found
    // after Cancel.
    bool AutoStart() const { return auto_start_; }

  protected:
    bool OnInitDialog() override;
    void OnCancel() override;
    bool OnClicked(int id) override;
    void DoDataExchange(ui::DataExchange& exchange) override;

  private:
    bool OnTypeBox(int id);
    void OnOverwrite();
    void TickAllTypes(bool tick);
    void EnableOverwriteBoxes();
    void OnBrowseDevice();
    void OnBrowsePc();

    SyncSettings values_;
    const bool auto_start_at_start_;
    bool auto_start_;
};

// Runs the options dialog on the block. After OK all settings are written and returned; after OK and Cancel
// alike the auto-start entry is written.
std::optional<SyncSettings> RunOptions(HWND owner, const SyncSettingsBlock& block);

}  // namespace orvane
