// Answering the message boxes that the code under test shows.
#pragma once

#include <windows.h>

#include <atomic>
#include <mutex>
#include <string>
#include <thread>
#include <vector>

namespace orvane::testing {

// What a message box looked like.
struct SeenMessageBox {
    std::wstring caption;
    std::wstring text{};
    int default_button = 0;  // What Enter presses.
    HWND owner = nullptr;
};

// While it lives, a thread looks for message boxes of this process, on whichever thread they are shown, and
// presses the button of the next answer (IDOK, IDCANCEL, ...). A box that has no such button, or comes when
// the answers are used up, gets its default button, so that the test goes on and can look at Seen.
class MessageBoxAnswerer {
  public:
    explicit MessageBoxAnswerer(std::vector<int> answers = {});
    ~MessageBoxAnswerer();

    // The boxes answered so far, in their order.
    std::vector<SeenMessageBox> Seen() const;

  private:
    void Run();

    const std::vector<int> answers_;
    mutable std::mutex mutex_;
    std::vector<SeenMessageBox> seen_;
    std::atomic<bool> stop_{false};
    std::thread thread_;
};

}  // namespace orvane::testing
