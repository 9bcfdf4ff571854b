// String values in the PC's registry.
#pragma once

#include <windows.h>

#include <string>

namespace orvane {

// Reads a value as text, whatever its type, of at most 509 characters. False, with an empty text, when the
// key cannot be opened with full access or the value is missing or longer.
bool RegReadString(HKEY root, const std::wstring& subkey, const std::wstring& name, std::wstring& text);

// Writes a REG_SZ value without a terminator of its own, creating the key when it cannot be opened. False
// when there is no key to write to; whether the value itself could be stored is not told.
bool RegWriteString(HKEY root, const std::wstring& subkey, const std::wstring& name,
                    const std::wstring& text);

}  // namespace orvane
