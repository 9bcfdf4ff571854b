// The program's own resources. They lie in the executable, whether that is the program or a test of it.
#pragma once

#include <windows.h>

#include <string>

namespace orvane {

inline HINSTANCE ResourceModule() {
    return GetModuleHandleW(nullptr);
}

// The text of a string resource; empty when there is none of that number.
std::wstring ResourceString(UINT id);

}  // namespace orvane
