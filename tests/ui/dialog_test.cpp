#include "ui/dialog.h"

#include <gtest/gtest.h>
#include <windows.h>

#include <commctrl.h>

#include <functional>
#include <stdexcept>
#include <string>

#include "platform/resources.h"
#include "res/ids.h"
#include "tests/support/message_boxes.h"
#include "ui/control.h"
#include "ui/message_box.h"

namespace orvane::ui {
namespace {

constexpr UINT kTemplate = 30000;
constexpr int kEdit = 10;
constexpr int kCheck = 11;
// Does not fit 32 bits, and its lower half is negative.
constexpr LRESULT kWide = 0x12345'9ABC'DEF0;

using Handler = std::function<std::optional<LRESULT>(UINT)>;

class TestDialog : public Dialog {
  public:
    TestDialog() : Dialog(kTemplate) {}

    HWND Control(int id) const { return Item(id); }

    Handler handler = [](UINT) { return std::nullopt; };
    std::function<bool(int, UINT)> command = [](int, UINT) { return false; };
    std::wstring text;
    int check = 0;
    int button = 0;         // Pressed as soon as the dialog runs.
    std::wstring new_text;  // Typed before.

  protected:
    bool OnInitDialog() override {
        Dialog::OnInitDialog();
        if (button != 0) {
            SetDlgItemTextW(Handle(), kEdit, new_text.c_str());
            PostMessageW(Handle(), WM_COMMAND, static_cast<WPARAM>(button), 0);
        }
        return true;
    }
    bool OnCommand(int id, UINT code) override { return command(id, code); }
    std::optional<LRESULT> OnMessage(UINT message, WPARAM, LPARAM) override { return handler(message); }
    void DoDataExchange(DataExchange& exchange) override {
        exchange.Text(kEdit, text);
        exchange.Check(kCheck, check);
    }
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
    EXPECT_EQ(SendMessageW(dialog.Handle(), WM_QUERYENDSESSION, 0, 0), TRUE) << "what the system answers";
    dialog.handler = [](UINT) { return 0; };
    EXPECT_EQ(SendMessageW(dialog.Handle(), WM_QUERYENDSESSION, 0, 0), FALSE);
    dialog.handler = Throw;
    EXPECT_EQ(SendMessageW(dialog.Handle(), WM_QUERYENDSESSION, 0, 0), TRUE);
    dialog.handler = [](UINT) { return kWide; };
    for (const UINT message : {WM_CTLCOLOREDIT, WM_CTLCOLORSTATIC, WM_CTLCOLORDLG, WM_CHARTOITEM, WM_APP}) {
        EXPECT_EQ(SendMessageW(dialog.Handle(), message, 0, 0), kWide) << message;
    }
    dialog.handler = [](UINT) { return std::nullopt; };
    dialog.Destroy();
    EXPECT_EQ(dialog.Handle(), nullptr);
}

TEST(Dialog, ExchangesDataAndEndsByItsButtons) {
    const struct {
        int button;
        const wchar_t* text;
    } cases[] = {{IDOK, L"new"}, {IDCANCEL, L"old"}};
    for (const auto& c : cases) {
        TestDialog dialog;
        dialog.text = L"old";
        dialog.new_text = L"new";
        dialog.button = c.button;
        EXPECT_EQ(dialog.DoModal(), c.button);
        EXPECT_EQ(dialog.text, c.text);
        EXPECT_EQ(dialog.Handle(), nullptr);
    }
    TestDialog dialog;
    const std::wstring long_text(3000, L'x');
    dialog.text = long_text;
    dialog.check = 1;
    ASSERT_TRUE(dialog.Create());
    EXPECT_EQ(WindowText(dialog.Control(kEdit)), long_text);
    EXPECT_EQ(IsDlgButtonChecked(dialog.Handle(), kCheck), static_cast<UINT>(BST_CHECKED));
    dialog.text.clear();
    dialog.check = 0;
    dialog.UpdateData(true);
    EXPECT_EQ(dialog.text, long_text);
    EXPECT_EQ(dialog.check, 1);
}

TEST(Control, GetsItsNotificationsBeforeTheDialog) {
    TestDialog dialog;
    TestControl control;
    ASSERT_TRUE(dialog.Create());
    ASSERT_TRUE(control.Attach(dialog.Control(kEdit)));
    int commands = 0;
    dialog.command = [&](int id, UINT code) {
        commands += id == kEdit && code == EN_CHANGE ? 1 : 0;
        return true;
    };
    SetDlgItemTextW(dialog.Handle(), kEdit, L"a");
    EXPECT_EQ(commands, 1) << "left to the dialog";

    control.reflected = [](UINT message) { return message; };
    SetDlgItemTextW(dialog.Handle(), kEdit, L"b");
    EXPECT_EQ(commands, 1);

    HWND edit = control.Handle();
    NMHDR notify{edit, kEdit, NM_CLICK};
    DRAWITEMSTRUCT draw{};
    draw.hwndItem = edit;
    MEASUREITEMSTRUCT measure{};
    measure.CtlID = kEdit;
    const auto send = [&](UINT message, auto& data) {
        return SendMessageW(dialog.Handle(), message, kEdit, reinterpret_cast<LPARAM>(&data));
    };
    EXPECT_EQ(send(WM_NOTIFY, notify), WM_NOTIFY);
    EXPECT_EQ(send(WM_DRAWITEM, draw), WM_DRAWITEM);
    EXPECT_EQ(send(WM_MEASUREITEM, measure), WM_MEASUREITEM);
    measure.CtlType = ODT_MENU;
    EXPECT_EQ(send(WM_MEASUREITEM, measure), 0) << "a menu's item of the control's number";
    control.reflected = Throw;
    EXPECT_EQ(send(WM_NOTIFY, notify), 0);
}

TEST(Control, HandlesItsMessagesUntilItIsDetached) {
    TestDialog dialog;
    TestControl control;
    EXPECT_FALSE(control.Attach(nullptr));
    ASSERT_TRUE(dialog.Create());
    HWND edit = dialog.Control(kEdit);
    ASSERT_TRUE(control.Attach(edit));
    const LRESULT system_answer = SendMessageW(edit, WM_GETDLGCODE, 0, 0);
    ASSERT_NE(system_answer, 0);
    control.handler = [](UINT) { return 0; };
    EXPECT_EQ(SendMessageW(edit, WM_GETDLGCODE, 0, 0), 0);
    control.handler = Throw;
    EXPECT_EQ(SendMessageW(edit, WM_GETDLGCODE, 0, 0), system_answer);
    control.handler = [](UINT) { return kWide; };
    EXPECT_EQ(SendMessageW(edit, WM_GETDLGCODE, 0, 0), kWide);
    control.Detach();
    EXPECT_EQ(SendMessageW(edit, WM_GETDLGCODE, 0, 0), system_answer);
    ASSERT_TRUE(control.Attach(edit));
    control.handler = [](UINT) { return std::nullopt; };
    dialog.Destroy();
    EXPECT_EQ(control.Handle(), nullptr);
}

TEST(ShowMessageBox, BearsTheApplicationsNameUnlessToldOtherwise) {
    const std::wstring application = ResourceString(IDS_APPLICATION_NAME);
    ASSERT_FALSE(application.empty());
    for (const wchar_t* caption : {L"", L"Another caption"}) {
        const testing::MessageBoxAnswerer user({IDCANCEL});
        EXPECT_EQ(ShowMessageBox(nullptr, L"text", MB_OKCANCEL, caption), IDCANCEL);
        ASSERT_EQ(user.Seen().size(), 1U);
        EXPECT_EQ(user.Seen()[0].caption, *caption != L'\0' ? caption : application);
    }
}

}  // namespace
}  // namespace orvane::ui
