#include "controls/sorted_header.h"

#include "platform/handles.h"

namespace orvane {

namespace {

// The longest column text that is drawn, with its terminator.
constexpr int kTextSize = 256;

UINT TextFlags(int format) {
    const UINT flags = DT_VCENTER | DT_SINGLELINE | DT_END_ELLIPSIS | DT_NOPREFIX;
    switch (format & HDF_JUSTIFYMASK) {
        case HDF_CENTER:
            return flags | DT_CENTER;
        case HDF_RIGHT:
            return flags | DT_RIGHT;
        default:
            return flags | DT_LEFT;
    }
}

}  // namespace

bool CSortedHeaderCtrl::Attach(HWND header) {
    if (!ui::Control::Attach(header)) {
        return false;
    }
    const int count = ColumnCount();
    for (int column = 0; column < count; ++column) {
        HDITEMW item{};
        item.mask = HDI_FORMAT;
        SendMessageW(header, HDM_GETITEMW, static_cast<WPARAM>(column), reinterpret_cast<LPARAM>(&item));
        // On the way PassItem adds the owner-drawn flag.
        SendMessageW(header, HDM_SETITEMW, static_cast<WPARAM>(column), reinterpret_cast<LPARAM>(&item));
    }
    return true;
}

void CSortedHeaderCtrl::SetSortColumn(int column, bool ascending) {
    sort_column_ = column;
    ascending_ = ascending;
    InvalidateRect(Handle(), nullptr, TRUE);
}

RECT CSortedHeaderCtrl::ColumnRect(int column) const {
    RECT rect{};
    Direct(HDM_GETITEMRECT, static_cast<WPARAM>(column), reinterpret_cast<LPARAM>(&rect));
    return rect;
}

void CSortedHeaderCtrl::SetColumnImage(int column, int image) {
    column_images_[column] = image;
    InvalidateRect(Handle(), nullptr, TRUE);
}

std::optional<LRESULT> CSortedHeaderCtrl::OnMessage(UINT message, WPARAM wparam, LPARAM lparam) {
    switch (message) {
        case HDM_INSERTITEMW:
        case HDM_SETITEMW:
            return PassItem(message, wparam, lparam);
        case WM_ERASEBKGND:
            // OnPaint covers every pixel.
            return TRUE;
        case WM_PAINT:
            OnPaint();
            return 0;
        default:
            return std::nullopt;
    }
}

std::optional<LRESULT> CSortedHeaderCtrl::OnReflected(UINT message, WPARAM /*wparam*/, LPARAM lparam) {
    if (message != WM_DRAWITEM) {
        return std::nullopt;
    }
    DrawItem(*reinterpret_cast<const DRAWITEMSTRUCT*>(lparam));
    return TRUE;
}

// The list inserts and changes columns with formats that know nothing of owner drawing.
LRESULT CSortedHeaderCtrl::PassItem(UINT message, WPARAM wparam, LPARAM lparam) {
    HDITEMW item = *reinterpret_cast<const HDITEMW*>(lparam);
    if (message == HDM_INSERTITEMW && (item.mask & HDI_FORMAT) == 0) {
        item.mask |= HDI_FORMAT;
        item.fmt = HDF_LEFT | HDF_STRING;
    }
    item.fmt |= HDF_OWNERDRAW;
    return Default(message, wparam, reinterpret_cast<LPARAM>(&item));
}

void CSortedHeaderCtrl::OnPaint() {
    PAINTSTRUCT paint{};
    HDC window_dc = BeginPaint(Handle(), &paint);
    RECT client{};
    GetClientRect(Handle(), &client);
    const UniqueBitmap bitmap(CreateCompatibleBitmap(window_dc, client.right, client.bottom));
    const UniqueMemoryDc memory_dc(CreateCompatibleDC(window_dc));
    if (bitmap && memory_dc) {
        HDC dc = memory_dc.Get();
        HGDIOBJ previous = SelectObject(dc, bitmap.Get());
        FillRect(dc, &client, GetSysColorBrush(COLOR_3DFACE));
        Default(WM_PRINTCLIENT, reinterpret_cast<WPARAM>(dc), PRF_CLIENT);
        BitBlt(window_dc, 0, 0, client.right, client.bottom, dc, 0, 0, SRCCOPY);
        SelectObject(dc, previous);
    } else {
        // No memory for the buffer (or an empty window): flicker rather than show nothing.
        Default(WM_PRINTCLIENT, reinterpret_cast<WPARAM>(window_dc), PRF_CLIENT);
    }
    EndPaint(Handle(), &paint);
}

// All distances are in units of two blanks of the header's font, which the header has selected into the
// context.
void CSortedHeaderCtrl::DrawItem(const DRAWITEMSTRUCT& item) {
    HDC dc = item.hDC;
    const int column = static_cast<int>(item.itemID);
    FillRect(dc, &item.rcItem, GetSysColorBrush(COLOR_3DFACE));
    SIZE blank{};
    GetTextExtentPoint32W(dc, L" ", 1, &blank);
    const int unit = 2 * blank.cx;

    RECT text_rect = item.rcItem;
    text_rect.left += DrawColumnImage(dc, column, item.rcItem.left, unit);
    wchar_t text[kTextSize] = L"";
    HDITEMW header_item{};
    header_item.mask = HDI_TEXT | HDI_FORMAT;
    header_item.pszText = text;
    header_item.cchTextMax = kTextSize;
    Direct(HDM_GETITEMW, item.itemID, reinterpret_cast<LPARAM>(&header_item));
    if ((item.itemState & ODS_SELECTED) != 0) {
        // The text moves as the header button is pushed.
        text_rect.left += 1;
        text_rect.top += 2;
        text_rect.right += 1;
    }
    if (column == sort_column_) {
        text_rect.right -= 3 * unit;
    }
    InflateRect(&text_rect, -unit, 0);
    SetBkMode(dc, TRANSPARENT);
    SetTextColor(dc, GetSysColor(COLOR_BTNTEXT));
    DrawTextW(dc, text, -1, &text_rect, TextFlags(header_item.fmt));
    if (column == sort_column_) {
        DrawSortMark(dc, item.rcItem, unit);
    }
}

// The width that the image takes from the text, 0 without one.
int CSortedHeaderCtrl::DrawColumnImage(HDC dc, int column, int left, int unit) {
    auto* images = reinterpret_cast<HIMAGELIST>(Direct(HDM_GETIMAGELIST, 0, 0));
    const auto found = column_images_.find(column);
    if (images == nullptr || found == column_images_.end() || found->second == -1) {
        return 0;
    }
    ImageList_Draw(images, found->second, dc, left + unit, unit / 3, ILD_TRANSPARENT);
    IMAGEINFO info{};
    if (!ImageList_GetImageInfo(images, found->second, &info)) {
        return 0;
    }
    return unit / 2 + info.rcImage.right - info.rcImage.left;
}

void CSortedHeaderCtrl::DrawSortMark(HDC dc, const RECT& item, int unit) const {
    const int right = item.right - 1;
    const int bottom = item.bottom - 1;
    const int near_side = right - 3 * unit / 2;
    const int far_side = right - 5 * unit / 2;
    const int middle = right - 2 * unit;
    const COLORREF light = GetSysColor(COLOR_3DHILIGHT);
    const COLORREF dark = GetSysColor(COLOR_3DSHADOW);

    HGDIOBJ previous = SelectObject(dc, GetStockObject(DC_PEN));
    SetDCPenColor(dc, light);
    if (ascending_) {
        MoveToEx(dc, middle, unit - 1, nullptr);
        LineTo(dc, near_side, bottom - unit);
        LineTo(dc, far_side - 2, bottom - unit);
        MoveToEx(dc, far_side - 1, bottom - unit - 1, nullptr);
        SetDCPenColor(dc, dark);
        LineTo(dc, middle, unit - 2);
    } else {
        MoveToEx(dc, near_side, unit - 1, nullptr);
        LineTo(dc, middle - 1, bottom - unit + 1);
        MoveToEx(dc, middle - 1, bottom - unit, nullptr);
        SetDCPenColor(dc, dark);
        LineTo(dc, far_side - 1, unit - 1);
        LineTo(dc, near_side, unit - 1);
    }
    SelectObject(dc, previous);
}

}  // namespace orvane
