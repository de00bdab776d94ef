#include "BareFileName.h"

#include <gtest/gtest.h>

TEST(BareFileName, IsANameOfAFileAndNothingMore)
{
    for (const wchar_t* name :
         {L"project.xml", L"a", L".settings", L"COM.xml", L"COMMON", L"nul0", L"a b.c", L"\u5009"})
    {
        EXPECT_TRUE(IsBareFileName(name)) << name;
    }
}

TEST(BareFileName, IsNeitherAPathNorAStreamNorADevice)
{
    for (const wchar_t* name :
         {L"",        L".",        L"..",   L"a\\b",     L"a/b",       L"..\\a",  L"C:a", L"a:stream", L"a..b", L"nul",
          L"NUL.xml", L"con .txt", L"Com1", L"lpt9.x.y", L"COM\u00B2", L"conin$", L"a*",  L"a?",       L"a\nb", L"a|b"})
    {
        EXPECT_FALSE(IsBareFileName(name)) << name;
    }
}
