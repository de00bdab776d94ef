#include "Files.h"
#include "OrvixProviderConfig.h"
#include "OrvixProviderConfigManager.h"
#include "ProviderFilters.h"
#include "TempFolder.h"

#include <gtest/gtest.h>

#include <algorithm>
#include <string>
#include <string_view>

namespace
{

class ProviderConfigFile : public testing::Test
{
protected:
    /// Loads a file of this content.
    bool Load(std::string_view content)
    {
        WriteBytes(m_path, content);
        return m_manager.LoadConfig(m_path.c_str());
    }

    /// Loads a file with these provider elements.
    bool LoadProviders(const std::string& providers)
    {
        return Load("<?xml version=\"1.0\"?><OrvixProviders>" + providers + "</OrvixProviders>");
    }

    /// Loads one provider "P" with these filter elements and gives its configuration.
    const OrvixProviderConfig& LoadFilters(const std::string& filters)
    {
        EXPECT_TRUE(LoadProviders("<P><Name>P</Name><Filters>" + filters + "</Filters></P>"));
        const OrvixProviderConfig* config = m_manager.FindConfig(L"P");
        if (config == nullptr)
        {
            throw std::runtime_error("the provider was dropped");
        }
        return *config;
    }

    TempFolder m_folder;
    std::filesystem::path m_path = m_folder.Path() / L"OrvixProviders.xml";
    OrvixProviderConfigManager m_manager;
};

using OrvixProviderConfigManagerLoadConfig = ProviderConfigFile;
using OrvixProviderConfigManagerFindConfig = ProviderConfigFile;
using OrvixProviderConfigManagerFilters = ProviderConfigFile;

/// One entry per text, to compare a list of filters by their names.
std::vector<std::wstring> Names(const OrvixProviderConfig& config)
{
    std::vector<std::wstring> names;
    names.reserve(config.m_filters.size());
    for (const ProviderFilters* filter : config.m_filters)
    {
        names.push_back(filter->m_name);
    }
    return names;
}

using Texts = std::vector<std::wstring>;

} // namespace

TEST_F(OrvixProviderConfigManagerLoadConfig, GivesFalseForANullPath)
{
    EXPECT_FALSE(m_manager.LoadConfig(nullptr));
}

TEST_F(OrvixProviderConfigManagerLoadConfig, GivesFalseForAMissingFile)
{
    EXPECT_FALSE(m_manager.LoadConfig(m_path.c_str()));
    EXPECT_FALSE(m_manager.LoadConfig((m_folder.Path() / L"no folder" / L"OrvixProviders.xml").c_str()));
    EXPECT_FALSE(m_manager.LoadConfig(m_folder.Path().c_str()));
    EXPECT_FALSE(m_manager.LoadConfig(L""));
    EXPECT_EQ(m_manager.FindConfig(L"P"), nullptr);
}

TEST_F(OrvixProviderConfigManagerLoadConfig, FindsTheRootInAnyLetterCase)
{
    EXPECT_TRUE(Load("<orvixproviders><a><Name>Low</Name></a></orvixproviders>"));
    EXPECT_TRUE(Load("<?xml version=\"1.0\"?><!--first--><ORVIXPROVIDERS/>"));
    EXPECT_NE(m_manager.FindConfig(L"low"), nullptr);
}

TEST_F(OrvixProviderConfigManagerLoadConfig, GivesFalseForARootOfAnotherName)
{
    EXPECT_FALSE(Load("<Providers><a><Name>P</Name></a></Providers>"));
    EXPECT_FALSE(Load("<x><OrvixProviders><a><Name>P</Name></a></OrvixProviders></x>"));
    EXPECT_EQ(m_manager.FindConfig(L"P"), nullptr);
}

TEST_F(OrvixProviderConfigManagerLoadConfig, GivesTrueForARootWithoutUsableProviders)
{
    EXPECT_TRUE(LoadProviders(""));
    EXPECT_TRUE(LoadProviders("text<!--comment--><empty/><a><Enabled>true</Enabled></a>"));
    EXPECT_EQ(m_manager.FindConfig(L"any"), nullptr);
}

TEST_F(OrvixProviderConfigManagerLoadConfig, KeepsAProviderWithNothingButAName)
{
    ASSERT_TRUE(LoadProviders("<anything><Name>Depot 1\xC3\xA4z</Name></anything>"));
    const OrvixProviderConfig* config = m_manager.FindConfig(L"depot 1\u00E4z");
    ASSERT_NE(config, nullptr);
    EXPECT_EQ(config->m_name, L"DEPOT 1\u00E4Z");
    EXPECT_TRUE(config->m_enabled);
    EXPECT_EQ(config->m_fixedProjectRoot, L"");
    EXPECT_EQ(config->m_altProviderExecutable, L"");
    EXPECT_EQ(config->m_msSccProjectFile, L"");
    EXPECT_EQ(config->m_msSccDllSearchPath, L"");
    EXPECT_EQ(config->m_msSccDllFullPath, L"");
    EXPECT_TRUE(config->m_filters.empty());
}

TEST_F(OrvixProviderConfigManagerLoadConfig, StoresEverySettingAsWritten)
{
    ASSERT_TRUE(LoadProviders("<a>"
                              "<FixedProjectRoot>$/Root \xE5\x80\x89</FixedProjectRoot>"
                              "<AltProviderExecutable>C:\\Tools\\alt.exe</AltProviderExecutable>"
                              "<MSSCCProjectFile>project.xml</MSSCCProjectFile>"
                              "<MSSCCDllSearchPath>C:\\Search</MSSCCDllSearchPath>"
                              "<MSSCCDllFullPath>C:\\Full\\scc.dll</MSSCCDllFullPath>"
                              "<Name>Depot</Name>"
                              "</a>"));
    const OrvixProviderConfig* config = m_manager.FindConfig(L"Depot");
    ASSERT_NE(config, nullptr);
    EXPECT_EQ(config->m_fixedProjectRoot, L"$/Root \u5009");
    EXPECT_EQ(config->m_altProviderExecutable, L"C:\\Tools\\alt.exe");
    EXPECT_EQ(config->m_msSccProjectFile, L"project.xml");
    EXPECT_EQ(config->m_msSccDllSearchPath, L"C:\\Search");
    EXPECT_EQ(config->m_msSccDllFullPath, L"C:\\Full\\scc.dll");
}

TEST_F(OrvixProviderConfigManagerLoadConfig, MatchesElementNamesInAnyLetterCase)
{
    ASSERT_TRUE(LoadProviders("<a><NAME>P</NAME><enabled>false</enabled><fixedprojectroot>r</fixedprojectroot>"
                              "<ALTPROVIDEREXECUTABLE>e</ALTPROVIDEREXECUTABLE><mssccprojectfile>f</mssccprojectfile>"
                              "<MSSCCDLLSEARCHPATH>s</MSSCCDLLSEARCHPATH><mssccdllfullpath>d</mssccdllfullpath>"
                              "<FILTERS><b><nAME>n</nAME><tYPE>include</tYPE><fOLDER>c:\\</fOLDER>"
                              "<fILETYPE>txt</fILETYPE></b></FILTERS></a>"));
    const OrvixProviderConfig* config = m_manager.FindConfig(L"P");
    ASSERT_NE(config, nullptr);
    EXPECT_FALSE(config->m_enabled);
    EXPECT_EQ(config->m_fixedProjectRoot, L"r");
    EXPECT_EQ(config->m_altProviderExecutable, L"e");
    EXPECT_EQ(config->m_msSccProjectFile, L"f");
    EXPECT_EQ(config->m_msSccDllSearchPath, L"s");
    EXPECT_EQ(config->m_msSccDllFullPath, L"d");
    ASSERT_FALSE(config->m_filters.empty());
    EXPECT_FALSE(config->m_filters[0]->m_exclude);
    EXPECT_EQ(config->m_filters[0]->m_folders, Texts{L"C:\\"});
    EXPECT_EQ(config->m_filters[0]->m_fileTypes, Texts{L"TXT"});
}

TEST_F(OrvixProviderConfigManagerLoadConfig, SwitchesAProviderOffForTheTextFalseInAnyLetterCaseOnly)
{
    const std::pair<const char*, bool> cases[] = {{"false", false}, {"FALSE", false}, {"False", false}, {"0", true},
                                                  {"no", true},     {"true", true},   {"falsely", true}};
    for (const auto& [text, enabled] : cases)
    {
        SCOPED_TRACE(text);
        OrvixProviderConfigManager manager;
        WriteBytes(m_path, std::string("<OrvixProviders><a><Name>P</Name><Enabled>") + text +
                               "</Enabled></a></OrvixProviders>");
        ASSERT_TRUE(manager.LoadConfig(m_path.c_str()));
        EXPECT_EQ(manager.FindConfig(L"P")->m_enabled, enabled);
    }
}

TEST_F(OrvixProviderConfigManagerLoadConfig, LaterElementsOverwriteEarlierOnes)
{
    ASSERT_TRUE(LoadProviders("<a><Name>Old</Name><Enabled>false</Enabled><FixedProjectRoot>1</FixedProjectRoot>"
                              "<Name>New</Name><Enabled>true</Enabled><FixedProjectRoot>2</FixedProjectRoot></a>"));
    EXPECT_EQ(m_manager.FindConfig(L"Old"), nullptr);
    const OrvixProviderConfig* config = m_manager.FindConfig(L"New");
    ASSERT_NE(config, nullptr);
    EXPECT_TRUE(config->m_enabled);
    EXPECT_EQ(config->m_fixedProjectRoot, L"2");
}

TEST_F(OrvixProviderConfigManagerLoadConfig, IgnoresUnknownElementsAttributesAndWhatIsNoElement)
{
    ASSERT_TRUE(LoadProviders("<a Name=\"attribute\">text<!--comment--><?target data?><Nam>no</Nam>"
                              "<Name>P</Name><Colour>red</Colour></a>"));
    EXPECT_EQ(m_manager.FindConfig(L"attribute"), nullptr);
    EXPECT_NE(m_manager.FindConfig(L"P"), nullptr);
}

TEST_F(OrvixProviderConfigManagerLoadConfig, JoinsCdataEntitiesAndTextAroundComments)
{
    ASSERT_TRUE(LoadProviders("<a><Name><![CDATA[a<b]]>&amp;&#67;<!--c-->d</Name></a>"));
    const OrvixProviderConfig* config = m_manager.FindConfig(L"A<B&CD");
    ASSERT_NE(config, nullptr);
    EXPECT_EQ(config->m_name, L"A<B&CD");
}

TEST_F(OrvixProviderConfigManagerLoadConfig, SurvivesElementsWhoseTypedValueIsNoText)
{
    ASSERT_TRUE(Load("<?xml version=\"1.0\"?>"
                     "<OrvixProviders xmlns:dt=\"urn:schemas-microsoft-com:datatypes\">"
                     "<a><Name>P</Name><Enabled dt:dt=\"boolean\">0</Enabled>"
                     "<FixedProjectRoot dt:dt=\"int\">42</FixedProjectRoot>"
                     "<AltProviderExecutable dt:dt=\"r8\">4.5</AltProviderExecutable>"
                     "<MSSCCProjectFile dt:dt=\"bin.base64\">QUJD</MSSCCProjectFile></a>"
                     "<b><Name dt:dt=\"i4\">7</Name></b></OrvixProviders>"));
    const OrvixProviderConfig* config = m_manager.FindConfig(L"P");
    ASSERT_NE(config, nullptr);
    EXPECT_TRUE(config->m_enabled);
    EXPECT_EQ(config->m_fixedProjectRoot, L"");
    EXPECT_EQ(config->m_altProviderExecutable, L"");
    EXPECT_EQ(config->m_msSccProjectFile, L"");
    EXPECT_EQ(m_manager.FindConfig(L"7"), nullptr);
}

TEST_F(OrvixProviderConfigManagerLoadConfig, LoadingTwiceAddsASecondSet)
{
    ASSERT_TRUE(LoadProviders("<a><Name>First</Name></a>"));
    ASSERT_TRUE(LoadProviders("<a><Name>Second</Name></a>"));
    EXPECT_NE(m_manager.FindConfig(L"First"), nullptr);
    EXPECT_NE(m_manager.FindConfig(L"Second"), nullptr);
    // The earlier set goes first.
    EXPECT_EQ(m_manager.FindConfig(L"Second and First")->m_name, L"FIRST");
}

TEST_F(OrvixProviderConfigManagerLoadConfig, ConfigurationsOutliveTheirManager)
{
    const OrvixProviderConfig* config = nullptr;
    {
        OrvixProviderConfigManager manager;
        WriteBytes(m_path, "<OrvixProviders><a><Name>P</Name><FixedProjectRoot>root</FixedProjectRoot></a>"
                           "</OrvixProviders>");
        ASSERT_TRUE(manager.LoadConfig(m_path.c_str()));
        config = manager.FindConfig(L"P");
        ASSERT_NE(config, nullptr);
    }
    EXPECT_EQ(config->m_name, L"P");
    EXPECT_EQ(config->m_fixedProjectRoot, L"root");
}

TEST_F(OrvixProviderConfigManagerFindConfig, GivesNullForANullNameAndForNoConfigurations)
{
    EXPECT_EQ(m_manager.FindConfig(L"P"), nullptr);
    ASSERT_TRUE(LoadProviders("<a><Name>P</Name></a>"));
    EXPECT_EQ(m_manager.FindConfig(nullptr), nullptr);
    EXPECT_EQ(m_manager.FindConfig(L"Q"), nullptr);
    EXPECT_EQ(m_manager.FindConfig(L""), nullptr);
}

TEST_F(OrvixProviderConfigManagerFindConfig, AppliesAConfigurationToEveryNameThatContainsIts)
{
    ASSERT_TRUE(LoadProviders("<a><Name>Depot</Name></a>"));
    const OrvixProviderConfig* config = m_manager.FindConfig(L"Depot");
    ASSERT_NE(config, nullptr);
    EXPECT_EQ(m_manager.FindConfig(L"depot pro"), config);
    EXPECT_EQ(m_manager.FindConfig(L"My DEPOT"), config);
    EXPECT_EQ(m_manager.FindConfig(L"subdepots"), config);
    EXPECT_EQ(m_manager.FindConfig(L"Depo"), nullptr);
}

TEST_F(OrvixProviderConfigManagerFindConfig, GivesTheFirstMatchInFileOrderNotTheClosest)
{
    ASSERT_TRUE(LoadProviders("<a><Name>Depot</Name></a><b><Name>DepotPro</Name></b>"));
    EXPECT_EQ(m_manager.FindConfig(L"DepotPro Client")->m_name, L"DEPOT");
}

TEST_F(OrvixProviderConfigManagerFilters, OneFilterWithANameAloneStandsOnce)
{
    EXPECT_EQ(Names(LoadFilters("<f><Name>only a name</Name></f>")), Texts{L"only a name"});
}

TEST_F(OrvixProviderConfigManagerFilters, AreReadWithFoldersAndTypesInUpperCaseAndTheNameAsWritten)
{
    const OrvixProviderConfig& config =
        LoadFilters("<f><Name>Build Output</Name><Type>EXCLUDE</Type><Folder>c:\\out\\</Folder>"
                    "<Folder>d:\\out\\</Folder><FileType>obj</FileType><FileType>Pch</FileType></f>");
    ASSERT_FALSE(config.m_filters.empty());
    const ProviderFilters& filter = *config.m_filters[0];
    EXPECT_EQ(filter.m_name, L"Build Output");
    EXPECT_TRUE(filter.m_exclude);
    EXPECT_EQ(filter.m_folders, (Texts{L"C:\\OUT\\", L"D:\\OUT\\"}));
    EXPECT_EQ(filter.m_fileTypes, (Texts{L"OBJ", L"PCH"}));
}

TEST_F(OrvixProviderConfigManagerFilters, StandOnceForTheNameAndOnceForEveryFurtherElement)
{
    const OrvixProviderConfig& config =
        LoadFilters("<f><Name>a</Name><FileType>obj</FileType><Unknown>x</Unknown><Folder>c:\\</Folder></f>"
                    "<f><Name>b</Name></f>");
    EXPECT_EQ(Names(config), (Texts{L"a", L"a", L"a", L"a", L"b"}));
    EXPECT_TRUE(std::all_of(config.m_filters.begin(), config.m_filters.begin() + 4,
                            [&](const ProviderFilters* filter) { return filter == config.m_filters[0]; }));
}

TEST_F(OrvixProviderConfigManagerFilters, TypeMakesAnExcludeFilterForTheTextExcludeOnly)
{
    const OrvixProviderConfig& config = LoadFilters("<f><Name>a</Name><Type>exclude</Type></f>"
                                                    "<f><Name>b</Name><Type>Exclude</Type></f>"
                                                    "<f><Name>c</Name><Type>include</Type></f>"
                                                    "<f><Name>d</Name><Type>excluded</Type></f>"
                                                    "<f><Name>e</Name></f>"
                                                    "<f><Name>f</Name><Type>include</Type><Type>exclude</Type></f>");
    const auto excludes = [&](const wchar_t* name) {
        const auto found = std::find_if(config.m_filters.begin(), config.m_filters.end(),
                                        [&](const ProviderFilters* filter) { return filter->m_name == name; });
        return (*found)->m_exclude;
    };
    EXPECT_TRUE(excludes(L"a"));
    EXPECT_TRUE(excludes(L"b"));
    EXPECT_FALSE(excludes(L"c"));
    EXPECT_FALSE(excludes(L"d"));
    EXPECT_TRUE(excludes(L"e"));
    EXPECT_TRUE(excludes(L"f"));
}

TEST_F(OrvixProviderConfigManagerFilters, AreDroppedWhenTheNameIsNotTheFirstElement)
{
    EXPECT_EQ(Names(LoadFilters("<f><Type>exclude</Type><Name>late</Name><FileType>tmp</FileType></f>"
                                "<f><Unknown>x</Unknown><Name>late</Name></f>"
                                "<f><FileType>tmp</FileType></f>"
                                "<f/>"
                                "<f><Name>good</Name></f>")),
              Texts{L"good"});
}

TEST_F(OrvixProviderConfigManagerFilters, WhatIsNoElementMayStandBeforeTheName)
{
    EXPECT_EQ(Names(LoadFilters("text<f>text<!--comment--><Name>good</Name></f>")), Texts{L"good"});
}

TEST_F(OrvixProviderConfigManagerFilters, ARepeatedNameRenamesTheFilterAndAddsItOnceMore)
{
    const OrvixProviderConfig& config = LoadFilters("<f><Name>old</Name><Name>new</Name></f>");
    EXPECT_EQ(Names(config), (Texts{L"new", L"new"}));
    EXPECT_EQ(config.m_filters[0], config.m_filters[1]);
}

TEST_F(OrvixProviderConfigManagerFilters, AccumulateOverSeveralFiltersElements)
{
    ASSERT_TRUE(LoadProviders("<P><Filters><f><Name>a</Name></f></Filters><Name>P</Name>"
                              "<Filters><f><Name>b</Name></f></Filters></P>"));
    EXPECT_EQ(Names(*m_manager.FindConfig(L"P")), (Texts{L"a", L"b"}));
}

TEST_F(OrvixProviderConfigManagerFilters, DecideAboutFiles)
{
    const OrvixProviderConfig& config =
        LoadFilters("<f><Name>Temporary files</Name><FileType>tmp</FileType></f>"
                    "<f><Name>Project</Name><Type>include</Type><Folder>C:\\Proj</Folder></f>");
    std::wstring name;
    EXPECT_TRUE(config.IsFileExcluded(L"C:\\PROJ\\a.TMP", &name));
    EXPECT_EQ(name, L"Temporary files");
    EXPECT_TRUE(config.IsFileExcluded(L"D:\\a.txt", &name));
    EXPECT_EQ(name, L"Project");
    EXPECT_FALSE(config.IsFileExcluded(L"c:\\proj\\a.txt", &name));
}
