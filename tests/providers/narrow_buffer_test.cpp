#include "CodePage.h"
#include "NarrowBuffer.h"

#include <gtest/gtest.h>

#include <string>

namespace
{

constexpr UINT ShiftJis = 932;
constexpr UINT Western = 1252;

std::string Narrow(const std::wstring& text, std::size_t limit)
{
    return NarrowBuffer(text.c_str(), limit).Get();
}

std::wstring Repeat(const std::wstring& text, int times)
{
    std::wstring repeated;
    for (int n = 0; n < times; ++n)
    {
        repeated += text;
    }
    return repeated;
}

TEST(NarrowBufferText, IsInTheAnsiCodePage)
{
    const CodePage western(Western);
    EXPECT_EQ(Narrow(L"r\u00e9sum\u00e9 \u20ac", NarrowBuffer::Unlimited), "r\xe9sum\xe9 \x80");
}

TEST(NarrowBufferText, LosesCharactersThatTheCodePageDoesNotHave)
{
    const CodePage western(Western);
    EXPECT_EQ(Narrow(L"a\u5009b", NarrowBuffer::Unlimited), "a?b");
}

TEST(NarrowBufferText, OfNoCharactersIsEmpty)
{
    EXPECT_EQ(Narrow(L"", 31), "");
}

TEST(NarrowBufferText, FillsTheLimitExactly)
{
    EXPECT_EQ(Narrow(std::wstring(31, L'x'), 31), std::string(31, 'x'));
    EXPECT_EQ(Narrow(std::wstring(32, L'x'), 31), std::string(31, 'x'));
    EXPECT_EQ(Narrow(L"abc", 0), "");
}

TEST(NarrowBufferText, IsCutBeforeACharacterOfTwoBytesThatTheLimitWouldSplit)
{
    const CodePage shiftJis(ShiftJis);
    const std::string fifteen = "\x83\x5c\x83\x5c\x83\x5c\x83\x5c\x83\x5c\x83\x5c\x83\x5c\x83\x5c\x83\x5c\x83\x5c\x83"
                                "\x5c\x83\x5c\x83\x5c\x83\x5c\x83\x5c";
    EXPECT_EQ(Narrow(std::wstring(20, L'\u30bd'), 31), fifteen);
    EXPECT_EQ(Narrow(L"x" + std::wstring(20, L'\u30bd'), 31), "x" + fifteen);
    EXPECT_EQ(Narrow(std::wstring(20, L'\u30bd'), 30), fifteen);
}

TEST(NarrowBufferText, EndsAtTheCharacterThatDoesNotFit)
{
    const CodePage shiftJis(ShiftJis);
    EXPECT_EQ(Narrow(L"ab\u30bdcd", 3), "ab"); // the letter after it would fit
}

TEST(NarrowBufferText, KeepsPairsOfSurrogatesWhole)
{
    const CodePage utf8(CP_UTF8);
    EXPECT_EQ(Narrow(L"ab\xd83d\xde00z", NarrowBuffer::Unlimited), "ab\xf0\x9f\x98\x80z");
    EXPECT_EQ(Narrow(L"ab\xd83d\xde00z", 6), "ab\xf0\x9f\x98\x80");
    EXPECT_EQ(Narrow(L"ab\xd83d\xde00z", 5), "ab");
}

TEST(NarrowBufferText, CarriesTwoHundredAndSixtyCharactersOfAnyCodePage)
{
    const std::wstring text(260, L'\u30bd');
    {
        const CodePage shiftJis(ShiftJis);
        EXPECT_EQ(Narrow(text, NarrowBuffer::Unlimited).size(), 520u);
    }
    const CodePage utf8(CP_UTF8);
    EXPECT_EQ(Narrow(text, NarrowBuffer::Unlimited).size(), 780u);
    EXPECT_EQ(Narrow(Repeat(L"\xd83d\xde00", 130), NarrowBuffer::Unlimited).size(), 520u);
}

TEST(NarrowBufferText, OfMoreBytesThanTheMemoryHoldsIsCut)
{
    const CodePage utf8(CP_UTF8);
    EXPECT_EQ(Narrow(L"ab" + std::wstring(400, L'\u30bd'), NarrowBuffer::Unlimited).size(), 2u + 3 * 346);
}

TEST(NarrowBufferMemory, HoldsTheLongestTextOfTheInterfaceAndIsZeroAfterTheText)
{
    static_assert(sizeof(NarrowBuffer) >= 301 + 1);
    NarrowBuffer buffer(L"abc", 31);
    for (std::size_t n = 3; n < sizeof(NarrowBuffer); ++n)
    {
        EXPECT_EQ(buffer.Get()[n], '\0') << n;
    }
}

} // namespace
