// Icons of the program's resources.
#pragma once

#include <windows.h>

#include "platform/handles.h"
#include "platform/resources.h"

namespace orvane {

// A copy of the icon that the caller owns, `pixels` wide and high; 0 means the system's size for icons.
// Empty when there is no such icon.
inline UniqueIcon LoadOwnedIcon(int id, int pixels = 0) {
    const UINT flags = pixels == 0 ? LR_DEFAULTSIZE : LR_DEFAULTCOLOR;
    return UniqueIcon(static_cast<HICON>(
        LoadImageW(ResourceModule(), MAKEINTRESOURCEW(id), IMAGE_ICON, pixels, pixels, flags)));
}

}  // namespace orvane
