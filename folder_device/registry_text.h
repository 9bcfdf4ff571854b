// The device's registry, kept as a text file of sections (ini_text.h): a section for each key, named by its
// full path, a line for each value.
//
//   [HKEY_CURRENT_USER\Software\Veltrano\Dunhallow]
//   DataDirectory=\My Documents\Jobs
//   Units=dword:0000002a
//   Token=hex:01 ff 20
//   Unusual=hex(1):41 00 42 00
//   @=the value without a name
//
// A plain text is a REG_SZ and is given out with its terminator; a text in double quotes loses these and is
// taken as it stands. "dword:" takes up to eight hexadecimal digits, "hex:" the bytes of a REG_BINARY,
// "hex(n):" those of a value of type n, given out exactly so. A value that cannot be understood is not there.
// The roots may be shortened to HKCR, HKCU, HKLM and HKU.
#pragma once

#include <windows.h>

#include <optional>
#include <string>
#include <string_view>
#include <vector>

#include "folder_device/ini_text.h"

namespace folder_device {

struct RegistryValue {
    DWORD type = REG_NONE;
    std::vector<BYTE> data;
};

class RegistryText {
  public:
    // A file that cannot be read is an empty registry.
    explicit RegistryText(const std::wstring& file);

    // Whether the key, a full path with the root's long name, has a section or lies above one.
    bool HasKey(std::wstring_view key) const;
    std::optional<RegistryValue> Value(std::wstring_view key, std::wstring_view name) const;

  private:
    IniText sections_;
};

// The long name of one of the predefined keys; empty for any other.
std::wstring RootKeyName(HKEY key);

}  // namespace folder_device
