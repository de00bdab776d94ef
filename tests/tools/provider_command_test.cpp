// Commands that a provider carries out by itself, with plug-ins.

#include "ToolTest.h"

#include <gmock/gmock.h>

namespace
{

using testing::AllOf;
using testing::HasSubstr;

using ProviderCommand = ToolTest;

} // namespace

TEST_F(ProviderCommand, OpenSaysWhichProjectIsOpenWithWhichProvider)
{
    const auto result = Run({L"open"});
    EXPECT_EQ(result.code, Success);
    EXPECT_EQ(result.output, "opened " + Project().string() + " with Archive\n");
}

TEST_F(ProviderCommand, OpenTakesTheProjectFolderOfTheOption)
{
    std::filesystem::create_directories(File(L"inner"));
    const auto result = Run({L"open", L"--project", L"inner"});
    EXPECT_EQ(result.code, Success);
    EXPECT_EQ(result.output, "opened " + File(L"inner").string() + " with Archive\n");
}

TEST_F(ProviderCommand, OpenFailsWhenTheProviderSaysYesButHasNoProjectOpen)
{
    const auto result = Run({L"open", L"--plugins", ORVIX_STUBBORN_PLUGINS});
    EXPECT_EQ(result.code, Failed);
    EXPECT_EQ(result.output, "");
    EXPECT_EQ(result.errors, "orvix: open failed in the provider Stubborn\n");
}

TEST_F(ProviderCommand, OpenOfAFolderThatIsNowhereSaysSo)
{
    const auto result = Run({L"open", L"--project", L"nowhere"});
    EXPECT_EQ(result.code, NotFound);
    EXPECT_THAT(result.errors, HasSubstr("orvix: no such project folder: "));
}

TEST_F(ProviderCommand, PropertiesShowsWhatTheProviderPrintsOfTheFile)
{
    Write(L"a.txt", "four");
    Write(L"b.txt", "b");
    ASSERT_EQ(Run({L"add", L".", L"-m", L"the beginning"}).code, Success);
    const auto result = Run({L"properties", L"a.txt"});
    EXPECT_EQ(result.code, Success);
    EXPECT_THAT(result.output,
                AllOf(HasSubstr("a.txt\n"), HasSubstr("the beginning"), HasSubstr("4 bytes"), HasSubstr("ada")));
}

TEST_F(ProviderCommand, PropertiesOfAFileThatIsNotControlledFails)
{
    Write(L"a.txt", "a");
    const auto result = Run({L"properties", L"a.txt"});
    EXPECT_EQ(result.code, Failed);
    EXPECT_THAT(result.errors, HasSubstr("orvix: properties failed in the provider Archive\n"));
}

TEST_F(ProviderCommand, PropertiesOfAFolderIsRefused)
{
    const auto result = Run({L"properties", L"."});
    EXPECT_EQ(result.code, Failed);
    EXPECT_THAT(result.errors, HasSubstr("orvix: a folder has no properties: "));
}

TEST_F(ProviderCommand, PropertiesOfAnExcludedFileIsRefused)
{
    std::filesystem::create_directories(Config());
    WriteBytes(Config() / L"OrvixProviders.xml",
               "<?xml version=\"1.0\"?><OrvixProviders><P><Name>Archive</Name><Filters><F><Name>Scratch</Name>"
               "<FileType>tmp</FileType></F></Filters></P></OrvixProviders>");
    const auto result = Run({L"properties", L"a.tmp"});
    EXPECT_EQ(result.code, Failed);
    EXPECT_THAT(result.errors, HasSubstr("orvix: excluded by filter Scratch: "));
}

TEST_F(ProviderCommand, SaysWhenTheProviderDoesNotOfferIt)
{
    for (const wchar_t* command : {L"options", L"client"})
    {
        const auto result = Run({command});
        EXPECT_EQ(result.code, Failed);
        EXPECT_THAT(result.errors, HasSubstr(" is not offered by the provider Archive\n"));
    }
}

TEST_F(ProviderCommand, SaysWhenTheProviderFails)
{
    for (const wchar_t* command : {L"options", L"client"})
    {
        const auto result = Run({L"--plugins", ORVIX_STUBBORN_PLUGINS, command});
        EXPECT_EQ(result.code, Failed);
        EXPECT_THAT(result.errors, HasSubstr(" failed in the provider Stubborn\n"));
    }
}

TEST_F(ProviderCommand, BadUsageIsExplainedAndDoesNothing)
{
    const std::vector<Arguments> bad = {
        {L"open", L"a.txt"},
        {L"options", L"a.txt"},
        {L"client", L"a.txt"},
        {L"properties"},
        {L"properties", L"a.txt", L"b.txt"},
        {L"properties", L""},
        {L"open", L"-m", L"comment"},
    };
    for (const Arguments& arguments : bad)
    {
        const auto result = RunExactly(arguments);
        EXPECT_EQ(result.code, BadUsage) << testing::PrintToString(arguments);
        EXPECT_THAT(result.errors, HasSubstr("orvix: ")) << testing::PrintToString(arguments);
        EXPECT_EQ(result.output, "");
    }
    EXPECT_TRUE(std::filesystem::is_empty(Project()));
}

TEST_F(ProviderCommand, SourcesTakesOnlyTheTwoNames)
{
    for (const wchar_t* list :
         {L"", L"plugin", L"PLUGINS", L"1", L"plugins,", L"plugins;msscci", L"plugins,msscci,x", L"plugins,plugins"})
    {
        const auto result = Run({L"providers", L"--sources", list});
        EXPECT_EQ(result.code, BadUsage);
        EXPECT_THAT(result.errors, HasSubstr("orvix: --sources takes plugins, msscci or both with a comma between"));
    }
    EXPECT_EQ(Run({L"providers", L"--sources"}).code, BadUsage);
}
