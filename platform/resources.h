// The program's own resources. They lie in the executable, whether that is the program or a test of it.
#pragma once

#include <windows.h>

#include <string>

#include "platform/handles.h"

namespace orvane {

inline HINSTANCE ResourceModule() {
    return GetModuleHandleW(nullptr);
}

// The text of a string resource; empty when there is none of that number.
inline std::wstring ResourceString(UINT id) {
    // With a buffer size of 0 LoadStringW hands out a pointer to the text in the resource itself, which is
    // not terminated.
    const wchar_t* text = nullptr;
    const int length = LoadStringW(ResourceModule(), id, reinterpret_cast<LPWSTR>(&text), 0);
    return length > 0 ? std::wstring(text, static_cast<std::size_t>(length)) : std::wstring();
}

// A copy of the icon that the caller owns, `pixels` wide and high. Empty when there is no such icon.
inline UniqueIcon LoadOwnedIcon(int id, int pixels) {
    return UniqueIcon(static_cast<HICON>(
        LoadImageW(ResourceModule(), MAKEINTRESOURCEW(id), IMAGE_ICON, pixels, pixels, LR_DEFAULTCOLOR)));
}

}  // namespace orvane
