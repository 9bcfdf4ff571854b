#include "ui/message_box.h"

#include "platform/resources.h"
#include "res/ids.h"

namespace orvane::ui {

int ShowMessageBox(HWND owner, const std::wstring& text, UINT style, const std::wstring& caption) {
    const std::wstring title = caption.empty() ? ResourceString(IDS_APPLICATION_NAME) : caption;
    return MessageBoxW(owner, text.c_str(), title.c_str(), style);
}

}  // namespace orvane::ui
