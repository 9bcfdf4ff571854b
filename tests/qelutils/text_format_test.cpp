#include "qelutils/text_format.h"

#include <gtest/gtest.h>

namespace {

TEST(TextFormat, FillsPlaceholdersAndKeepsEverythingElse) {
    // The arguments are "3", "7" and, as a text that looks like a pattern, "{1}{{".
    const wchar_t* const cases[][2] = {
        {L"{{Copying File {1}/{2}  - x}", L"{Copying File 3/7  - x}"},
        {L"{3}{2}{1}", L"{1}{{73"},
        {L"{0}{4}{-1}{x}{}{ 1}{18446744073709551617}", L"{0}{4}{-1}{x}{}{ 1}{18446744073709551617}"},
        {L"{4{1}", L"{43"},
        {L"{1", L"{1"},
        {L"a{", L"a{"},
    };
    for (const auto& [pattern, expected] : cases) {
        EXPECT_EQ(qel_text::detail::qel_safefmt_impl(pattern, {L"3", L"7", L"{1}{{"}), expected) << pattern;
    }
}

TEST(TextFormat, GivesNothingRatherThanACutText) {
    EXPECT_EQ(qel_text::Format(L"%02d/%04d", static_cast<unsigned short>(5), -1), L"05/-001");
    EXPECT_EQ(qel_text::Format(L"%255d", 1).size(), 255U);
    EXPECT_EQ(qel_text::Format(L"%256d", 1), L"");
}

}  // namespace
