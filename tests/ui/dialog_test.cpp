#include "ui/dialog.h"

#include <gtest/gtest.h>

#include <functional>
#include <stdexcept>
#include <string>
#include <utility>

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
    HWND Control(int id) const { return Item(id); }

    Handler handler = [](UINT) { return std::nullopt; };
    std::wstring text;
    int button = 0;  // Pressed as soon as the dialog runs, after "new" was appended to the text.

  protected:
    bool OnInitDialog() override {
        if (button != 0) {
            SetDlgItemTextW(Handle(), kEdit, (text + L"new").c_str());
            PostMessageW(Handle(), WM_COMMAND, static_cast<WPARAM>(button), 0);
        }
        return true;
    }
    std::optional<LRESULT> OnMessage(UINT message, WPARAM, LPARAM) override { return handler(message); }
    void DoDataExchange(DataExchange& exchange) override { exchange.Text(kEdit, text); }
};

class TestControl : public Control {
  public:
    Handler handler = [](UINT) { return std::nullopt; };
    Handler reflected = [](UINT) { return std::nullopt; };

  protected:
    std::optional<LRESULT> OnMessage(UINT message, WPARAM, LPARAM) override { return handler(message); }
    std::optional<LRESULT> OnReflected(UINT message, WPARAM, LPARAM) override { return reflected(message); }
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

TEST(Dialog, ExchangesDataAndEndsByItsButtons) {
    const std::wstring old(3000, L'x');
    for (const int button : {IDOK, IDCANCEL}) {
        TestDialog dialog;
        dialog.text = old;
        dialog.button = button;
        EXPECT_EQ(dialog.DoModal(), button);
        EXPECT_EQ(dialog.text, button == IDOK ? old + L"new" : old);
        EXPECT_EQ(dialog.Handle(), nullptr);
    }
}

TEST(Control, GetsItsNotificationsBeforeTheDialog) {
    TestDialog dialog;
    TestControl control;
    ASSERT_TRUE(dialog.Create());
    HWND edit = dialog.Control(kEdit);
    ASSERT_TRUE(control.Attach(edit));
    int commands = 0;
    dialog.handler = [&](UINT message) {
        commands += message == WM_COMMAND ? 1 : 0;
        return std::nullopt;
    };
    SetWindowTextW(edit, L"a");
    EXPECT_GT(std::exchange(commands, 0), 0) << "left to the dialog";
    control.reflected = [](UINT message) { return message; };
    SetWindowTextW(edit, L"b");
    EXPECT_EQ(commands, 0);

    NMHDR notify{edit, kEdit, 1};
    const auto send = [&](UINT message, void* data) {
        return SendMessageW(dialog.Handle(), message, kEdit, reinterpret_cast<LPARAM>(data));
    };
    EXPECT_EQ(send(WM_NOTIFY, &notify), WM_NOTIFY);
    MEASUREITEMSTRUCT measure{ODT_MENU, kEdit, 0, 0, 0, 0};
    EXPECT_EQ(send(WM_MEASUREITEM, &measure), 0) << "a menu's item of the control's number";
    control.reflected = Throw;
    EXPECT_EQ(send(WM_NOTIFY, &notify), 0);
}

TEST(Control, HandlesItsMessagesUntilItIsDetached) {
    TestDialog dialog;
    TestControl control;
    ASSERT_TRUE(dialog.Create());
    HWND edit = dialog.Control(kEdit);
    const LRESULT system_answer = SendMessageW(edit, WM_GETDLGCODE, 0, 0);
    ASSERT_TRUE(control.Attach(edit));
    control.handler = Throw;
    EXPECT_EQ(SendMessageW(edit, WM_GETDLGCODE, 0, 0), system_answer);
    control.handler = [](UINT) { return kWide; };
    EXPECT_EQ(SendMessageW(edit, WM_GETDLGCODE, 0, 0), kWide);
    control.Detach();
    EXPECT_EQ(SendMessageW(edit, WM_GETDLGCODE, 0, 0), system_answer);
    ASSERT_TRUE(control.Attach(edit));
    dialog.Destroy();
    EXPECT_EQ(control.Handle(), nullptr);
}

}  // namespace
}  // namespace orvane::ui
