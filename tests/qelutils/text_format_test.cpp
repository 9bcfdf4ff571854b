#include "qelutils/text_format.h"

#include <gtest/gtest.h>

#include <climits>

namespace {

TEST(TextFormat, FillsPlaceholdersAndKeepsEverythingElse) {
    struct Case {
        const wchar_t* pattern;
        const wchar_t* expected;
    };
    // The arguments are "3", "7" and, as a text that looks like a pattern, "{1}{{".
    const Case cases[] = {
        {L"", L""},
        {L"{{Copying File {1}/{2}  - x}", L"{Copying File 3/7  - x}"},
        {L"{2}{1}{1}", L"733"},
        {L"{3}{1}", L"{1}{{3"},
        {L"{{1}", L"{1}"},
        {L"{{{1}}", L"{3}"},
        {L"}}", L"}}"},
        {L"{0}{4}{9}{-1}{x}{}{ 1}", L"{0}{4}{9}{-1}{x}{}{ 1}"},
        {L"{18446744073709551617}", L"{18446744073709551617}"},
        {L"{4{1}", L"{43"},
        {L"{1", L"{1"},
        {L"a{", L"a{"},
    };
    for (const Case& c : cases) {
        EXPECT_EQ(qel_text::detail::qel_safefmt_impl(c.pattern, {L"3", L"7", L"{1}{{"}), c.expected)
            << c.pattern;
    }
    EXPECT_EQ(qel_text::detail::qel_safefmt_impl(L"{1}", {}), L"{1}");
}

TEST(TextFormat, WritesNumbers) {
    EXPECT_EQ(qel_formats::IntToString(INT_MIN), L"-2147483648");
    EXPECT_EQ(
        qel_text::Format(L"%02d/%02d/%04d %02d:%02d:%02d", static_cast<unsigned short>(5), 3, 2024, 9, 7, -1),
        L"05/03/2024 09:07:-1");
    EXPECT_EQ(qel_text::Format(L"%255d", 1).size(), 255U);
    EXPECT_EQ(qel_text::Format(L"%256d", 1), L"");
}

}  // namespace
