#include <gtest/gtest.h>

#include "platform/file_time.h"
#include "platform/paths.h"
#include "tests/support/temp_folder.h"

namespace orvane {
namespace {

// Standard and summer time of a zone, each from a Sunday (5: the last) of a month on.
TIME_ZONE_INFORMATION Rules(LONG bias, SYSTEMTIME standard, SYSTEMTIME summer) {
    return {bias, L"", standard, 0, L"", summer, -60};
}

TEST(LocalTime, HasTheOffsetOfItsOwnDate) {
    using testing::UtcTime;
    const TIME_ZONE_INFORMATION berlin = Rules(-60, {0, 10, 0, 5, 3, 0, 0, 0}, {0, 3, 0, 5, 2, 0, 0, 0});
    const TIME_ZONE_INFORMATION sydney = Rules(-600, {0, 4, 0, 1, 3, 0, 0, 0}, {0, 10, 0, 1, 2, 0, 0, 0});
    const std::tuple<TIME_ZONE_INFORMATION, FILETIME, FILETIME> cases[] = {
        {berlin, UtcTime(2024, 1, 15, 11, 0, 0), UtcTime(2024, 1, 15, 12, 0, 0)},
        {berlin, UtcTime(2024, 7, 15, 10, 0, 0), UtcTime(2024, 7, 15, 12, 0, 0)},
        {berlin, UtcTime(2024, 3, 31, 0, 59, 58), UtcTime(2024, 3, 31, 1, 59, 58)},
        {berlin, UtcTime(2024, 3, 31, 1, 0, 0), UtcTime(2024, 3, 31, 3, 0, 0)},
        {berlin, UtcTime(2023, 12, 31, 23, 30, 0), UtcTime(2024, 1, 1, 0, 30, 0)},
        {sydney, UtcTime(2024, 1, 15, 1, 0, 0), UtcTime(2024, 1, 15, 12, 0, 0)},
        {sydney, UtcTime(2024, 7, 15, 2, 0, 0), UtcTime(2024, 7, 15, 12, 0, 0)},
        {TIME_ZONE_INFORMATION{}, UtcTime(2024, 7, 15, 12, 0, 0), UtcTime(2024, 7, 15, 12, 0, 0)},
    };
    for (const auto& [rules, utc, local] : cases) {
        // Less than a millisecond is carried along.
        EXPECT_EQ(FileTimeTicks(ToLocalTime(LaterBy(utc, 9), rules)), FileTimeTicks(local) + 9);
        EXPECT_EQ(FileTimeTicks(FromLocalTime(LaterBy(local, 9), rules)), FileTimeTicks(utc) + 9);
    }
}

TEST(Paths, AcceptOnlyNamesThatCanBeOneComponent) {
    for (const wchar_t* name :
         {L"a", L" a", L"a.", L"a ", L"...", L".a", L"CON", L"\u00E4\U0001F4C1", L"a;b'&%~$#@"}) {
        EXPECT_TRUE(IsPathComponent(name)) << name;
    }
    for (const wchar_t* name : {L"", L".", L"..", L"a<", L"a>", L"a:b", L"a\"", L"a/b", L"a\\b", L"\\", L"a|",
                                L"a?", L"*", L"a\n", L"\x1F"}) {
        EXPECT_FALSE(IsPathComponent(name)) << name;
    }
    EXPECT_FALSE(IsPathComponent(std::wstring_view(L"a\0b", 3)));
}

TEST(Paths, AcceptOnlyNamesThatThePcKeepsAsTheyAre) {
    for (const wchar_t* path : {L"a", L"\\a", L"a\\b c\\d.e", L"\\..a\\b..c", L"CONS", L"xCON", L"COM",
                                L"COMA", L"COM10", L"LPT\u00B4", L"a.CON", L"a\\CON1.txt", L"LPT\u0661"}) {
        EXPECT_TRUE(IsSafePcRelativePath(path)) << path;
    }
    for (const wchar_t* path :
         {L"",         L"\\",        L"\\\\a", L"a\\",      L"a\\\\b",    L"..",        L"a\\..\\b",
          L"a\\.\\b",  L"a.",        L"a ",    L"a.\\b",    L"a \\b",     L"a. .",      L"C:\\a",
          L"a:stream", L"a/b",       L"CON",   L"con.txt",  L"a\\Nul\\b", L"PRN .txt",  L"AUX.tar.gz",
          L"CONIN$",   L"conout$.x", L"COM1",  L"com9.qvj", L"COM0",      L"LPT\u00B9", L"lpt\u00B2.txt",
          L"COM\u00B3"}) {
        EXPECT_FALSE(IsSafePcRelativePath(path)) << path;
    }
}

}  // namespace
}  // namespace orvane
