// The tree of all folders on the device.
#pragma once

#include <windows.h>

#include <commctrl.h>

#include <memory>
#include <optional>
#include <string>
#include <vector>

#include "browse/load_progress_dialog.h"
#include "device/device_tree_reader.h"
#include "device/file_node.h"
#include "platform/handles.h"
#include "ui/control.h"

namespace orvane {

// The pictures of the tree's items, as indices of its state image list. Picture 0 is never shown: an index
// of 0 means no picture.
enum class TreePicture : unsigned { kOpenFolder = 1, kClosedFolder = 2, kFile = 3 };

// A tree view that shows the device from its root down. The whole device is read in one pass on the
// window's thread, behind a wait dialog; expanding an item never asks the device. Folders are shown in bold
// type, which is also how the tree tells them from files.
//
// F5 refreshes; Shift+F10 and the menu key open the context menu that a right click opens.
//
// Items point into the nodes that the last read left, which the object owns: the items go before the nodes
// do. The window belongs to its parent; the object may end before it or after it.
class UCeDirTree : public ui::Control {
  public:
    enum class Selection { kAny, kFilesOnly };

    UCeDirTree() = default;
    ~UCeDirTree() override;

    // Creates the window; false when that fails. A style of 0 stands for the usual style of such a tree.
    bool Create(DWORD style, DWORD ex_style, const RECT& place, HWND parent, int id);

    // Adds an entry of the filter that files have to pass (see MatchesExtension; folders always show). An
    // entry has at most 15 characters: a longer one is refused with false. Without any entry all files show.
    bool AddFilter(const std::wstring& pattern);

    // Empties the tree and reads the device, which takes a second or more, handles no posted messages and
    // drops the clicks and keys that came meanwhile. The tree is filled, or the failure told to the user,
    // when the message loop runs next. Returns whether a thread of its own is reading, which is never so.
    bool Reload();

    // The selected item's path, with "\" at its end for a folder. No value when nothing is selected, or when
    // only a file will do and a folder is selected.
    std::optional<std::wstring> SelectedPath(Selection wanted = Selection::kAny) const;

    // The path that is selected, as far down as it exists, whenever the tree has been filled.
    void SetPathToSelect(std::wstring path) { path_to_select_ = std::move(path); }
    // What "Refresh" selects again. Kept by the dialog, which shows it.
    void SetCurrentFolder(std::wstring folder) { current_folder_ = std::move(folder); }

  protected:
    std::optional<LRESULT> OnMessage(UINT message, WPARAM wparam, LPARAM lparam) override;
    std::optional<LRESULT> OnReflected(UINT message, WPARAM wparam, LPARAM lparam) override;

  private:
    void LoadPictures();

    void DeleteItems();
    void ShowWaitDialog();
    void OnLoaded();
    void InsertChildren(const FileNode& node, HTREEITEM parent);
    void SelectPath(const std::wstring& path);
    HTREEITEM FindFolder(HTREEITEM parent, std::wstring_view name) const;

    std::optional<LRESULT> OnRightButtonUp(POINT point);
    void OnContextMenuKey();
    void ShowContextMenu(HTREEITEM item, POINT screen_point);
    void OnProperty();
    void OnRefresh();
    void OnExpanded(const NMTREEVIEWW& notification);
    void OnDoubleClick();

    HTREEITEM SelectedItem() const { return TreeView_GetSelection(Handle()); }
    const FileNode& NodeOf(HTREEITEM item) const;
    std::wstring PathOf(HTREEITEM item) const;
    bool IsFolder(HTREEITEM item) const;
    void SetPicture(HTREEITEM item, TreePicture picture);
    void ShowMessage(const std::wstring& text) const;

    UniqueImageList pictures_;
    FileNode root_;
    DeviceTreeReader reader_;
    std::unique_ptr<CLoadProgressDlg> wait_dialog_;
    std::vector<std::wstring> filters_;
    std::wstring path_to_select_;
    std::wstring current_folder_;
};

}  // namespace orvane
