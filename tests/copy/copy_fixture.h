// A folder on the PC and a device, for the tests of copies between them.
#pragma once

#include <gtest/gtest.h>

#include <optional>
#include <string>

#include "copy/copy_context.h"
#include "device/connect.h"
#include "tests/support/folder_device.h"
#include "tests/support/temp_folder.h"

namespace orvane::testing {

class CopyTest : public ::testing::Test {
  protected:
    CopyTest() { Clear(); }

    // Begins anew: nothing on either side, no faults, an empty trace.
    void Clear() {
        device_.reset();  // Before its successor, which takes over the settings.
        device_.emplace();
        device_->StartTrace();
        pc_.emplace();
    }
    std::wstring OnPc(std::wstring_view relative) const { return *pc_ / relative; }
    std::wstring OnDevice(const std::wstring& relative) const { return device_->Root() + L"\\" + relative; }
    // The paths of one name on both sides, as the program uses them.
    EntryPaths Paths(const std::wstring& relative) const { return {OnPc(relative), L"\\" + relative}; }

    // Every session was closed, and nothing was asked of the device outside of one, but for the second
    // closing of file and session that is meant after a full disk.
    void ExpectBalancedSessions(bool after_full_disk = false) const {
        int open = 0;
        int outside = 0;
        for (const TraceLine& call : device_->Trace()) {
            const bool begins = call.function == L"CeRapiInitEx";
            const bool ends = call.function == L"CeRapiUninit";
            if (begins || ends) {
                open += call.error != 0 ? 0 : begins ? 1 : -1;
                outside += ends && call.error != 0 ? 1 : 0;
            } else if (call.sessions == 0) {
                ++outside;
            }
        }
        EXPECT_EQ(open, 0);
        EXPECT_EQ(outside, after_full_disk ? 2 : 0);
    }
    // No side holds a copy in the making.
    void ExpectNothingAside() const {
        ExpectNothingAside(pc_->Path());
        ExpectNothingAside(device_->Root());
    }
    static void ExpectNothingAside(const std::wstring& folder) {
        for (const std::wstring& name : ListTree(folder)) {
            EXPECT_FALSE(name.ends_with(L".orvane-part")) << ::testing::PrintToString(name);
        }
    }

    // Bytes that differ from chunk to chunk.
    static std::string Content(std::size_t size) {
        std::string content(size, '\0');
        for (std::size_t i = 0; i < size; ++i) {
            content[i] = static_cast<char>((i * 7 + i / 251) % 256);
        }
        return content;
    }

    std::optional<FolderDevice> device_;
    std::optional<TempFolder> pc_;
    CancelEvent cancel_;
};

}  // namespace orvane::testing
