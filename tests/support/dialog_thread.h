// A dialog of the program on a thread of its own: the test drives it by messages, as a user would.
#pragma once

#include <windows.h>

#include <atomic>
#include <functional>
#include <optional>
#include <string>
#include <thread>

#include "tests/support/dialog_script.h"

namespace orvane::testing {

template <class Dialog>
class DialogThread {
  public:
    // Makes the dialog of copies of the arguments on its thread, and runs it.
    template <class... Arguments>
    explicit DialogThread(Arguments... arguments) : thread_([this, arguments...] { Run(arguments...); }) {}
    ~DialogThread() { Result(); }

    // Returns when the dialog has been initialised or has ended.
    void WaitUntilOpen() const {
        WaitUntil([this] { return open_ || ended_; });
    }
    bool HasEnded() const { return ended_; }
    // Closes the dialog if it is still open. What DoModal answered.
    INT_PTR Result() {
        if (thread_.joinable()) {
            WaitUntil([this] { return window_ != nullptr || ended_; });
            PostMessageW(window_, WM_COMMAND, IDCANCEL, 0);
            thread_.join();
        }
        return result_;
    }

    // From the beginning of its initialisation.
    HWND Window() const { return window_; }
    HWND Item(int id) const { return GetDlgItem(window_, id); }
    std::wstring Text(int id) const { return ItemText(window_, id); }
    // Presses a button and returns when the dialog has done what it is for, or without waiting.
    void Press(int id) const { SendMessageW(Item(id), BM_CLICK, 0, 0); }
    void PressAndGoOn(int id) const { testing::Press(window_, id); }
    // Calls the function on the dialog's thread.
    void Call(const std::function<void(Dialog&)>& function) const {
        SendMessageW(window_, kCall, 0, reinterpret_cast<LPARAM>(&function));
    }

  private:
    static constexpr UINT kCall = WM_APP + 100;

    class Watched : public Dialog {
      public:
        template <class... Arguments>
        explicit Watched(DialogThread& owner, Arguments... arguments) : Dialog(arguments...), owner_(owner) {}

      protected:
        bool OnInitDialog() override {
            owner_.window_ = this->Handle();
            const bool set_focus = Dialog::OnInitDialog();
            owner_.open_ = true;
            return set_focus;
        }
        std::optional<LRESULT> OnMessage(UINT message, WPARAM wparam, LPARAM lparam) override {
            if (message != kCall) {
                return Dialog::OnMessage(message, wparam, lparam);
            }
            (*reinterpret_cast<const std::function<void(Dialog&)>*>(lparam))(*this);
            return 0;
        }

      private:
        DialogThread& owner_;
    };

    template <class... Arguments>
    void Run(Arguments... arguments) {
        Watched dialog(*this, arguments...);
        result_ = dialog.DoModal();
        ended_ = true;
        if constexpr (requires { dialog.HasRunningWorker(); }) {
            WaitUntil([&] { return !dialog.HasRunningWorker(); });  // It uses the dialog.
        }
    }

    std::atomic<HWND> window_{nullptr};
    std::atomic<bool> open_{false};
    std::atomic<bool> ended_{false};
    std::atomic<INT_PTR> result_{-1};
    std::thread thread_;
};

}  // namespace orvane::testing
