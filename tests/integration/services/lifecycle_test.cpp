#include "BraeDiagnostics.h"
#include "CurrentFolder.h"
#include "ServicesTest.h"

namespace
{

/// A record of the host's own class, without folders.
class NamelessClientInfo : public OrvixClientInfo
{
public:
    const wchar_t* GetConfigFilePath() override { return nullptr; }
    const wchar_t* GetProviderPluginPath() override { return nullptr; }
};

using ServicesEntry = ServicesTest;
using ServicesInitialize = ServicesTest;
using ServicesShutdown = ServicesTest;
using ServicesDestructor = ServicesTest;

} // namespace

TEST_F(ServicesEntry, LanguagePackIsSelectedForTheLibrarysOwnModule)
{
    EXPECT_NE(GetModuleHandleW(L"OrvixCore.dll"), nullptr);
    EXPECT_EQ(BraeDiagnostics::LanguagePackModule(), GetModuleHandleW(L"OrvixCore.dll"));
}

TEST_F(ServicesEntry, IsReachedThroughTheNamesOfTheExportedFunctions)
{
    const HMODULE library = LoadLibraryW(L"OrvixCore.dll");
    ASSERT_NE(library, nullptr);
    const auto get = reinterpret_cast<decltype(&GetIOrvixServices)>(
        reinterpret_cast<void*>(GetProcAddress(library, "GetIOrvixServices")));
    const auto release = reinterpret_cast<decltype(&ReleaseIOrvixServices)>(
        reinterpret_cast<void*>(GetProcAddress(library, "ReleaseIOrvixServices")));
    ASSERT_NE(get, nullptr);
    ASSERT_NE(release, nullptr);
    IOrvixServices* services = get();
    ASSERT_NE(services, nullptr);
    EXPECT_EQ(services->GetProviderCount(), 0u);
    release(services);
    FreeLibrary(library);
}

TEST_F(ServicesEntry, EveryServicesObjectIsIndependent)
{
    const OrvixServicesPointer other = MakeOrvixServices();
    ASSERT_NE(other, nullptr);
    ASSERT_NE(other, m_services);
    m_services->RegisterPrompt(1, L"text", Action::Yes, 0, false);
    EXPECT_EQ(m_services->GetPromptAction(1), Action::Yes);
    EXPECT_EQ(other->GetPromptAction(1), 0u);
    AddPlugin(L"good");
    EXPECT_TRUE(Initialize());
    EXPECT_EQ(m_services->GetProviderCount(), 1u);
    EXPECT_EQ(other->GetProviderCount(), 0u);
}

TEST_F(ServicesEntry, ReleasingNullDoesNothing)
{
    ReleaseIOrvixServices(nullptr);
}

TEST_F(ServicesEntry, ANewObjectHasNoProvidersAndNoPrompts)
{
    std::wstring name = L"before";
    EXPECT_EQ(m_services->GetProviderCount(), 0u);
    EXPECT_EQ(m_services->GetProviderName(0), nullptr);
    EXPECT_EQ(m_services->GetProvider(0), nullptr);
    EXPECT_EQ(m_services->GetProviderFixedProjectRoot(0), nullptr);
    EXPECT_EQ(m_services->GetProviderAltExecutable(0), nullptr);
    EXPECT_FALSE(m_services->IsFileExcludedByProvider(0, L"a", &name));
    EXPECT_EQ(name, L"before");
    EXPECT_EQ(m_services->GetPromptAction(1), 0u);
    EXPECT_FALSE(m_services->SetPromptAction(1, Action::Yes));
}

TEST_F(ServicesInitialize, WithoutSourcesLoadsBothFilesAddsNoProviderAndStillInitialises)
{
    AddPlugin(L"good");
    WriteProviders("<a><Name>Fake Depot</Name><FixedProjectRoot>root</FixedProjectRoot></a>");
    WritePrompts({{.id = "7", .action = InFile(Action::Yes)}});
    EXPECT_FALSE(Initialize(0));
    EXPECT_EQ(m_services->GetProviderCount(), 0u);
    EXPECT_EQ(m_services->GetPromptAction(7), Action::Yes);
    EXPECT_EQ(FakeJournal::Read(), L"");

    // The object is initialised, so that its end saves the prompts.
    std::filesystem::remove(PromptsFile());
    m_services.reset();
    EXPECT_TRUE(std::filesystem::exists(PromptsFile()));
}

TEST_F(ServicesInitialize, ReadsTheProviderSettingsBeforeTheScan)
{
    AddPlugin(L"good");
    WriteProviders("<a><Name>Fake Depot</Name><FixedProjectRoot>root</FixedProjectRoot></a>");
    EXPECT_TRUE(Initialize());
    EXPECT_STREQ(m_services->GetProviderFixedProjectRoot(0), L"root");
}

TEST_F(ServicesInitialize, MissingFilesLeaveEverythingEmptyAndEnabled)
{
    AddPlugin(L"good");
    EXPECT_TRUE(Initialize());
    EXPECT_EQ(m_services->GetProviderCount(), 1u);
    EXPECT_EQ(m_services->GetProviderFixedProjectRoot(0), nullptr);
    EXPECT_EQ(m_services->GetPromptAction(1), 0u);
}

TEST_F(ServicesInitialize, AMissingConfigurationFolderIsNoError)
{
    AddPlugin(L"good");
    m_info.SetConfigFilePath((m_config.Text() + L"\\no\\such\\folder").c_str());
    EXPECT_TRUE(Initialize());
    m_services->RegisterPrompt(1, L"text", Action::Yes, 0, false);
    m_services->Shutdown();
    EXPECT_FALSE(std::filesystem::exists(m_config.Path() / L"no"));
}

TEST_F(ServicesInitialize, OtherSourceBitsFindNothing)
{
    AddPlugin(L"good");
    EXPECT_FALSE(Initialize(OtherSources));
    EXPECT_EQ(m_services->GetProviderCount(), 0u);
}

TEST_F(ServicesInitialize, TwiceAddsEveryProviderTwiceAndReloadsThePrompts)
{
    AddPlugin(L"good");
    AddPlugin(L"other");
    WritePrompts({{.id = "1", .action = InFile(Action::Yes)}});
    EXPECT_TRUE(Initialize());
    const Names once = ProviderNames();
    ASSERT_EQ(once.size(), 2u);
    m_services->RegisterPrompt(2, L"text", Action::No, 0, false);
    EXPECT_TRUE(Initialize());
    EXPECT_EQ(ProviderNames(), (Names{once[0], once[1], once[0], once[1]}));
    EXPECT_EQ(m_services->GetPromptAction(1), Action::Yes);
    EXPECT_EQ(m_services->GetPromptAction(2), 0u) << "the table was not cleared before it was loaded again";
}

TEST_F(ServicesInitialize, TwiceKeepsTheFirstProviderSettingsBeforeTheSecond)
{
    AddPlugin(L"good");
    WriteProviders("<a><Name>Fake Depot</Name><FixedProjectRoot>first</FixedProjectRoot></a>");
    EXPECT_TRUE(Initialize());
    WriteProviders("<a><Name>Fake Depot</Name><FixedProjectRoot>second</FixedProjectRoot></a>");
    EXPECT_TRUE(Initialize());
    EXPECT_STREQ(m_services->GetProviderFixedProjectRoot(0), L"first");
    EXPECT_STREQ(m_services->GetProviderFixedProjectRoot(1), L"first");
}

TEST_F(ServicesInitialize, TakesTheLatestConfigurationFolder)
{
    const TempFolder second;
    WritePrompts({{.id = "1", .action = InFile(Action::Yes)}});
    EXPECT_FALSE(Initialize());
    m_info.SetConfigFilePath(second.Text().c_str());
    EXPECT_FALSE(Initialize());
    EXPECT_EQ(m_services->GetPromptAction(1), 0u);
    m_services->RegisterPrompt(3, L"text", Action::YesToAll, 0, false);
    m_services->Shutdown();
    EXPECT_TRUE(std::filesystem::exists(second.Path() / L"OrvixPrompts.xml"));
}

TEST_F(ServicesInitialize, ANullConfigurationPathKeepsTheFolderOfTheCallBefore)
{
    WritePrompts({{.id = "1", .action = InFile(Action::Yes)}});
    EXPECT_FALSE(Initialize());
    NamelessClientInfo nameless;
    m_services->SetPromptAction(1, Action::No);
    EXPECT_FALSE(m_services->Initialize(&nameless, OrvixProviderSource::Plugins));
    EXPECT_EQ(m_services->GetPromptAction(1), Action::Yes) << "not read again from the same file";
}

TEST_F(ServicesInitialize, ANullConfigurationPathUsesTheCurrentFolder)
{
    AddPlugin(L"good");
    const CurrentFolder current(m_config.Path());
    WriteProviders("<a><Name>Fake Depot</Name><Enabled>false</Enabled></a>");
    WritePrompts({{.id = "1", .action = InFile(Action::Yes)}});
    class PluginsOnly : public NamelessClientInfo
    {
    public:
        explicit PluginsOnly(std::wstring folder) : m_folder(std::move(folder)) {}
        const wchar_t* GetProviderPluginPath() override { return m_folder.c_str(); }

    private:
        std::wstring m_folder;
    } info(m_plugins.Text() + L"\\");
    EXPECT_FALSE(m_services->Initialize(&info, OrvixProviderSource::Plugins));
    EXPECT_EQ(m_services->GetProviderCount(), 0u) << "the provider settings were not read";
    EXPECT_EQ(m_services->GetPromptAction(1), Action::Yes) << "the prompts were not read";
    EXPECT_TRUE(m_services->SetPromptAction(1, Action::No));
    m_services->Shutdown();
    EXPECT_EQ(SavedPrompts(), PromptsXml({{.id = "1", .action = InFile(Action::No)}}));
}

TEST_F(ServicesInitialize, AnEmptyConfigurationPathMeansTheRootFolder)
{
    // One backslash is appended to an empty path as to any other. The root folder has no such files.
    const CurrentFolder current(m_config.Path());
    WritePrompts({{.id = "1", .action = InFile(Action::Yes)}});
    m_info.SetConfigFilePath(L"");
    EXPECT_FALSE(Initialize());
    EXPECT_EQ(m_services->GetPromptAction(1), 0u);
}

TEST_F(ServicesInitialize, AConfigurationPathThatEndsInABackslashStillReachesTheFiles)
{
    AddPlugin(L"good");
    WriteProviders("<a><Name>Fake Depot</Name><FixedProjectRoot>root</FixedProjectRoot></a>");
    WritePrompts({{.id = "1", .action = InFile(Action::Yes)}});
    m_info.SetConfigFilePath((m_config.Text() + L"\\").c_str());
    EXPECT_TRUE(Initialize());
    EXPECT_EQ(m_services->GetPromptAction(1), Action::Yes);
    EXPECT_STREQ(m_services->GetProviderFixedProjectRoot(0), L"root");
    m_services->SetPromptAction(1, Action::No);
    m_services->Shutdown();
    EXPECT_EQ(SavedPrompts(), PromptsXml({{.id = "1", .action = InFile(Action::No)}}));
}

TEST_F(ServicesInitialize, ANullPluginPathFindsNothing)
{
    NamelessClientInfo nameless;
    const TempFolder folder;
    const CurrentFolder current(folder.Path());
    EXPECT_FALSE(m_services->Initialize(&nameless, OrvixProviderSource::Plugins));
    EXPECT_EQ(m_services->GetProviderCount(), 0u);
}

TEST_F(ServicesInitialize, AnUnsetPluginPathNeverSearchesTheCurrentFolder)
{
    AddPlugin(L"good");
    const CurrentFolder current(m_plugins.Path());
    NamelessClientInfo nameless;
    EXPECT_FALSE(m_services->Initialize(&nameless, OrvixProviderSource::Plugins));
    OrvixClientInfo unset;
    EXPECT_FALSE(m_services->Initialize(&unset, OrvixProviderSource::Plugins));
    unset.SetProviderPluginPath(L"");
    EXPECT_FALSE(m_services->Initialize(&unset, OrvixProviderSource::Plugins));
    EXPECT_EQ(m_services->GetProviderCount(), 0u);
}

TEST_F(ServicesInitialize, AFolderWithAnEscapeOfAUrlInItsNameIsTakenAsItIs)
{
    AddPlugin(L"good");
    const std::filesystem::path folder = m_config.Path() / L"a%20b";
    const std::filesystem::path other = m_config.Path() / L"a b";
    for (const auto& [path, enabled] : {std::pair{folder, "false"}, std::pair{other, "true"}})
    {
        std::filesystem::create_directory(path);
        WriteBytes(path / L"OrvixProviders.xml", std::string("<OrvixProviders><a><Name>Depot</Name><Enabled>") +
                                                     enabled + "</Enabled></a></OrvixProviders>");
    }
    m_info.SetConfigFilePath(folder.c_str());
    EXPECT_FALSE(Initialize());
    EXPECT_EQ(m_services->GetProviderCount(), 0u);
    m_services->RegisterPrompt(1, L"text", Action::Yes, 0, false);
    m_services->Shutdown();
    EXPECT_TRUE(std::filesystem::exists(folder / L"OrvixPrompts.xml"));
    EXPECT_FALSE(std::filesystem::exists(other / L"OrvixPrompts.xml"));
    m_info.SetConfigFilePath((L"\\\\?\\" + folder.wstring()).c_str());
    m_services = MakeOrvixServices();
    EXPECT_FALSE(Initialize());
    EXPECT_EQ(m_services->GetPromptAction(1), Action::Yes);
}

TEST_F(ServicesInitialize, ANullRecordDoesNothing)
{
    EXPECT_FALSE(m_services->Initialize(nullptr, OrvixProviderSource::Plugins | OrvixProviderSource::InstalledMSSCCI));
    EXPECT_EQ(m_services->GetProviderCount(), 0u);
}

TEST_F(ServicesInitialize, WorksThroughAHostsOwnRecord)
{
    class HostInfo : public OrvixClientInfo
    {
    public:
        HostInfo(std::wstring config, std::wstring plugins)
            : m_hostConfig(std::move(config)), m_hostPlugins(std::move(plugins))
        {
        }
        const wchar_t* GetConfigFilePath() override { return m_hostConfig.c_str(); }
        const wchar_t* GetProviderPluginPath() override { return m_hostPlugins.c_str(); }

    private:
        std::wstring m_hostConfig;
        std::wstring m_hostPlugins;
    } info(m_config.Text(), m_plugins.Text() + L"\\");
    AddPlugin(L"good");
    WritePrompts({{.id = "1", .action = InFile(Action::Yes)}});
    EXPECT_TRUE(m_services->Initialize(&info, OrvixProviderSource::Plugins));
    EXPECT_EQ(m_services->GetPromptAction(1), Action::Yes);
}

TEST_F(ServicesShutdown, SavesThePromptsAndReleasesEveryProvider)
{
    const std::filesystem::path good = AddPlugin(L"good");
    const std::filesystem::path other = AddPlugin(L"other");
    EXPECT_TRUE(Initialize());
    EXPECT_TRUE(IsLoaded(good));
    EXPECT_TRUE(IsLoaded(other));
    m_services->RegisterPrompt(1, L"text", Action::Yes, 0, false);
    m_services->Shutdown();
    EXPECT_EQ(m_services->GetProviderCount(), 0u);
    EXPECT_EQ(m_services->GetProviderName(0), nullptr);
    EXPECT_FALSE(IsLoaded(good));
    EXPECT_FALSE(IsLoaded(other));
    EXPECT_EQ(SavedPrompts(), PromptsXml({{.action = InFile(Action::Yes)}}));
    EXPECT_EQ(m_services->GetPromptAction(1), Action::Yes) << "the table lives as long as the object";
}

TEST_F(ServicesShutdown, AProviderAddedTwiceIsReleasedTwice)
{
    const std::filesystem::path good = AddPlugin(L"good");
    Initialize();
    Initialize();
    ASSERT_EQ(m_services->GetProviderCount(), 2u);
    m_services->Shutdown();
    EXPECT_FALSE(IsLoaded(good));
}

TEST_F(ServicesShutdown, TheObjectCanBeInitialisedAgain)
{
    AddPlugin(L"good");
    EXPECT_TRUE(Initialize());
    m_services->Shutdown();
    EXPECT_TRUE(Initialize());
    EXPECT_EQ(ProviderNames(), Names{L"Fake Depot"});
    EXPECT_NE(m_services->GetProvider(0), nullptr);
}

TEST_F(ServicesShutdown, WithoutInitializeSavesIntoTheCurrentFolder)
{
    const CurrentFolder current(m_config.Path());
    m_services->RegisterPrompt(1, L"text", Action::Yes, 0, false);
    m_services->Shutdown();
    EXPECT_EQ(SavedPrompts(), PromptsXml({{.action = InFile(Action::Yes)}}));
}

TEST_F(ServicesShutdown, TwiceIsHarmless)
{
    AddPlugin(L"good");
    Initialize();
    m_services->Shutdown();
    m_services->Shutdown();
    EXPECT_EQ(m_services->GetProviderCount(), 0u);
}

TEST_F(ServicesShutdown, NeverReleasesAPluginsObject)
{
    AddPlugin(L"good");
    Initialize();
    EXPECT_NE(m_services->GetProvider(0), nullptr);
    m_services->Shutdown();
    EXPECT_EQ(FakeJournal::Read(), L"good.load good.version good.name good.get good.unload ");
}

TEST_F(ServicesDestructor, DoesWhatShutdownDoesWhenInitialised)
{
    const std::filesystem::path good = AddPlugin(L"good");
    Initialize();
    m_services->RegisterPrompt(1, L"text", Action::Yes, 0, false);
    m_services.reset();
    EXPECT_FALSE(IsLoaded(good));
    EXPECT_EQ(SavedPrompts(), PromptsXml({{.action = InFile(Action::Yes)}}));
}

TEST_F(ServicesDestructor, SavesNothingWhenNeverInitialised)
{
    const CurrentFolder current(m_config.Path());
    m_services->RegisterPrompt(1, L"text", Action::Yes, 0, false);
    m_services.reset();
    EXPECT_FALSE(std::filesystem::exists(PromptsFile()));
}

TEST_F(ServicesDestructor, SavesASecondTimeOnlyWhenInitializeWasCalledAfterShutdown)
{
    Initialize();
    m_services->RegisterPrompt(1, L"text", Action::Yes, 0, false);
    m_services->Shutdown();
    std::filesystem::remove(PromptsFile());
    m_services.reset();
    EXPECT_FALSE(std::filesystem::exists(PromptsFile()));

    m_services = MakeOrvixServices();
    Initialize();
    m_services->RegisterPrompt(1, L"text", Action::Yes, 0, false);
    m_services->Shutdown();
    Initialize();
    std::filesystem::remove(PromptsFile());
    m_services.reset();
    EXPECT_TRUE(std::filesystem::exists(PromptsFile()));
}
