// The copying thread's side of the progress window.
#pragma once

#include <windows.h>

#include <string>

#include "platform/handles.h"
#include "transfer/copy_progress_dialog.h"

namespace orvane {

// Runs the progress dialog on a thread of its own while it lives; used by one other thread, the one that
// copies, which needs to handle no messages. A window that does not come up, or that the user closed by
// stopping, is no error: showing then does nothing, and a question is answered by leaving the file.
class CopyProgress {
  public:
    // Returns when the window is there, or when it is clear that there will be none.
    explicit CopyProgress(CopyDirection direction);
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
