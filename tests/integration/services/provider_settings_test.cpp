#include "ServicesTest.h"

namespace
{

using ProviderSettings = ServicesTest;

} // namespace

TEST_F(ProviderSettings, AreNullOutOfRangeAndWithoutConfiguration)
{
    AddPlugin(L"good");
    ASSERT_TRUE(Initialize());
    EXPECT_EQ(m_services->GetProviderFixedProjectRoot(0), nullptr);
    EXPECT_EQ(m_services->GetProviderAltExecutable(0), nullptr);
    for (const std::uint32_t index : {1u, 0xFFFFFFFFu})
    {
        EXPECT_EQ(m_services->GetProviderName(index), nullptr);
        EXPECT_EQ(m_services->GetProvider(index), nullptr);
        EXPECT_EQ(m_services->GetProviderFixedProjectRoot(index), nullptr);
        EXPECT_EQ(m_services->GetProviderAltExecutable(index), nullptr);
        EXPECT_FALSE(m_services->IsFileExcludedByProvider(index, L"a.tmp", nullptr));
    }
}

TEST_F(ProviderSettings, AreEmptyTextsWhereTheConfigurationHasNone)
{
    AddPlugin(L"good");
    WriteProviders("<a><Name>Depot</Name></a>");
    ASSERT_TRUE(Initialize());
    EXPECT_STREQ(m_services->GetProviderFixedProjectRoot(0), L"");
    EXPECT_STREQ(m_services->GetProviderAltExecutable(0), L"");
}

TEST_F(ProviderSettings, ComeFromTheConfigurationOfTheProvidersName)
{
    AddPlugin(L"good");
    AddPlugin(L"other");
    WriteProviders("<a><Name>other</Name><FixedProjectRoot>$/o</FixedProjectRoot>"
                   "<AltProviderExecutable>o.exe</AltProviderExecutable></a>"
                   "<a><Name>fake depot</Name><FixedProjectRoot>$/f</FixedProjectRoot>"
                   "<AltProviderExecutable>f.exe</AltProviderExecutable></a>");
    ASSERT_TRUE(Initialize());
    const Names names = ProviderNames();
    ASSERT_EQ(names.size(), 2u);
    for (std::uint32_t i = 0; i < 2; ++i)
    {
        const bool isOther = names[i] == L"Other";
        EXPECT_STREQ(m_services->GetProviderFixedProjectRoot(i), isOther ? L"$/o" : L"$/f");
        EXPECT_STREQ(m_services->GetProviderAltExecutable(i), isOther ? L"o.exe" : L"f.exe");
    }
}

TEST_F(ProviderSettings, FiltersDecideWhichFilesAreExcluded)
{
    AddPlugin(L"good");
    WriteProviders("<a><Name>Depot</Name><Filters>"
                   "<f><Name>Temporary</Name><FileType>tmp</FileType></f>"
                   "<f><Name>Also temporary</Name><FileType>tmp</FileType><FileType>bak</FileType></f>"
                   "</Filters></a>");
    ASSERT_TRUE(Initialize());
    std::wstring name = L"before";
    EXPECT_FALSE(m_services->IsFileExcludedByProvider(0, L"C:\\a.txt", &name));
    EXPECT_EQ(name, L"before");
    EXPECT_TRUE(m_services->IsFileExcludedByProvider(0, L"C:\\a.TMP", &name));
    EXPECT_EQ(name, L"Temporary");
    EXPECT_TRUE(m_services->IsFileExcludedByProvider(0, L"C:\\a.bak", &name));
    EXPECT_EQ(name, L"Also temporary");
    EXPECT_TRUE(m_services->IsFileExcludedByProvider(0, L"C:\\a.tmp", nullptr));
    EXPECT_FALSE(m_services->IsFileExcludedByProvider(0, L"C:\\a.txt", nullptr));
    EXPECT_FALSE(m_services->IsFileExcludedByProvider(0, nullptr, &name));
    EXPECT_EQ(name, L"Also temporary");
}

TEST_F(ProviderSettings, WithoutConfigurationNoFileIsExcluded)
{
    AddPlugin(L"good");
    ASSERT_TRUE(Initialize());
    std::wstring name = L"before";
    EXPECT_FALSE(m_services->IsFileExcludedByProvider(0, L"C:\\a.tmp", &name));
    EXPECT_EQ(name, L"before");
}
