// The dialog that picks a folder on the PC.
#pragma once

#include <windows.h>

#include <commdlg.h>

#include <cstddef>
#include <string>
#include <string_view>

#include "platform/paths.h"

namespace orvane {

// What the user chose. PC paths without "\" at their end: of a drive's root only "C:" is left.
struct ChosenFolder {
    std::wstring folder;     // What was chosen.
    std::wstring directory;  // The folder part of the file path that the file dialog answered.
};

// `field`: the text of the current-directory field when OK was pressed. `file_path` and `name_offset`: the
// file path that the file dialog answered, and where in it the file's name begins. The field's text is what
// counts, unless the system has abbreviated it with "...".
ChosenFolder ChosenFolderOf(std::wstring_view field, std::wstring_view file_path, std::size_t name_offset);

// The system's old-style dialog for saving a file, on a template of which only the parts that have to do
// with folders can be seen. The process's current directory is the same before and after DoModal, however
// that ends.
class CFolderDialog {
  public:
    // `initial_text` is what the current-directory field shows first; `initial_directory` is where the
    // dialog begins to browse, if that exists. The number has no meaning. An empty title stands
    // for the template's caption, a null parent for the thread's active window.
    CFolderDialog(std::wstring initial_text, std::wstring initial_directory, int unused, std::wstring title,
                  HWND parent);

    // IDOK or IDCANCEL; the latter also when the dialog cannot be shown.
    INT_PTR DoModal();

    // What was chosen, after IDOK.
    ChosenFolder Chosen() const;

    // The text of the current-directory field: while the dialog runs the dialog keeps it.
    void SetChosenDirectory(std::wstring text) { chosen_directory_ = std::move(text); }

  private:
    static UINT_PTR CALLBACK Hook(HWND window, UINT message, WPARAM wparam, LPARAM lparam) noexcept;
    UINT_PTR OnMessage(HWND window, UINT message, WPARAM wparam);
    void OnInitDialog(HWND window);
    void OnFirstPaint(HWND window);
    void OnOk(HWND window);

    std::wstring chosen_directory_;
    std::wstring initial_text_;
    std::wstring initial_directory_;
    std::wstring title_;
    HWND parent_;
    bool select_first_entry_ = false;
    wchar_t file_path_[kPathBufferChars] = {};
    OPENFILENAMEW record_ = {};
};

}  // namespace orvane
