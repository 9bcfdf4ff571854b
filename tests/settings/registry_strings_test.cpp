#include "settings/registry_strings.h"

#include <gtest/gtest.h>

#include "tests/support/scratch_registry.h"

namespace orvane {
namespace {

constexpr const wchar_t* kKey = L"Software\\orvane\\key";

class RegistryStrings : public ::testing::Test {
  protected:
    // Stores bytes as they are, without a terminator that the text does not have.
    static void Store(DWORD type, const void* data, std::size_t bytes) {
        ASSERT_TRUE(RegWriteString(HKEY_CURRENT_USER, kKey, L"value", L""));
        ASSERT_EQ(RegSetKeyValueW(HKEY_CURRENT_USER, kKey, L"value", type, data, static_cast<DWORD>(bytes)),
                  ERROR_SUCCESS);
    }
    // What is read, "(none)" for a failure, which must leave the text empty.
    static std::wstring Read() {
        std::wstring text = L"old";
        if (RegReadString(HKEY_CURRENT_USER, kKey, L"value", text)) {
            return text;
        }
        EXPECT_EQ(text, L"");
        return L"(none)";
    }

    testing::ScratchRegistry registry_;
};

TEST_F(RegistryStrings, AreReadUpTo509CharactersWhateverTheirType) {
    const std::wstring longest(509, L'x');
    const std::wstring too_long(510, L'x');
    const DWORD digit = L'1';
    EXPECT_EQ(Read(), L"(none)") << "no key";
    EXPECT_FALSE(RegWriteString(nullptr, kKey, L"value", L"text"));
    const struct {
        DWORD type;
        const void* data;
        std::size_t bytes;
        std::wstring expected;
    } cases[] = {
        {REG_SZ, longest.c_str(), 509 * 2, longest},
        {REG_SZ, longest.c_str(), 510 * 2, longest},
        {REG_SZ, too_long.c_str(), 510 * 2, L"(none)"},
        {REG_SZ, too_long.c_str(), 511 * 2, L"(none)"},
        {REG_BINARY, too_long.c_str(), 510 * 2, L"(none)"},
        {REG_SZ, L"", 0, L""},
        {REG_SZ, L"a\0b", 4 * 2, L"a"},
        {REG_MULTI_SZ, L"a\0b\0", 5 * 2, L"a"},
        {REG_EXPAND_SZ, L"%TEMP%", 7 * 2, L"%TEMP%"},
        {REG_DWORD, &digit, 4, L"1"},
        {REG_BINARY, L"ab", 3, std::wstring{L'a', L'b'}},
    };
    for (const auto& c : cases) {
        Store(c.type, c.data, c.bytes);
        EXPECT_EQ(Read(), c.expected) << (&c - cases);
    }
}

}  // namespace
}  // namespace orvane
