#include "GuardedArea.h"
#include "Message.h"

#include <gtest/gtest.h>

#include <array>
#include <cstring>
#include <string>
#include <vector>

namespace
{

constexpr MessageHeader Header = {0, MessageKind::Call, 7, 3};

/// An area with one page.
class Messages : public testing::Test
{
protected:
    MessageWriter Writer() const { return MessageWriter(m_area.All(), Header); }
    MessageReader Reader() const { return MessageReader(m_area.All()); }

    /// A message whose content is these bytes.
    template <typename Value>
    void Write(const std::vector<Value>& values) const
    {
        MessageWriter writer = Writer();
        writer.Bytes(values.data(), values.size() * sizeof(Value));
        writer.Finish();
    }

    GuardedArea m_area{1};
};

} // namespace

TEST_F(Messages, ArriveAsTheyWereWritten)
{
    MessageWriter writer = Writer();
    writer.Number(std::int32_t{-5});
    writer.Number(std::uint64_t{0x123456789ABCDEF0});
    writer.Flag(true);
    writer.Text("text");
    writer.Text(nullptr);
    writer.Text(std::wstring_view(L"\x4E2D\x6587"));
    writer.Text("");
    writer.Finish();

    MessageReader reader = Reader();
    EXPECT_EQ(reader.Header().kind, MessageKind::Call);
    EXPECT_EQ(reader.Header().number, 7u);
    EXPECT_EQ(reader.Header().function, 3u);
    EXPECT_EQ(reader.Number<std::int32_t>(), -5);
    EXPECT_EQ(reader.Number<std::uint64_t>(), 0x123456789ABCDEF0u);
    EXPECT_TRUE(reader.Flag());
    EXPECT_STREQ(reader.Text(), "text");
    EXPECT_EQ(reader.Text(), nullptr);
    EXPECT_EQ(reader.WideText(), L"\x4E2D\x6587");
    std::string copy = "old";
    EXPECT_TRUE(reader.CopyText(copy));
    EXPECT_EQ(copy, "");
    reader.End();
}

TEST_F(Messages, HaveTheSameBytesInEveryBuild)
{
    MessageWriter writer = Writer();
    writer.Number(std::int32_t{-2});
    writer.Text("ab");
    writer.Text(std::wstring_view(L"c"));
    writer.Number(std::uint64_t{0x0102030405060708});
    writer.Finish();

    constexpr std::array<unsigned char, 41> Expected = {41,  0,   0,   0,                    // size
                                                        2,   0,   0,   0,                    // kind
                                                        7,   0,   0,   0,                    // number
                                                        3,   0,   0,   0,                    // function
                                                        254, 255, 255, 255,                  // -2
                                                        2,   0,   0,   0,   'a', 'b', 0,     // "ab"
                                                        1,   0,   0,   0,   'c', 0,          // L"c"
                                                        8,   7,   6,   5,   4,   3,   2, 1}; // 0x0102030405060708
    EXPECT_EQ(std::memcmp(m_area.All().data(), Expected.data(), Expected.size()), 0);
}

TEST_F(Messages, FillTheirAreaAndNoMore)
{
    const std::span<std::byte> area = m_area.Last(sizeof(MessageHeader) + 4);
    MessageWriter exact(area, Header);
    exact.Number(std::int32_t{1});
    exact.Finish();
    EXPECT_EQ(MessageReader(area).Number<std::int32_t>(), 1);

    EXPECT_THROW(exact.Number(std::int32_t{1}), MessageError);
    MessageWriter text(area, Header);
    EXPECT_THROW(text.Text("1234567890"), MessageError);
    EXPECT_THROW(MessageWriter(area.first(8), Header), MessageError);
}

TEST_F(Messages, ReportAnEndThatComesTooEarly)
{
    Write<std::uint32_t>({1});
    MessageReader reader = Reader();
    EXPECT_THROW(reader.Number<std::uint64_t>(), MessageError);
    EXPECT_THROW(reader.End(), MessageError);
    EXPECT_EQ(reader.Number<std::uint32_t>(), 1u);
    EXPECT_THROW(reader.Number<std::uint32_t>(), MessageError);
    EXPECT_THROW(reader.Flag(), MessageError);
    EXPECT_THROW(reader.Text(), MessageError);
    EXPECT_THROW(reader.WideText(), MessageError);
}

TEST_F(Messages, ReportASizeThatIsWrong)
{
    Write<std::uint32_t>({1});
    for (const std::uint32_t size : {0u, 15u, 4097u, 0xFFFFFFFFu})
    {
        std::memcpy(m_area.All().data(), &size, sizeof size);
        EXPECT_THROW(Reader(), MessageError) << size;
    }
    EXPECT_THROW(MessageReader(m_area.All().first(8)), MessageError);
}

TEST_F(Messages, ReportTextsThatAreTooLongOrNotTerminated)
{
    std::string copy;
    for (const std::uint32_t size : {4u, 5u, 0x7FFFFFFFu, 0x80000000u, 0xFFFFFFFEu})
    {
        Write<std::uint32_t>({size, 0x61616161});
        EXPECT_THROW(Reader().Text(), MessageError) << size;
        EXPECT_THROW(Reader().CopyText(copy), MessageError) << size;
        EXPECT_THROW(Reader().WideText(), MessageError) << size;
    }
    Write<std::uint32_t>({3, 0x61616161}); // the fourth byte is no terminator
    EXPECT_THROW(Reader().Text(), MessageError);
}

TEST_F(Messages, ReportAFlagThatIsNone)
{
    Write<std::uint32_t>({2});
    EXPECT_THROW(Reader().Flag(), MessageError);
}

TEST_F(Messages, CopyATextToItsFirstNullCharacter)
{
    Write<unsigned char>({4, 0, 0, 0, 'a', 0, 'b', 'c', 'd'}); // the terminator was overwritten after it was written
    std::string copy;
    EXPECT_TRUE(Reader().CopyText(copy));
    EXPECT_EQ(copy, "a");
}
