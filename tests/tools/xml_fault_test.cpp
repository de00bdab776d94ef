// Where an XML file is not well-formed, found by the tool.

#include "Files.h"
#include "TempFolder.h"
#include "XmlFault.h"

#include <gtest/gtest.h>

namespace
{

class XmlFaultTest : public testing::Test
{
protected:
    /// The fault of a file, when no more text than that is read.
    std::optional<XmlFault> Find(const std::string& xml, std::uintmax_t maxText)
    {
        const std::filesystem::path file = m_folder.Path() / L"file.xml";
        WriteBytes(file, xml);
        return XmlFault::Find(file.wstring(), maxText);
    }

private:
    TempFolder m_folder;
};

} // namespace

TEST_F(XmlFaultTest, IsFoundBehindAsMuchTextAsMayBeRead)
{
    const std::optional<XmlFault> fault = Find("<a>\n<b c='12345'>12345</b></d>", 11);
    ASSERT_TRUE(fault);
    EXPECT_EQ(fault->line, 2);
}

TEST_F(XmlFaultTest, IsNotFoundBehindMoreTextSinceEntitiesCanStandForGigabytes)
{
    EXPECT_FALSE(Find("<a>1234567890</b>", 9));
    EXPECT_FALSE(Find("<a><b c='12345'/>12345</d>", 9)) << "values of attributes count";
    EXPECT_FALSE(Find("<a>12345<b>12345</b></d>", 9)) << "all texts together count";
}

TEST_F(XmlFaultTest, StaysTheFirstOne)
{
    EXPECT_TRUE(Find("<a><b></a>1234567890", 9));
}
