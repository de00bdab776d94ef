#include "Files.h"
#include "OrvixProviderSettings.h"
#include "TempFolder.h"

#include <gtest/gtest.h>

namespace
{

/// A configuration folder.
class ProviderSettings : public testing::Test
{
protected:
    void Write(std::string_view bytes) const { WriteBytes(m_folder.Path() / L"OrvixProviders.xml", bytes); }
    OrvixProviderSettings Read(const wchar_t* provider) const
    {
        return OrvixProviderSettings(m_folder.Text().c_str(), provider);
    }

    TempFolder m_folder;
};

} // namespace

TEST_F(ProviderSettings, AreTheDefaultsWithoutAFile)
{
    for (const OrvixProviderSettings& settings :
         {Read(L"Git"), OrvixProviderSettings(nullptr, L"Git"), OrvixProviderSettings(L"", nullptr)})
    {
        EXPECT_FALSE(settings.AreFound());
        EXPECT_TRUE(settings.IsEnabled());
        EXPECT_STREQ(settings.GetFixedProjectRoot(), L"");
        EXPECT_STREQ(settings.GetAltProviderExecutable(), L"");
        EXPECT_FALSE(settings.IsFileExcluded(L"C:\\a.tmp"));
    }
}

TEST_F(ProviderSettings, AreTheDefaultsWhenTheFileIsBroken)
{
    Write("<OrvixProviders><Provider><Name>Git</Name>");
    EXPECT_FALSE(Read(L"Git").AreFound());
}

TEST_F(ProviderSettings, ComeFromTheFirstElementWhoseNameOccursInTheProviders)
{
    Write("<OrvixProviders>"
          "<a><Name>Depot</Name><AltProviderExecutable>d.exe</AltProviderExecutable></a>"
          "<a><Name>git</Name><AltProviderExecutable>C:\\my git\\git.exe</AltProviderExecutable>"
          "<FixedProjectRoot>$/root</FixedProjectRoot></a>"
          "<a><Name>Git for the town</Name><AltProviderExecutable>t.exe</AltProviderExecutable></a>"
          "</OrvixProviders>");
    const OrvixProviderSettings settings = Read(L"Git for the town");
    ASSERT_TRUE(settings.AreFound());
    EXPECT_STREQ(settings.GetAltProviderExecutable(), L"C:\\my git\\git.exe");
    EXPECT_STREQ(settings.GetFixedProjectRoot(), L"$/root");
    EXPECT_TRUE(settings.IsEnabled());
    EXPECT_FALSE(Read(L"Archive").AreFound());
}

TEST_F(ProviderSettings, SaySwitchedOffAndExcludedFiles)
{
    Write("<OrvixProviders><a><Name>Git</Name><Enabled>False</Enabled>"
          "<Filters><f><Name>Temporary</Name><FileType>tmp</FileType></f></Filters></a></OrvixProviders>");
    const OrvixProviderSettings settings = Read(L"Git");
    EXPECT_FALSE(settings.IsEnabled());
    EXPECT_TRUE(settings.IsFileExcluded(L"C:\\project\\a.TMP"));
    EXPECT_FALSE(settings.IsFileExcluded(L"C:\\project\\a.txt"));
    EXPECT_FALSE(settings.IsFileExcluded(nullptr));
}
