// A registry of its own for one test.
#pragma once

#include <gtest/gtest.h>
#include <windows.h>

#include <utility>

namespace orvane::testing {

// As long as it lives, the current user's and the local machine's registry are two empty keys to this
// process, so that tests neither find nor leave settings in the real ones. One at a time.
class ScratchRegistry {
  public:
    ScratchRegistry() {
        RegDeleteTreeW(HKEY_CURRENT_USER, kKey);  // Of a test program that was ended.
        // The current user's root comes last, since the scratch keys lie below the real one.
        for (const auto& [root, path] : {std::pair{HKEY_LOCAL_MACHINE, L"Software\\orvane_test\\machine"},
                                         std::pair{HKEY_CURRENT_USER, L"Software\\orvane_test\\user"}}) {
            HKEY key = nullptr;
            EXPECT_EQ(RegCreateKeyW(HKEY_CURRENT_USER, path, &key), ERROR_SUCCESS);
            EXPECT_EQ(RegOverridePredefKey(root, key), ERROR_SUCCESS);
            RegCloseKey(key);
        }
    }
    ~ScratchRegistry() {
        EXPECT_EQ(RegOverridePredefKey(HKEY_CURRENT_USER, nullptr), ERROR_SUCCESS);
        EXPECT_EQ(RegOverridePredefKey(HKEY_LOCAL_MACHINE, nullptr), ERROR_SUCCESS);
        EXPECT_EQ(RegDeleteTreeW(HKEY_CURRENT_USER, kKey), ERROR_SUCCESS);
    }
    ScratchRegistry(const ScratchRegistry&) = delete;
    ScratchRegistry& operator=(const ScratchRegistry&) = delete;

  private:
    static constexpr const wchar_t* kKey = L"Software\\orvane_test";
};

}  // namespace orvane::testing
