// A job folder on either side.
#pragma once

#include <gtest/gtest.h>

#include <string>
#include <string_view>
#include <vector>

#include "tests/support/folder_device.h"
#include "tests/support/scratch_registry.h"
#include "tests/support/temp_folder.h"

namespace orvane::testing {

using Lines = std::vector<std::wstring>;

// "\Jobs" on the folder device and a folder of the PC, both empty, and an empty registry.
class JobFolders : public ::testing::Test {
  protected:
    JobFolders() { MakeFolder(OnDevice(L"")); }

    std::wstring OnPc(const std::wstring& name) const { return pc_ / name; }
    std::wstring OnDevice(const std::wstring& name) const { return device_.PcPath(L"\\Jobs\\" + name); }
    // Files of that name, written that many seconds after noon.
    void PutOnPc(const std::wstring& name, int seconds = 0, std::string_view content = "from the PC") const {
        WriteTextFile(OnPc(name), content, AddSeconds(noon_, seconds));
    }
    void PutOnDevice(const std::wstring& name, int seconds = 0,
                     std::string_view content = "from the device") const {
        WriteTextFile(OnDevice(name), content, AddSeconds(noon_, seconds));
    }
    Lines PcFiles() const { return ListTree(pc_.Path()); }
    Lines DeviceFiles() const { return ListTree(device_.PcPath(L"\\Jobs")); }

    ScratchRegistry registry_;
    FolderDevice device_;
    TempFolder pc_;
    const FILETIME noon_ = UtcTime(2024, 3, 1, 12);
};

}  // namespace orvane::testing
