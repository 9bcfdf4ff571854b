#include "ui/dialog.h"

#include <gtest/gtest.h>

#include <functional>
#include <stdexcept>

#include "ui/control.h"

namespace orvane::ui {
namespace {

constexpr int kEdit = 10;
// Does not fit 32 bits, and its lower half is negative.
constexpr LRESULT kWide = 0x12345'9ABC'DEF0;

using Handler = std::function<std::optional<LRESULT>(UINT)>;

class TestDialog : public Dialog {
  public:
    TestDialog() : Dialog(30000) {}
    HWND Edit() const { return Item(kEdit); }

    Handler handler = [](UINT) { return std::nullopt; };

  protected:
    std::optional<LRESULT> OnMessage(UINT message, WPARAM, LPARAM) override { return handler(message); }
};

class TestControl : public Control {
  public:
    Handler handler = [](UINT) { return std::nullopt; };

  protected:
    std::optional<LRESULT> OnMessage(UINT message, WPARAM, LPARAM) override { return handler(message); }
    std::optional<LRESULT> OnReflected(UINT message, WPARAM, LPARAM) override { return handler(message); }
};

std::optional<LRESULT> Throw(UINT) {
    throw std::runtime_error("no handler may do that");
}

TEST(Dialog, ReturnsResultsWholeAndTellsZeroFromUnhandled) {
    TestDialog dialog;
    ASSERT_TRUE(dialog.Create());
    const auto answer = [&](UINT message) { return SendMessageW(dialog.Handle(), message, 0, 0); };
    EXPECT_EQ(answer(WM_QUERYENDSESSION), TRUE) << "what the system answers";
    dialog.handler = [](UINT) { return 0; };
    EXPECT_EQ(answer(WM_QUERYENDSESSION), FALSE);
    dialog.handler = Throw;
    EXPECT_EQ(answer(WM_QUERYENDSESSION), TRUE);
    dialog.handler = [](UINT) { return kWide; };
    for (const UINT message : {WM_CTLCOLOREDIT, WM_CTLCOLORDLG, WM_CHARTOITEM, WM_APP}) {
        EXPECT_EQ(answer(message), kWide) << message;
    }
    dialog.handler = [](UINT) { return std::nullopt; };
}

TEST(Control, HandlesItsMessagesAndItsNotificationsBeforeTheDialog) {
    TestDialog dialog;
    TestControl control;
    ASSERT_TRUE(dialog.Create());
    const auto code = [&] { return SendMessageW(dialog.Edit(), WM_GETDLGCODE, 0, 0); };
    const auto notify = [&] {
        NMHDR header{dialog.Edit(), kEdit, 1};
        return SendMessageW(dialog.Handle(), WM_NOTIFY, kEdit, reinterpret_cast<LPARAM>(&header));
    };
    const LRESULT system_answer = code();
    dialog.handler = [](UINT message) { return message == WM_NOTIFY ? std::optional(7) : std::nullopt; };
    ASSERT_TRUE(control.Attach(dialog.Edit()));
    EXPECT_EQ(notify(), 7) << "left to the dialog";
    control.handler = [](UINT) { return kWide; };
    EXPECT_EQ(notify(), kWide);
    EXPECT_EQ(code(), kWide);
    MEASUREITEMSTRUCT measure{ODT_MENU, kEdit, 0, 0, 0, 0};
    EXPECT_EQ(SendMessageW(dialog.Handle(), WM_MEASUREITEM, kEdit, reinterpret_cast<LPARAM>(&measure)), 0)
        << "a menu's item of the control's number";
    control.handler = Throw;
    EXPECT_EQ(notify(), 0);
    EXPECT_EQ(code(), system_answer);
    dialog.Destroy();
    EXPECT_EQ(control.Handle(), nullptr);
}

}  // namespace
}  // namespace orvane::ui
