#include "XmlProlog.h"

#include <gtest/gtest.h>

#include <string>
#include <string_view>

namespace
{

const std::string Plain = "<a>text</a>";
const std::string Declares = "<!DOCTYPE a [<!ENTITY e 'text'>]><a/>";

/// ASCII as UTF-16 or UTF-32 of either byte order.
std::string Wide(std::string_view ascii, std::size_t size, bool bigEndian)
{
    std::string bytes;
    for (const char c : ascii)
    {
        std::string unit(size, '\0');
        unit[bigEndian ? size - 1 : 0] = c;
        bytes += unit;
    }
    return bytes;
}

bool Declaration(const std::string& encoding, const std::string& text)
{
    return XmlProlog::MayDeclareEntities("<?xml version=\"1.0\" encoding=\"" + encoding + "\"?>" + text);
}

} // namespace

TEST(XmlProlog, FindsADeclarationInTheDocumentType)
{
    for (const char* text :
         {"<!DOCTYPE a [<!ENTITY e 'text'>]><a/>",
          "<?xml version='1.0'?>\r\n<!--c--><?p?><!DOCTYPE a [<!ENTITY % e 't'>]><a/>",
          "<!DOCTYPE a SYSTEM '<!--' [<!ENTITY e 't'>]><a/>", "<!DOCTYPE a PUBLIC \"'\" \"<?\" [<!ENTITY e 't'>]><a/>",
          "<!DOCTYPE a [<!-- ]> <a> --><?p ]> <a> ?><!ATTLIST a b CDATA ']'><!ENTITY e 't'>]><a/>",
          "<!DOCTYPE a [<!ENTITY", "\xEF\xBB\xBF<!DOCTYPE a [<!ENTITY e 't'>]><a/>"})
    {
        EXPECT_TRUE(XmlProlog::MayDeclareEntities(text)) << text;
    }
}

TEST(XmlProlog, FindsNoneWhereThereIsNone)
{
    for (const char* text :
         {"", "  ", "<a/>", "no xml", "<?xml version='1.0'?><!-- <!ENTITY --><?p <!ENTITY ?><a/>",
          "<!DOCTYPE a><a><![CDATA[<!ENTITY e 't'>]]></a>", "<!DOCTYPE a [<!-- <!ENTITY --><!ELEMENT a ANY>]><a/>",
          "<!DOCTYPE a SYSTEM '<!ENTITY'><a/>", "<!-- never ends <!ENTITY", "<?p never ends <!ENTITY"})
    {
        EXPECT_FALSE(XmlProlog::MayDeclareEntities(text)) << text;
    }
}

TEST(XmlProlog, SeesThroughEveryUnicodeEncoding)
{
    struct Encoding
    {
        std::size_t size;
        bool bigEndian;
        std::string mark;
    };
    const Encoding encodings[] = {{2, false, "\xFF\xFE"},
                                  {2, true, "\xFE\xFF"},
                                  {4, false, std::string("\xFF\xFE\0\0", 4)},
                                  {4, true, std::string("\0\0\xFE\xFF", 4)}};
    for (const auto& [size, bigEndian, mark] : encodings)
    {
        for (const std::string& beginning : {mark, std::string()})
        {
            EXPECT_TRUE(XmlProlog::MayDeclareEntities(beginning + Wide(Declares, size, bigEndian)));
            EXPECT_FALSE(XmlProlog::MayDeclareEntities(beginning + Wide(Plain, size, bigEndian)));
            EXPECT_TRUE(XmlProlog::MayDeclareEntities(
                beginning + Wide("<?xml version='1.0' encoding='utf-7'?><a/>", size, bigEndian)));
        }
    }
}

TEST(XmlProlog, TakesNoHalfOfACharacterForAscii)
{
    // Each character has the bytes of two others: of "?>" and "<a", and of "--" before a ">".
    const std::string bigEndian = Wide("<?p ", 2, true) + "?><a" + Wide("?>" + Declares, 2, true);
    EXPECT_TRUE(XmlProlog::MayDeclareEntities("\xFE\xFF" + bigEndian));
    EXPECT_TRUE(XmlProlog::MayDeclareEntities(bigEndian));
    const std::string littleEndian = Wide("<!--", 2, false) + "--" + Wide("> <a> -->" + Declares, 2, false);
    EXPECT_TRUE(XmlProlog::MayDeclareEntities("\xFF\xFE" + littleEndian));
    EXPECT_TRUE(XmlProlog::MayDeclareEntities(littleEndian));
}

TEST(XmlProlog, TrustsEncodingsThatWriteAsciiAsAscii)
{
    for (const char* encoding : {"UTF-8", "utf-16", "ISO-8859-1", "windows-1252", "US-ASCII", "Shift_JIS", "gb2312",
                                 "Big5", "euc-kr", "koi8-r"})
    {
        EXPECT_FALSE(Declaration(encoding, Plain)) << encoding;
        EXPECT_TRUE(Declaration(encoding, Declares)) << encoding;
    }
}

TEST(XmlProlog, DistrustsEncodingsInWhichItCannotTell)
{
    for (const char* encoding : {"UTF-7", "ibm037", "iso-2022-jp", "hz-gb-2312", "unknown"})
    {
        EXPECT_TRUE(Declaration(encoding, Plain)) << encoding;
    }
    EXPECT_TRUE(XmlProlog::MayDeclareEntities("+ADw-a/+AD4-")) << "UTF-7";
    EXPECT_TRUE(XmlProlog::MayDeclareEntities("\x4C\x6F\xA7\x94")) << "EBCDIC";
    EXPECT_TRUE(XmlProlog::MayDeclareEntities(std::string("\0\0<\0", 4))) << "UTF-32, byte order 2143";
    EXPECT_TRUE(XmlProlog::MayDeclareEntities(std::string("\0<\0\0", 4))) << "UTF-32, byte order 3412";
    EXPECT_TRUE(XmlProlog::MayDeclareEntities("<?xml version='encoding=\"utf-8\"' encoding='utf-7'?><a/>"));
}
