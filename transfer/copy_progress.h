// The window that shows how a copy of the manual view goes on, and the copying thread's side of it.
#pragma once

#include <windows.h>

#include <atomic>
#include <string>

#include "copy/copy_context.h"
#include "platform/handles.h"
#include "ui/dialog.h"

namespace orvane {

// Whether the user wants the copy to stop.
enum class StopState { kRunning = 0, kAsking = 1, kStopped = 2 };

// What the copying thread sends to the window; each returns when it has been handled.
// wParam: id of the control, lParam: its text. Returns 0.
inline constexpr UINT kCopySetText = WM_USER + 1008;
// wParam: zero-based index of the file, lParam: number of files. Returns 0.
inline constexpr UINT kCopySetCount = WM_USER + 1009;
// Ends the dialog. Returns 0.
inline constexpr UINT kCopyClose = WM_USER + 1010;
// lParam: the question's text. Returns 0 to leave the file, 1 to replace it.
inline constexpr UINT kCopyAskReplace = WM_USER + 1011;

// The "Copying File" dialog. It is modal on a thread of its own and has no owner: the thread that copies
// handles no messages, and a window owned by one of its windows would share that thread's input. Everything
// but GetStopState belongs to the thread that calls DoModal.
class CCeShwCopyFileDlg : public ui::Dialog {
  public:
    explicit CCeShwCopyFileDlg(Direction direction);

    // Any thread. kAsking while the user is asked.
    StopState GetStopState() const { return stop_state_; }
    // A manual-reset event, signalled once the window is there and ready for messages. Owned by the dialog.
    HANDLE ReadyEvent() const { return ready_.Get(); }

  protected:
    bool OnInitDialog() override;
    // Enter without a focused button does nothing: there is nothing to accept.
    void OnOK() override {}
    // Escape and the close box ask like the button.
    void OnCancel() override { OnStop(); }
    bool OnClicked(int id) override;
    std::optional<LRESULT> OnMessage(UINT message, WPARAM wparam, LPARAM lparam) override;

  private:
    void OnStop();
    void OnSetCount(int index, int count);
    bool OnAskReplace(const std::wstring& question);
    void OnClose();

    const Direction direction_;
    const UniqueEvent ready_;
    std::atomic<StopState> stop_state_{StopState::kRunning};
};

// The window's title while file `number` (counted from 1) of `count` is copied.
std::wstring CopyProgressTitle(int number, int count, Direction direction);

// Runs the progress dialog on a thread of its own while it lives; used by one other thread, the one that
// copies, which needs to handle no messages. A window that does not come up, or that the user closed by
// stopping, is no error: showing then does nothing, and a question is answered by leaving the file.
class CopyProgress {
  public:
    // Returns when the window is there, or when it is clear that there will be none.
    explicit CopyProgress(Direction direction);
    // Closes the window and ends its thread.
    ~CopyProgress();
    CopyProgress(const CopyProgress&) = delete;
    CopyProgress& operator=(const CopyProgress&) = delete;

    // Whether the next file may begin: false when the user stopped the copy. While the user is being asked
    // this waits for the answer.
    bool MayGoOn() const;
    // Shows what is copied now; `index` counts from 0.
    void ShowFile(const std::wstring& from, const std::wstring& to, const std::wstring& name, int index,
                  int count) const;
    // Asks the user, and waits for the answer: true to replace the file, false to leave it.
    bool AskReplace(const std::wstring& question) const;
    // Closes the window ahead of the destructor. Its thread may go on for a moment.
    void Close() const;

  private:
    static DWORD WINAPI Run(void* dialog) noexcept;
    LRESULT Send(UINT message, WPARAM wparam, LPARAM lparam) const;
    void SendText(int id, const std::wstring& text) const;

    CCeShwCopyFileDlg dialog_;
    UniqueThread thread_;
};

}  // namespace orvane
