#include "platform/paths.h"

#include <gtest/gtest.h>

namespace orvane {
namespace {

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

TEST(Paths, TellTheRootsOfANetwork) {
    for (const wchar_t* root :
         {L"\\\\server", L"\\\\server\\", L"\\\\server\\share", L"\\\\server\\share\\\\"}) {
        EXPECT_TRUE(IsUncRoot(root)) << root;
    }
    for (const wchar_t* path : {L"", L"\\", L"\\a", L"C:\\a", L"C:\\\\a", L"\\\\server\\share\\a"}) {
        EXPECT_FALSE(IsUncRoot(path)) << path;
    }
}

}  // namespace
}  // namespace orvane
