// The dialog itself: its lists, what its controls offer, its settings and its clock check.
#include "tests/transfer/transfer_fixture.h"

namespace orvane::testing {

TEST_F(TransferTest, ListsWhatEachSideLacks) {
    for (const wchar_t* name : {L"new.qvj", L"notes.doc", L".qvj", L"picture.bmp", L"picture.IMG"}) {
        PutOnPc(name);
    }
    PutOnPc(L"newer.qvj", 10);
    PutOnDevice(L"NEWER.qvj");
    PutOnPc(L"same.qvj", 9);
    PutOnDevice(L"same.qvj");
    PutOnDevice(L"a.TN3");
    PutOnDevice(L"Job1\\pic.jpg");
    {
        const TransferRun run(settings_);
        EXPECT_EQ(run.Column(IDC_TRANSFER_PC_LIST), (Names{L"new.qvj", L"newer.qvj", L"picture.IMG"}));
        EXPECT_EQ(run.Column(IDC_TRANSFER_PC_LIST, 2), (Names{L"1", L"1", L"1"}));
        EXPECT_EQ(run.Column(IDC_TRANSFER_DEVICE_LIST), (Names{L"a.TN3", L"Job1\\pic.jpg"}));
    }
    settings_.overwrite_old_files = false;
    const TransferRun run(settings_);
    EXPECT_EQ(run.Column(IDC_TRANSFER_PC_LIST), (Names{L"new.qvj", L"picture.IMG"}));
}

TEST_F(TransferTest, CopyButtonFollowsTheTicksOfThePageShown) {
    PutOnPc(L"a.qvj");
    PutOnPc(L"b.qvj");
    PutOnDevice(L"c.qvj");
    const TransferRun run(settings_);
    const auto is_enabled = [&](int id, bool enabled) {
        return WaitUntil([&] { return run.IsEnabled(id) == enabled; });
    };
    EXPECT_TRUE(is_enabled(IDC_TRANSFER_COPY, false));
    EXPECT_EQ(run.Text(IDC_TRANSFER_COPY), L"Copy Selected File(s) from PC to Device");
    run.Tick(IDC_TRANSFER_PC_LIST, L"b.qvj");
    EXPECT_TRUE(is_enabled(IDC_TRANSFER_COPY, true));
    EXPECT_TRUE(is_enabled(IDC_TRANSFER_COPY_ALL, true));
    EXPECT_FALSE(run.IsChecked(IDC_TRANSFER_PC_ALL));
    run.Tick(IDC_TRANSFER_PC_LIST, L"a.qvj");
    EXPECT_TRUE(WaitUntil([&] { return run.IsChecked(IDC_TRANSFER_PC_ALL); }));

    run.SelectDevicePage();
    EXPECT_TRUE(is_enabled(IDC_TRANSFER_COPY, false));
    // A late report about the page that is hidden now.
    HWND hidden = run.Item(IDC_TRANSFER_PC_LIST);
    SendMessageW(run.Window(), kListItemsDrawn, reinterpret_cast<WPARAM>(hidden),
                 reinterpret_cast<LPARAM>(hidden));
    EXPECT_FALSE(run.IsEnabled(IDC_TRANSFER_COPY));

    run.Press(IDC_TRANSFER_DEVICE_ALL);
    EXPECT_EQ(run.Column(IDC_TRANSFER_DEVICE_LIST, 2), Names{L"0"});
    EXPECT_TRUE(is_enabled(IDC_TRANSFER_COPY, true));
}

TEST_F(TransferTest, DoubleClickFlipsTheSelectedEntry) {
    PutOnPc(L"a.qvj");
    const TransferRun run(settings_);
    HWND list = run.Item(IDC_TRANSFER_PC_LIST);
    run.Tick(IDC_TRANSFER_PC_LIST, L"a.qvj");
    EXPECT_EQ(run.Column(IDC_TRANSFER_PC_LIST, 2), Names{L"0"});
    SendMessageW(run.Window(), kListDoubleClick, reinterpret_cast<WPARAM>(list),
                 reinterpret_cast<LPARAM>(list));
    EXPECT_EQ(run.Column(IDC_TRANSFER_PC_LIST, 2), Names{L"1"});
    // The dialog manager's message of the same number is not taken for a listing.
    SendMessageW(run.Window(), DM_SETDEFID, 0, 1);
    EXPECT_EQ(run.Column(IDC_TRANSFER_PC_LIST), Names{L"a.qvj"});
}

TEST_F(TransferTest, FollowsTheKeyboard) {
    PutOnPc(L"a.qvj");
    TransferRun run(settings_);
    PutOnPc(L"b.qvj");
    PostMessageW(run.Item(IDC_TRANSFER_PC_LIST), WM_KEYDOWN, VK_RETURN, 1);
    EXPECT_TRUE(WaitUntil([&] { return run.Column(IDC_TRANSFER_PC_LIST) == Names{L"a.qvj", L"b.qvj"}; }));
    PostMessageW(run.Item(IDC_TRANSFER_PC_LIST), WM_KEYDOWN, VK_ESCAPE, 1);
    EXPECT_TRUE(WaitUntil([&] { return run.HasEnded(); }));
    EXPECT_EQ(run.Result(), IDCANCEL);
}

TEST_F(TransferTest, NewFoldersAreListedAtOnce) {
    PutOnPc(L"a.qvj");
    TempFolder other;
    WriteTextFile(other / L"b.qvj", "");
    bool accept = false;
    const TransferRun run(settings_, true, [&](SyncSettings& settings) {
        settings.sync_path_dt = other.Path() + L"\\";
        return accept;
    });
    run.Press(IDC_TRANSFER_SETTINGS);
    EXPECT_EQ(run.Column(IDC_TRANSFER_PC_LIST), Names{L"a.qvj"});
    accept = true;
    run.Press(IDC_TRANSFER_SETTINGS);
    EXPECT_EQ(run.Column(IDC_TRANSFER_PC_LIST), Names{L"b.qvj"});
}

TEST_F(TransferTest, WithoutADeviceTheListsStayEmptyAndUsable) {
    PutOnPc(L"a.qvj");
    device_.Set(L"CONNECT_RESULT", L"0x80004005");
    const MessageBoxAnswerer boxes;
    const TransferRun run(settings_);
    ASSERT_EQ(boxes.Seen().size(), 1U);
    EXPECT_EQ(boxes.Seen()[0].text, L"Failed to read from remote device.");
    EXPECT_EQ(run.Column(IDC_TRANSFER_PC_LIST), Names{});
    for (const int id :
         {IDC_TRANSFER_COPY, IDC_TRANSFER_COPY_ALL, IDC_TRANSFER_SYNCHRONIZE, IDC_TRANSFER_PC_ALL}) {
        EXPECT_FALSE(run.IsEnabled(id)) << id;
    }
    device_.Clear(L"CONNECT_RESULT");
    run.Press(IDC_TRANSFER_REFRESH);
    EXPECT_EQ(run.Column(IDC_TRANSFER_PC_LIST), Names{L"a.qvj"});
}

TEST_F(TransferTest, AMissingPcFolderIsAnEmptyOne) {
    settings_.sync_path_dt = OnPc(L"missing");
    PutOnDevice(L"a.qvj");
    const TransferRun run(settings_);
    EXPECT_EQ(run.Column(IDC_TRANSFER_DEVICE_LIST), Names{L"a.qvj"});
    run.Press(IDC_TRANSFER_SYNCHRONIZE);
    EXPECT_EQ(ListTree(pc_.Path()), (Names{L"missing\\", L"missing\\a.qvj"}));
}

TEST_F(TransferTest, ADeclinedClockCheckEndsTheDialog) {
    device_.Set(L"CLOCK_OFFSET", L"3600");
    const MessageBoxAnswerer boxes({IDCANCEL, IDOK});
    TransferRun declined(settings_, /*date_check_done=*/false);
    EXPECT_TRUE(WaitUntil([&] { return declined.HasEnded(); }));
    EXPECT_EQ(declined.Result(), 0);
    TransferRun accepted(settings_, /*date_check_done=*/false);
    EXPECT_FALSE(accepted.HasEnded());
    EXPECT_EQ(accepted.Result(), IDCANCEL);
    EXPECT_EQ(boxes.Seen().size(), 2U);
}

}  // namespace orvane::testing
