#include "browse/dir_tree.h"

#include <windowsx.h>

#include <array>
#include <cwchar>
#include <utility>

#include "browse/file_property_dialog.h"
#include "platform/resources.h"
#include "platform/text_case.h"
#include "qelutils/xlate.h"
#include "res/ids.h"
#include "ui/dialog.h"
#include "ui/screen.h"
#include "ui/waiting.h"

namespace orvane {

namespace {

constexpr int kPicturePixels = 16;  // At 100 %.
// How many characters a filter entry may have.
constexpr std::size_t kMaxPatternChars = 15;
// Time for the wait dialog to be seen before the thread is busy.
constexpr DWORD kPauseBeforeReadMs = 500;
// WM_DPICHANGED_AFTERPARENT: sent to a child when its top window has come to a screen of another density;
// Windows 10.
constexpr UINT kDpiChangedAfterParent = 0x02E3;

constexpr DWORD kUsualStyle = WS_CHILD | WS_VISIBLE | WS_BORDER | WS_VSCROLL | WS_TABSTOP | TVS_HASBUTTONS |
                              TVS_HASLINES | TVS_LINESATROOT | TVS_DISABLEDRAGDROP | TVS_SHOWSELALWAYS;

// The picture of an item that nobody has touched yet. A folder without kept entries has nothing to open and
// shows as open.
TreePicture InitialPicture(const FileNode& node) {
    if (node.is_folder == 0) {
        return TreePicture::kFile;
    }
    return node.child_count > 0 ? TreePicture::kClosedFolder : TreePicture::kOpenFolder;
}

// Folders before files, and by name without regard to case within each. Negative, 0 or positive.
int CompareSiblings(const FileNode& a, const FileNode& b) {
    if (a.is_folder != b.is_folder) {
        return a.is_folder != 0 ? -1 : 1;
    }
    return _wcsicmp(a.name.c_str(), b.name.c_str());
}

// The non-empty pieces of a device path between its "\", in order.
std::vector<std::wstring_view> PathPieces(std::wstring_view path) {
    std::vector<std::wstring_view> pieces;
    while (!path.empty()) {
        const std::size_t length = path.find(L'\\');
        if (length != 0) {
            pieces.push_back(path.substr(0, length));
        }
        path = length == std::wstring_view::npos ? std::wstring_view() : path.substr(length + 1);
    }
    return pieces;
}

UINT StateOf(TreePicture picture) {
    return INDEXTOSTATEIMAGEMASK(static_cast<UINT>(picture));
}

int CALLBACK CompareItems(LPARAM a, LPARAM b, LPARAM /*unused*/) {
    return CompareSiblings(*reinterpret_cast<const FileNode*>(a), *reinterpret_cast<const FileNode*>(b));
}

}  // namespace

UCeDirTree::~UCeDirTree() {
    DeleteItems();
}

bool UCeDirTree::Create(DWORD style, DWORD ex_style, const RECT& place, HWND parent, int id) {
    // The text is not shown: some screen readers name the tree by it, others by the hidden label before it.
    HWND window = CreateWindowExW(
        ex_style, WC_TREEVIEWW, Xlate(L"Mobile Device Browse").c_str(), style != 0 ? style : kUsualStyle,
        place.left, place.top, place.right - place.left, place.bottom - place.top, parent,
        reinterpret_cast<HMENU>(static_cast<INT_PTR>(id)), ResourceModule(), nullptr);
    if (window == nullptr || !Attach(window)) {
        return false;
    }
    LoadPictures();
    return true;
}

void UCeDirTree::LoadPictures() {
    const int pixels = ui::Scaled(kPicturePixels, ui::DpiOf(Handle()));
    UniqueImageList pictures(ImageList_Create(pixels, pixels, ILC_COLOR32, 0, 4));
    static constexpr std::array<int, 4> kIcons = {IDI_TREE_UNUSED, IDI_TREE_FOLDER_OPEN,
                                                  IDI_TREE_FOLDER_CLOSED, IDI_TREE_FILE};
    for (const int id : kIcons) {
        const UniqueIcon icon = LoadOwnedIcon(id, pixels);
        ImageList_AddIcon(pictures.Get(), icon.Get());
    }
    TreeView_SetImageList(Handle(), pictures.Get(), TVSIL_STATE);
    pictures_ = std::move(pictures);
}

bool UCeDirTree::AddFilter(const std::wstring& pattern) {
    if (pattern.size() > kMaxPatternChars) {
        return false;
    }
    filters_.push_back(pattern);
    return true;
}

bool UCeDirTree::Reload() {
    DeleteItems();
    RedrawWindow(Handle(), nullptr, nullptr, RDW_INVALIDATE | RDW_ERASE | RDW_UPDATENOW);
    ShowWaitDialog();
    Sleep(kPauseBeforeReadMs);
    reader_.ReadDeviceTree(L"\\", filters_, root_, Handle());
    // Impatient clicks are not to start the next read, nor to press what comes up now.
    ui::DropPendingInput();
    return false;
}

void UCeDirTree::DeleteItems() {
    if (Handle() == nullptr) {
        return;
    }
    SetWindowRedraw(Handle(), FALSE);
    // First, so that the selection does not wander through the items that are still there.
    TreeView_SelectItem(Handle(), nullptr);
    TreeView_DeleteAllItems(Handle());
    SetWindowRedraw(Handle(), TRUE);
}

void UCeDirTree::ShowWaitDialog() {
    HWND focus = GetFocus();
    wait_dialog_ =
        std::make_unique<CLoadProgressDlg>(Xlate(L"Reading from remote device. Please wait..."), Handle());
    if (wait_dialog_->Create()) {
        wait_dialog_->ShowPainted();
    }
    if (focus != nullptr) {
        SetFocus(focus);
    }
}

void UCeDirTree::OnLoaded() {
    // Of the messages of several reads the first finds the last read complete; the others find it shown.
    if (wait_dialog_ == nullptr) {
        return;
    }
    wait_dialog_.reset();
    if (reader_.Result() == DeviceResult::kDone) {
        SetWindowRedraw(Handle(), FALSE);
        InsertChildren(root_, TVI_ROOT);
        SelectPath(path_to_select_);
        SetWindowRedraw(Handle(), TRUE);
        // What was selected while nothing was drawn need not have scrolled into view.
        TreeView_EnsureVisible(Handle(), TreeView_GetSelection(Handle()));
    } else if (reader_.Result() == DeviceResult::kFailed) {
        ShowMessage(Xlate(L"failed to read from remote device"));
    }
}

// Recurses as deep as the device's folders are nested, which the length of a path limits to some 130 levels.
void UCeDirTree::InsertChildren(const FileNode& node, HTREEITEM parent) {
    for (const FileNode& child : node.Children()) {
        const bool is_folder = child.is_folder != 0;
        TVINSERTSTRUCTW insert{};
        insert.hParent = parent;
        insert.hInsertAfter = TVI_LAST;
        insert.item.mask = TVIF_TEXT | TVIF_PARAM | TVIF_STATE;
        insert.item.pszText = const_cast<wchar_t*>(child.name.c_str());
        insert.item.lParam = reinterpret_cast<LPARAM>(&child);
        insert.item.state = StateOf(InitialPicture(child)) | (is_folder ? TVIS_BOLD : 0U);
        insert.item.stateMask = TVIS_STATEIMAGEMASK | (is_folder ? TVIS_BOLD : 0U);
        auto* const item = TreeView_InsertItem(Handle(), &insert);
        if (item != nullptr) {
            InsertChildren(child, item);
        }
    }
    TVSORTCB sort{};
    sort.hParent = parent;
    sort.lpfnCompare = CompareItems;
    TreeView_SortChildrenCB(Handle(), &sort, FALSE);
}

void UCeDirTree::SelectPath(const std::wstring& path) {
    HTREEITEM found = nullptr;
    for (const std::wstring_view piece : PathPieces(path)) {
        HTREEITEM folder = FindFolder(found, piece);
        if (folder == nullptr) {
            break;
        }
        TreeView_Expand(Handle(), folder, TVE_EXPAND);
        found = folder;
    }
    if (found != nullptr) {
        TreeView_SelectItem(Handle(), found);
    }
}

HTREEITEM UCeDirTree::FindFolder(HTREEITEM parent, std::wstring_view name) const {
    HTREEITEM item = parent != nullptr ? TreeView_GetChild(Handle(), parent) : TreeView_GetRoot(Handle());
    for (; item != nullptr; item = TreeView_GetNextSibling(Handle(), item)) {
        const FileNode& node = NodeOf(item);
        if (node.is_folder != 0 && EqualIgnoringCase(node.name, name)) {
            break;
        }
    }
    return item;
}

std::optional<std::wstring> UCeDirTree::SelectedPath(Selection wanted) const {
    HTREEITEM item = SelectedItem();
    if (item == nullptr || (wanted == Selection::kFilesOnly && IsFolder(item))) {
        return std::nullopt;
    }
    std::wstring path = PathOf(item);
    if (IsFolder(item)) {
        path += L'\\';
    }
    return path;
}

std::optional<LRESULT> UCeDirTree::OnMessage(UINT message, WPARAM wparam, LPARAM lparam) {
    switch (message) {
        case kDeviceTreeLoadedMessage:
            OnLoaded();
            return 0;
        case kDpiChangedAfterParent:
            LoadPictures();
            return std::nullopt;
        case WM_KEYDOWN:
            if (wparam != VK_F5) {
                return std::nullopt;
            }
            OnRefresh();
            return 0;
        case WM_RBUTTONDOWN:
            SetCapture(Handle());
            return 0;
        case WM_RBUTTONUP:
            return OnRightButtonUp({GET_X_LPARAM(lparam), GET_Y_LPARAM(lparam)});
        case WM_CONTEXTMENU:
            if (GET_X_LPARAM(lparam) == -1 && GET_Y_LPARAM(lparam) == -1) {
                OnContextMenuKey();
                return 0;
            }
            return std::nullopt;
        case WM_COMMAND:
            if (LOWORD(wparam) == IDM_TREE_PROPERTY) {
                OnProperty();
                return 0;
            }
            if (LOWORD(wparam) == IDM_TREE_REFRESH) {
                OnRefresh();
                return 0;
            }
            return std::nullopt;
        default:
            return std::nullopt;
    }
}

std::optional<LRESULT> UCeDirTree::OnReflected(UINT message, WPARAM /*wparam*/, LPARAM lparam) {
    if (message != WM_NOTIFY) {
        return std::nullopt;
    }
    switch (reinterpret_cast<const NMHDR*>(lparam)->code) {
        case TVN_ITEMEXPANDEDW:
            OnExpanded(*reinterpret_cast<const NMTREEVIEWW*>(lparam));
            return 0;
        case NM_DBLCLK:
            OnDoubleClick();
            return 0;
        default:
            return std::nullopt;
    }
}

std::optional<LRESULT> UCeDirTree::OnRightButtonUp(POINT point) {
    if (GetCapture() != Handle()) {
        return std::nullopt;
    }
    ReleaseCapture();
    POINT screen_point = point;
    ClientToScreen(Handle(), &screen_point);
    RECT window{};
    GetWindowRect(Handle(), &window);
    if (PtInRect(&window, screen_point)) {
        TVHITTESTINFO hit{};
        hit.pt = point;
        TreeView_HitTest(Handle(), &hit);
        // The selected item of now: a tree that gets the focus selects its first item if it has none.
        ShowContextMenu((hit.flags & TVHT_ONITEM) != 0 ? hit.hItem : SelectedItem(), screen_point);
    }
    return 0;
}

void UCeDirTree::OnContextMenuKey() {
    HTREEITEM item = SelectedItem();
    POINT point{};
    if (item != nullptr) {
        TreeView_EnsureVisible(Handle(), item);
        RECT label{};
        TreeView_GetItemRect(Handle(), item, &label, TRUE);
        point = {label.left, label.bottom};
    }
    ClientToScreen(Handle(), &point);
    ShowContextMenu(item, point);
}

void UCeDirTree::ShowContextMenu(HTREEITEM item, POINT screen_point) {
    SetFocus(Handle());
    const UniqueMenu menu(LoadMenuW(ResourceModule(), MAKEINTRESOURCEW(IDR_TREE_MENU)));
    XlateMenu(menu.Get());
    if (item == nullptr) {
        EnableMenuItem(menu.Get(), IDM_TREE_PROPERTY, MF_BYCOMMAND | MF_GRAYED | MF_DISABLED);
    } else if (item != SelectedItem()) {
        TreeView_SelectItem(Handle(), item);
    }
    TrackPopupMenu(GetSubMenu(menu.Get(), 0), 0, screen_point.x, screen_point.y, 0, Handle(), nullptr);
}

void UCeDirTree::OnProperty() {
    if (HTREEITEM item = SelectedItem(); item != nullptr) {
        UCeFilePropertyDlg(PathOf(item), NodeOf(item), Handle()).DoModal();
    }
}

void UCeDirTree::OnRefresh() {
    path_to_select_ = current_folder_;
    if (!Reload()) {
        // Meant: every refresh ends here, and the tree is filled behind the message box.
        ShowMessage(Xlate(L"Failed to read from remote device."));
    }
}

void UCeDirTree::OnExpanded(const NMTREEVIEWW& notification) {
    if ((notification.itemNew.state & TVIS_BOLD) == 0) {
        return;
    }
    if (notification.action == TVE_COLLAPSE) {
        SetPicture(notification.itemNew.hItem, TreePicture::kClosedFolder);
    } else if (notification.action == TVE_EXPAND) {
        SetPicture(notification.itemNew.hItem, TreePicture::kOpenFolder);
    }
}

void UCeDirTree::OnDoubleClick() {
    HTREEITEM item = SelectedItem();
    if (item == nullptr || !IsFolder(item) || TreeView_GetChild(Handle(), item) != nullptr) {
        return;
    }
    const UINT picture = TreeView_GetItemState(Handle(), item, TVIS_STATEIMAGEMASK) & TVIS_STATEIMAGEMASK;
    SetPicture(item, picture == StateOf(TreePicture::kOpenFolder) ? TreePicture::kClosedFolder
                                                                  : TreePicture::kOpenFolder);
}

const FileNode& UCeDirTree::NodeOf(HTREEITEM item) const {
    TVITEMW data{};
    data.mask = TVIF_HANDLE | TVIF_PARAM;
    data.hItem = item;
    TreeView_GetItem(Handle(), &data);
    return *reinterpret_cast<const FileNode*>(data.lParam);
}

std::wstring UCeDirTree::PathOf(HTREEITEM item) const {
    std::wstring path;
    for (; item != nullptr; item = TreeView_GetParent(Handle(), item)) {
        path.insert(0, L"\\" + NodeOf(item).name);
    }
    return path;
}

bool UCeDirTree::IsFolder(HTREEITEM item) const {
    return (TreeView_GetItemState(Handle(), item, TVIS_BOLD) & TVIS_BOLD) != 0;
}

void UCeDirTree::SetPicture(HTREEITEM item, TreePicture picture) {
    TreeView_SetItemState(Handle(), item, StateOf(picture), TVIS_STATEIMAGEMASK);
}

void UCeDirTree::ShowMessage(const std::wstring& text) const {
    ui::ShowMessageBox(Handle(), text);
}

}  // namespace orvane
