#include "CurrentFolder.h"
#include "ModulePath.h"
#include "ServicesTest.h"
#include "UniqueHandle.h"

namespace
{

using Discovery = ServicesTest;
using Plugin = ServicesTest;

/// The provider names of the fakes in the order in which the file search finds their files.
Names NamesInSearchOrder(const std::filesystem::path& folder)
{
    Names names;
    WIN32_FIND_DATAW found;
    const UniqueFind search(FindFirstFileW((folder / L"*.dll").c_str(), &found));
    if (!search)
    {
        return names;
    }
    do
    {
        const std::wstring file = found.cFileName;
        if (file == L"good.dll")
        {
            names.push_back(L"Fake Depot");
        }
        else if (file == L"other.dll")
        {
            names.push_back(L"Other");
        }
        else if (file == L"nonascii.dll")
        {
            names.push_back(L"D\u00E9p\u00F4t \u5009\u5EAB");
        }
    } while (FindNextFileW(search.Get(), &found) != 0);
    return names;
}

} // namespace

TEST_F(Discovery, ListsAGoodPluginByItsName)
{
    const std::filesystem::path good = AddPlugin(L"good");
    EXPECT_TRUE(Initialize());
    EXPECT_EQ(ProviderNames(), Names{L"Fake Depot"});
    EXPECT_TRUE(IsLoaded(good));
    EXPECT_EQ(FakeJournal::Read(), L"good.load good.version good.name ");
}

TEST_F(Discovery, AnEmptyFolderGivesFalseAndLeavesTheListUnchanged)
{
    EXPECT_FALSE(Initialize());
    EXPECT_EQ(m_services->GetProviderCount(), 0u);
    AddPlugin(L"good");
    EXPECT_TRUE(Initialize());
    const TempFolder empty;
    m_info.SetProviderPluginPath((empty.Text() + L"\\").c_str());
    EXPECT_FALSE(Initialize());
    EXPECT_EQ(ProviderNames(), Names{L"Fake Depot"});
}

TEST_F(Discovery, AMissingFolderGivesFalse)
{
    m_info.SetProviderPluginPath((m_plugins.Text() + L"\\missing\\").c_str());
    EXPECT_FALSE(Initialize());
}

TEST_F(Discovery, AFolderWithoutSeparatorAtItsEndFindsNothing)
{
    AddPlugin(L"good");
    m_info.SetProviderPluginPath(m_plugins.Text().c_str());
    EXPECT_FALSE(Initialize());
    EXPECT_EQ(FakeJournal::Read(), L"");
}

TEST_F(Discovery, AFolderWithoutSeparatorIsJoinedToTheFoundName)
{
    // The search for "<folder>\sub*.dll" finds "sub1.dll"; its path then is "<folder>\subsub1.dll".
    AddPlugin(L"good", L"sub1.dll");
    m_info.SetProviderPluginPath((m_plugins.Text() + L"\\sub").c_str());
    EXPECT_FALSE(Initialize());
    AddPlugin(L"other", L"subsub1.dll");
    EXPECT_TRUE(Initialize());
    EXPECT_EQ(ProviderNames(), Names{L"Other"});
}

TEST_F(Discovery, KeepsTheOrderOfTheFileSearch)
{
    AddPlugin(L"other");
    AddPlugin(L"good");
    AddPlugin(L"nonascii");
    EXPECT_TRUE(Initialize());
    const Names expected = NamesInSearchOrder(m_plugins.Path());
    ASSERT_EQ(expected.size(), 3u);
    EXPECT_EQ(ProviderNames(), expected);
}

TEST_F(Discovery, ListsTwoPluginsOfTheSameNameWithTheSameConfiguration)
{
    AddPlugin(L"good");
    AddPlugin(L"twin");
    WriteProviders("<a><Name>Fake Depot</Name><FixedProjectRoot>root</FixedProjectRoot></a>");
    EXPECT_TRUE(Initialize());
    EXPECT_EQ(ProviderNames(), (Names{L"Fake Depot", L"Fake Depot"}));
    EXPECT_STREQ(m_services->GetProviderFixedProjectRoot(0), L"root");
    EXPECT_EQ(m_services->GetProviderFixedProjectRoot(0), m_services->GetProviderFixedProjectRoot(1));
}

TEST_F(Discovery, TakesFileNamesWithBlanksAndNonAsciiLetters)
{
    const std::filesystem::path file = AddPlugin(L"nonascii", L"\u5009\u5EAB prov\u00EDder 1.DLL");
    EXPECT_TRUE(Initialize());
    EXPECT_EQ(ProviderNames(), Names{L"D\u00E9p\u00F4t \u5009\u5EAB"});
    EXPECT_TRUE(IsLoaded(file));
}

TEST_F(Discovery, AConfigurationOfANonAsciiNameApplies)
{
    AddPlugin(L"nonascii");
    WriteProviders("<a><Name>\xE5\x80\x89\xE5\xBA\xAB</Name><Enabled>false</Enabled></a>");
    EXPECT_FALSE(Initialize());
}

TEST_F(Discovery, UnloadsAndSkipsAPluginThatIsDisabled)
{
    const std::filesystem::path good = AddPlugin(L"good");
    AddPlugin(L"other");
    WriteProviders("<a><Name>fake</Name><Enabled>False</Enabled></a>");
    EXPECT_TRUE(Initialize());
    EXPECT_EQ(ProviderNames(), Names{L"Other"});
    EXPECT_FALSE(IsLoaded(good));
    EXPECT_NE(FakeJournal::Read().find(L"good.load good.version good.name good.unload "), std::wstring::npos);
}

TEST_F(Discovery, GivesFalseWhenTheOnlyPluginIsDisabled)
{
    AddPlugin(L"good");
    WriteProviders("<a><Name>Fake Depot</Name><Enabled>false</Enabled></a>");
    EXPECT_FALSE(Initialize());
    EXPECT_EQ(m_services->GetProviderCount(), 0u);
}

TEST_F(Discovery, SkipsEveryBadCandidateAndStillFindsTheGoodOnes)
{
    AddPlugin(L"good");
    AddPlugin(L"other");
    const std::filesystem::path bad[] = {
        AddPlugin(L"namethrowscom"), AddPlugin(L"version199"), AddPlugin(L"version201"),
        AddPlugin(L"noversion"),     AddPlugin(L"noget"),      AddPlugin(L"norelease"),
        AddPlugin(L"noname"),        AddPlugin(L"startfails"), AddPlugin(L"namethrows"),
    };
    WriteBytes(m_plugins.Path() / L"notes.dll", "These are notes, not a library.");
    WriteBytes(m_plugins.Path() / L"empty.dll", "");
    WriteBytes(m_plugins.Path() / L"cut.dll", ReadBytes(m_plugins.Path() / L"good.dll").substr(0, 700));
    WriteBytes(m_plugins.Path() / L"good.txt", ReadBytes(m_plugins.Path() / L"good.dll"));
    std::filesystem::create_directory(m_plugins.Path() / L"folder.dll");
    EXPECT_TRUE(Initialize());
    Names names = ProviderNames();
    std::sort(names.begin(), names.end());
    EXPECT_EQ(names, (Names{L"Fake Depot", L"Other"}));
    for (const std::filesystem::path& library : bad)
    {
        EXPECT_FALSE(IsLoaded(library)) << library.filename();
    }
}

TEST_F(Discovery, DoesNotLookIntoSubfolders)
{
    std::filesystem::create_directory(m_plugins.Path() / L"folder.dll");
    AddPlugin(L"good", L"folder.dll\\good.dll");
    EXPECT_FALSE(Initialize());
    EXPECT_EQ(FakeJournal::Read(), L"");
}

TEST_F(Discovery, SkipsA32BitLibrary)
{
    if (!std::filesystem::exists(std::filesystem::path(ORVIX_FAKE_PLUGINS) / L"wrongbitness.dll"))
    {
        GTEST_SKIP() << "built without a 32-bit compiler";
    }
    const std::filesystem::path wrong = AddPlugin(L"wrongbitness");
    EXPECT_FALSE(Initialize());
    AddPlugin(L"good");
    EXPECT_TRUE(Initialize());
    EXPECT_EQ(ProviderNames(), Names{L"Fake Depot"});
    EXPECT_FALSE(IsLoaded(wrong));
}

TEST_F(Discovery, LoadsUnderTheLibrarysOwnManifestAndRestoresTheHosts)
{
    AddPlugin(L"good");
    HANDLE before = nullptr;
    HANDLE after = nullptr;
    ASSERT_TRUE(GetCurrentActCtx(&before));
    EXPECT_TRUE(Initialize());
    ASSERT_TRUE(GetCurrentActCtx(&after));
    EXPECT_EQ(before, after);

    std::wstring manifest(1024, L'\0');
    manifest.resize(
        GetEnvironmentVariableW(L"ORVIX_FAKE_MANIFEST", manifest.data(), static_cast<DWORD>(manifest.size())));
    const std::wstring library = ModulePath(GetModuleHandleW(L"OrvixCore.dll"));
    EXPECT_EQ(CompareStringOrdinal(manifest.c_str(), -1, library.c_str(), -1, TRUE), CSTR_EQUAL)
        << std::filesystem::path(manifest);
}

struct Rejected
{
    const wchar_t* fake;
    const wchar_t* journal;
};

class DiscoveryOfABadPlugin : public ServicesTest, public testing::WithParamInterface<Rejected>
{
};

TEST_P(DiscoveryOfABadPlugin, UnloadsAndDoesNotListIt)
{
    const std::filesystem::path library = AddPlugin(GetParam().fake);
    EXPECT_FALSE(Initialize());
    EXPECT_EQ(m_services->GetProviderCount(), 0u);
    EXPECT_FALSE(IsLoaded(library));
    EXPECT_EQ(FakeJournal::Read(), GetParam().journal);
}

INSTANTIATE_TEST_SUITE_P(
    Defects, DiscoveryOfABadPlugin,
    testing::Values(Rejected{L"version199", L"version199.load version199.version version199.unload "},
                    Rejected{L"version201", L"version201.load version201.version version201.unload "},
                    Rejected{L"noversion", L"noversion.load noversion.unload "},
                    Rejected{L"noget", L"noget.load noget.version noget.name noget.unload "},
                    Rejected{L"norelease", L"norelease.load norelease.version norelease.name norelease.unload "},
                    Rejected{L"noname", L"noname.load noname.version noname.unload "},
                    Rejected{L"noobjects", L"noobjects.load noobjects.version noobjects.name noobjects.unload "},
                    Rejected{L"noexports", L"noexports.load noexports.unload "},
                    Rejected{L"versionthrows", L"versionthrows.load versionthrows.version versionthrows.unload "},
                    Rejected{L"namethrows", L"namethrows.load namethrows.version namethrows.name namethrows.unload "},
                    Rejected{L"namethrowscom",
                             L"namethrowscom.load namethrowscom.version namethrowscom.name namethrowscom.unload "}),
    [](const testing::TestParamInfo<Rejected>& test) { return std::filesystem::path(test.param.fake).string(); });

TEST_F(Plugin, ThatChangesTheCurrentFolderWhenItIsLoadedDoesNoHarm)
{
    const CurrentFolder current(m_config.Path());
    AddPlugin(L"changesfolder");
    AddPlugin(L"other");
    WritePrompts({{.id = "1", .action = InFile(Action::Yes)}});
    EXPECT_TRUE(Initialize());
    EXPECT_NE(std::filesystem::current_path(), m_config.Path());
    EXPECT_EQ(m_services->GetProviderCount(), 2u);
    EXPECT_TRUE(m_services->SetPromptAction(1, Action::No));
    m_services->Shutdown();
    EXPECT_EQ(SavedPrompts(), PromptsXml({{.id = "1", .action = InFile(Action::No)}}));
}

TEST_F(Plugin, WhoseStartUpCodeFailsIsNeverAsked)
{
    const std::filesystem::path library = AddPlugin(L"startfails");
    EXPECT_FALSE(Initialize());
    EXPECT_FALSE(IsLoaded(library));
    EXPECT_EQ(FakeJournal::Read().find(L"startfails.version"), std::wstring::npos);
}

TEST_F(Plugin, IsAskedForItsProviderOnEveryRequest)
{
    AddPlugin(L"good");
    ASSERT_TRUE(Initialize());
    IOrvixProvider* const first = m_services->GetProvider(0);
    IOrvixProvider* const second = m_services->GetProvider(0);
    IOrvixProvider* const third = m_services->GetProvider(0);
    EXPECT_NE(first, nullptr);
    EXPECT_NE(first, second);
    EXPECT_NE(second, third);
    EXPECT_EQ(m_services->GetProvider(0), first) << "the fourth request is answered like the first";
    EXPECT_EQ(FakeJournal::Read(), L"good.load good.version good.name good.get good.get good.get good.get ");
}

TEST_F(Plugin, ThatThrowsWhenAskedForItsProviderHasNone)
{
    AddPlugin(L"getthrows");
    AddPlugin(L"getthrowscom");
    ASSERT_TRUE(Initialize());
    for (const std::uint32_t index : {0u, 1u})
    {
        EXPECT_EQ(m_services->GetProvider(index), nullptr);
        EXPECT_EQ(m_services->GetProvider(index), nullptr);
        EXPECT_STREQ(m_services->GetProviderName(index), L"Fake Depot");
    }
}

TEST_F(Plugin, WithANullNameDoesNoHarm)
{
    AddPlugin(L"good");
    AddPlugin(L"nullname");
    WriteProviders("<a><Name>Depot</Name></a>");
    EXPECT_TRUE(Initialize());
    const Names names = ProviderNames();
    EXPECT_EQ(std::count(names.begin(), names.end(), L"Fake Depot"), 1);
}

TEST_F(Plugin, StaysLoadedUntilShutdown)
{
    const std::filesystem::path good = AddPlugin(L"good");
    ASSERT_TRUE(Initialize());
    const OrvixServicesPointer other = MakeOrvixServices();
    ASSERT_TRUE(other->Initialize(&m_info, OrvixProviderSource::Plugins));
    m_services->Shutdown();
    EXPECT_TRUE(IsLoaded(good)) << "another services object still uses it";
    other->Shutdown();
    EXPECT_FALSE(IsLoaded(good));
}
