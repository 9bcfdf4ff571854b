#include "tests/support/scratch_registry.h"

#include <gtest/gtest.h>

namespace orvane::testing {

namespace {

constexpr const wchar_t* kScratchKey = L"Software\\orvane_test";

void Replace(HKEY root, const wchar_t* subkey) {
    HKEY key = nullptr;
    EXPECT_EQ(RegCreateKeyExW(HKEY_CURRENT_USER, subkey, 0, nullptr, REG_OPTION_NON_VOLATILE, KEY_ALL_ACCESS,
                              nullptr, &key, nullptr),
              ERROR_SUCCESS);
    EXPECT_EQ(RegOverridePredefKey(root, key), ERROR_SUCCESS);
    RegCloseKey(key);
}

}  // namespace

// The current user's root comes last, since the scratch keys lie below the real one.
ScratchRegistry::ScratchRegistry() {
    RegDeleteTreeW(HKEY_CURRENT_USER, kScratchKey);  // Of a test program that was ended.
    Replace(HKEY_LOCAL_MACHINE, L"Software\\orvane_test\\machine");
    Replace(HKEY_CURRENT_USER, L"Software\\orvane_test\\user");
}

ScratchRegistry::~ScratchRegistry() {
    EXPECT_EQ(RegOverridePredefKey(HKEY_CURRENT_USER, nullptr), ERROR_SUCCESS);
    EXPECT_EQ(RegOverridePredefKey(HKEY_LOCAL_MACHINE, nullptr), ERROR_SUCCESS);
    EXPECT_EQ(RegDeleteTreeW(HKEY_CURRENT_USER, kScratchKey), ERROR_SUCCESS);
}

}  // namespace orvane::testing
