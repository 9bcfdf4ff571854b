// The real synchronization dialog on a thread of its own, over a PC folder and the folder device.
#pragma once

#include <gtest/gtest.h>
#include <windows.h>

#include <atomic>
#include <string>
#include <thread>
#include <vector>

#include "tests/support/dialog_script.h"
#include "tests/support/folder_device.h"
#include "tests/support/message_boxes.h"
#include "tests/support/scratch_registry.h"
#include "tests/support/temp_folder.h"

namespace orvane::testing {

using Lines = std::vector<std::wstring>;

// One run of the dialog, from its construction to its end. The test drives it by messages from its own
// thread, as a user would.
class DialogRun {
  public:
    // Starts the dialog; returns when it, or the file view in its place, is shown or it has ended.
    DialogRun();
    // Closes the dialog if that has not happened, and waits for its workers.
    ~DialogRun();
    DialogRun(const DialogRun&) = delete;
    DialogRun& operator=(const DialogRun&) = delete;

    HWND Window() const { return window_; }
    HWND Item(int id) const { return GetDlgItem(window_, id); }
    bool HasEnded() const { return ended_; }
    void Press(int id) const { SendMessageW(Item(id), BM_CLICK, 0, 0); }
    std::wstring Text(int id) const { return ItemText(window_, id); }
    Lines Log() const;
    // How often the log tells that a run is complete.
    std::ptrdiff_t Completions() const;
    bool IsBarVisible() const;
    LRESULT BarMaximum() const;

    // Presses "Synchronize" and waits until the run is complete. A press that is ignored fails the test.
    void Synchronize() const;

  private:
    void Run();

    HWND window_ = nullptr;
    std::atomic<bool> ended_{false};
    std::thread thread_;
};

// The window of the file view; null when there is none.
HWND FileView();

// Job folders on both sides and settings that let every type take part and overwrite older files.
class SyncTest : public ::testing::Test {
  protected:
    void SetUp() override;

    // Sets a value of the settings for the dialogs that start from now on.
    static void Setting(const std::wstring& name, const std::wstring& text);
    std::wstring OnPc(const std::wstring& name) const { return pc_ / name; }
    std::wstring OnDevice(const std::wstring& name) const { return device_.Root() + L"\\Jobs\\" + name; }
    void PutOnPc(const std::wstring& name, std::string_view content, const FILETIME& time) const;
    void PutOnDevice(const std::wstring& name, std::string_view content, const FILETIME& time) const;
    // "newer" on the PC and, a minute older, "older" on the device.
    void PutNewerOnPc(const std::wstring& name) const;
    // Creates files new_0.qvj, new_1.qvj, ... on the PC.
    void PutManyOnPc(int count) const;
    Lines PcFiles() const { return ListTree(pc_.Path()); }
    Lines DeviceFiles() const { return ListTree(device_.PcPath(L"\\Jobs")); }

    ScratchRegistry registry_;
    FolderDevice device_;
    TempFolder pc_;
    const FILETIME noon_ = UtcTime(2024, 3, 1, 12);
};

}  // namespace orvane::testing
