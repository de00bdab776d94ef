#include "InstalledTest.h"
#include "ModulePath.h"
#include "OrvixFileEntry.h"
#include "OrvixFileList.h"
#include "OrvixFileListDialogParams.h"
#include "ProcessDllDirectory.h"

using testing::ElementsAre;
using testing::IsEmpty;

namespace
{

using InstalledLibrary = InstalledTest;

/// Every operation that needs the library fails; without an open project the status does not.
void ExpectNotAvailable(IOrvixProvider& provider, OrvixClientInfo& info)
{
    EXPECT_EQ(provider.Initialize(&info), OrvixProviderResult::Failure);
    EXPECT_FALSE(provider.IsInitialized());
    EXPECT_EQ(provider.OpenProject(L"C:\\p", L""), OrvixProviderResult::Failure);
    EXPECT_FALSE(provider.IsProjectOpen());
    EXPECT_EQ(provider.RunProviderClient(), OrvixProviderResult::Failure);
    EXPECT_EQ(provider.ShowOptions(), OrvixProviderResult::Failure);
    EXPECT_EQ(provider.CloseProject(), OrvixProviderResult::Failure);
    EXPECT_EQ(provider.Uninitialize(), OrvixProviderResult::Failure);
}

} // namespace

TEST_F(InstalledLibrary, IsLoadedOnFirstUseOnly)
{
    Install(L"Recorded");
    IOrvixProvider* provider = InitializeAndGet();
    ASSERT_NE(provider, nullptr);
    EXPECT_STREQ(m_services->GetProviderName(0), L"Recorded");
    EXPECT_STREQ(provider->GetName(), L"Recorded");
    EXPECT_FALSE(provider->IsInitialized());
    EXPECT_FALSE(provider->IsProjectOpen());
    EXPECT_THAT(m_scc.calls, IsEmpty());
    m_info.SetClientName(L"Test host");
    EXPECT_EQ(provider->Initialize(&m_info), OrvixProviderResult::Success);
    EXPECT_THAT(m_scc.calls, ElementsAre("load recording_full", "SccGetVersion()",
                                         R"(SccInitialize(0x0, 0x0, "Test host", "Recorded", ""))"));
}

TEST_F(InstalledLibrary, HasOneProviderForAllRequests)
{
    Install(L"Recorded");
    Install(L"Other");
    ASSERT_TRUE(Initialize(OrvixProviderSource::InstalledMSSCCI));
    EXPECT_NE(m_services->GetProvider(0), nullptr);
    EXPECT_EQ(m_services->GetProvider(0), m_services->GetProvider(0));
    EXPECT_NE(m_services->GetProvider(0), m_services->GetProvider(1));
    EXPECT_STREQ(m_services->GetProvider(0)->GetName(), L"Recorded");
    EXPECT_STREQ(m_services->GetProvider(1)->GetName(), L"Other");
    EXPECT_EQ(m_services->GetProvider(2), nullptr);
    EXPECT_EQ(m_services->GetProviderName(2), nullptr);
}

TEST_F(InstalledLibrary, ThatIsMissingIsListedAndNotAvailable)
{
    Install(L"Recorded", Recording(L"missing"));
    IOrvixProvider* provider = InitializeAndGet();
    ASSERT_NE(provider, nullptr);
    EXPECT_EQ(ProviderNames(), Names{L"Recorded"});
    ExpectNotAvailable(*provider, m_info);
}

TEST_F(InstalledLibrary, ThatIsNoLibraryIsListedAndNotAvailable)
{
    const std::filesystem::path file = m_config.Path() / L"notes.dll";
    WriteBytes(file, "These are notes, not a library.");
    Install(L"Recorded", file.wstring());
    IOrvixProvider* provider = InitializeAndGet();
    ASSERT_NE(provider, nullptr);
    ExpectNotAvailable(*provider, m_info);
}

TEST_F(InstalledLibrary, IsTriedAgainAfterAFailedLoad)
{
    const std::filesystem::path file = m_config.Path() / L"late.dll";
    Install(L"Recorded", file.wstring());
    IOrvixProvider* provider = InitializeAndGet();
    ASSERT_NE(provider, nullptr);
    EXPECT_EQ(provider->Initialize(&m_info), OrvixProviderResult::Failure);
    std::filesystem::copy_file(Recording(L"recording_full"), file);
    EXPECT_EQ(provider->Initialize(&m_info), OrvixProviderResult::Success);
}

TEST_F(InstalledLibrary, IsLoadedUnderOrvixCoresManifest)
{
    Install(L"Recorded");
    IOrvixProvider* provider = InitializeAndGet();
    ASSERT_NE(provider, nullptr);
    HANDLE before = nullptr;
    HANDLE after = nullptr;
    ASSERT_TRUE(GetCurrentActCtx(&before));
    EXPECT_EQ(provider->Initialize(&m_info), OrvixProviderResult::Success);
    ASSERT_TRUE(GetCurrentActCtx(&after));
    EXPECT_EQ(before, after);
    const std::wstring core = ModulePath(GetModuleHandleW(L"OrvixCore.dll"));
    EXPECT_EQ(CompareStringOrdinal(m_scc.manifestAtLoad.c_str(), -1, core.c_str(), -1, TRUE), CSTR_EQUAL)
        << std::filesystem::path(m_scc.manifestAtLoad);
}

TEST_F(InstalledLibrary, LeavesTheDllDirectoryOfTheProcessAsItWas)
{
    const std::wstring needed = ORVIX_RECORDING_MSSCCI L"\\needed";
    Install(L"Recorded");
    Install(L"Missing", Recording(L"missing"));
    WriteProviders("<a><Name></Name><MSSCCDllSearchPath>" + std::string(needed.begin(), needed.end()) +
                   "</MSSCCDllSearchPath></a>");
    for (const wchar_t* folder : {static_cast<const wchar_t*>(nullptr), L"C:\\windows"})
    {
        const ProcessDllDirectory directory(folder);
        ASSERT_TRUE(Initialize(OrvixProviderSource::InstalledMSSCCI));
        EXPECT_EQ(ProcessDllDirectory::Current(), folder ? folder : L"");
        EXPECT_EQ(m_services->GetProvider(0)->Initialize(&m_info), OrvixProviderResult::Success);
        EXPECT_EQ(m_scc.dllDirectoryAtLoad, needed);
        EXPECT_EQ(ProcessDllDirectory::Current(), folder ? folder : L"");
        EXPECT_EQ(m_services->GetProvider(1)->Initialize(&m_info), OrvixProviderResult::Failure);
        EXPECT_EQ(ProcessDllDirectory::Current(), folder ? folder : L"");
        m_services->Shutdown();
        EXPECT_EQ(ProcessDllDirectory::Current(), folder ? folder : L"");
    }
}

TEST_F(InstalledLibrary, WithoutASearchFolderIsLoadedWithTheHostsDllDirectory)
{
    Install(L"Recorded");
    const ProcessDllDirectory directory(L"C:\\windows");
    IOrvixProvider* provider = InitializeAndGet();
    ASSERT_NE(provider, nullptr);
    EXPECT_EQ(provider->Initialize(&m_info), OrvixProviderResult::Success);
    EXPECT_EQ(m_scc.dllDirectoryAtLoad, L"C:\\windows");
}

TEST_F(InstalledLibrary, IsEndedAndFreedAtShutdown)
{
    Install(L"Recorded");
    IOrvixProvider* provider = InitializeAndGet();
    ASSERT_NE(provider, nullptr);
    ASSERT_EQ(provider->Initialize(&m_info), OrvixProviderResult::Success);
    ASSERT_EQ(provider->OpenProject(L"C:\\p", L""), OrvixProviderResult::Success);
    m_scc.Take();
    m_services->Shutdown();
    EXPECT_THAT(m_scc.calls, ElementsAre("SccCloseProject(0x0)", "SccUninitialize(0x0)", "unload recording_full"));
    EXPECT_EQ(m_services->GetProviderCount(), 0u);
    EXPECT_FALSE(IsLoaded(Recording(L"recording_full")));
    m_services.reset();
    EXPECT_EQ(m_scc.calls.size(), 3u);
}

TEST_F(InstalledLibrary, IsEndedAndFreedWithTheServicesObject)
{
    Install(L"Recorded");
    IOrvixProvider* provider = InitializeAndGet();
    ASSERT_NE(provider, nullptr);
    ASSERT_EQ(provider->Initialize(&m_info), OrvixProviderResult::Success);
    m_scc.Take();
    m_services.reset();
    EXPECT_THAT(m_scc.calls, ElementsAre("SccUninitialize(0x0)", "unload recording_full"));
}

TEST_F(InstalledLibrary, MayLetTheHostCallBackWhileItIsEnded)
{
    Install(L"First");
    Install(L"Second");
    ASSERT_TRUE(Initialize(OrvixProviderSource::InstalledMSSCCI));
    ASSERT_EQ(m_services->GetProviderCount(), 2u);
    for (std::uint32_t i = 0; i < 2; ++i)
    {
        ASSERT_EQ(m_services->GetProvider(i)->Initialize(&m_info), OrvixProviderResult::Success);
    }
    int called = 0;
    m_scc.uninitialize = [&](LPVOID) {
        ++called;
        EXPECT_EQ(m_services->GetProviderName(0), nullptr);
        EXPECT_EQ(m_services->GetProvider(0), nullptr);
        m_services->Shutdown();
        return SCC_OK;
    };
    m_services->Shutdown();
    EXPECT_EQ(called, 2);
    m_scc.uninitialize = nullptr;
}

TEST_F(InstalledLibrary, ThatWasNeverUsedIsNotLoadedAtTheEnd)
{
    Install(L"Recorded");
    ASSERT_TRUE(Initialize(OrvixProviderSource::InstalledMSSCCI));
    m_services.reset();
    EXPECT_THAT(m_scc.calls, IsEmpty());
}

TEST_F(InstalledLibrary, CanBeFoundAgainAfterShutdown)
{
    Install(L"Recorded");
    ASSERT_NE(InitializeAndGet(), nullptr);
    m_services->Shutdown();
    IOrvixProvider* provider = InitializeAndGet();
    ASSERT_NE(provider, nullptr);
    EXPECT_EQ(provider->Initialize(&m_info), OrvixProviderResult::Success);
}

TEST_F(InstalledLibrary, SendsItsTextOutputToTheHost)
{
    static OutputHost host; // the providers keep it
    Install(L"Recorded");
    IOrvixProvider* provider = InitializeAndGet();
    ASSERT_NE(provider, nullptr);
    m_info.SetIOrvixClientAccess(&host);
    ASSERT_EQ(provider->Initialize(&m_info), OrvixProviderResult::Success);
    m_scc.openProject = [](LPVOID, HWND, LPSTR, LPCSTR, LPCSTR, LPSTR, LPCSTR, LPTEXTOUTPROC output, LONG) {
        return output("opening", SCC_MSG_WARNING);
    };
    EXPECT_EQ(provider->OpenProject(L"C:\\p", L""), OrvixProviderResult::Success);
    EXPECT_THAT(host.lines, ElementsAre(OutputHost::Line(L"opening", 0)));
}

TEST_F(InstalledLibrary, MayLetTheHostEndTheServicesInItsLastCall)
{
    // Each of the host's calls, while the library ends after a shutdown and after one that waited.
    enum class Act
    {
        Release,
        ReleaseAndPrompt,
        Shutdown,
        Initialize
    };
    for (const Act act : {Act::Release, Act::ReleaseAndPrompt, Act::Shutdown, Act::Initialize})
    {
        for (const bool waits : {false, true})
        {
            m_scc = {};
            m_services.reset();
            IOrvixServices* services = GetIOrvixServices();
            Install(L"Recorded");
            ASSERT_TRUE(services->Initialize(&m_info, OrvixProviderSource::InstalledMSSCCI));
            IOrvixProvider* provider = services->GetProvider(0);
            ASSERT_EQ(provider->Initialize(&m_info), OrvixProviderResult::Success);
            ASSERT_EQ(provider->OpenProject(L"C:\\p", L""), OrvixProviderResult::Success);
            m_scc.uninitialize = [&](LPVOID) {
                switch (act)
                {
                case Act::ReleaseAndPrompt:
                    ReleaseIOrvixServices(services);
                    services->ShowPrompt(nullptr, nullptr, nullptr, 0, 0, nullptr);
                    break;
                case Act::Release:
                    ReleaseIOrvixServices(services);
                    break;
                case Act::Shutdown:
                    services->Shutdown();
                    break;
                case Act::Initialize:
                    EXPECT_FALSE(services->Initialize(&m_info, OrvixProviderSource::InstalledMSSCCI));
                    break;
                }
                return SCC_OK;
            };
            m_scc.queryInfo = [&](LPVOID, LONG, LPCSTR*, LPLONG) {
                services->Shutdown();
                EXPECT_NE(GetModuleHandleW(Recording(L"recording_full").c_str()), nullptr) << "the library runs";
                return SCC_OK;
            };
            if (waits)
            {
                OrvixFileList list;
                list.AddActiveEntry(list.CreateEntry(L"C:\\p\\a", nullptr, 0, 0));
                OrvixFileListDialogParams params;
                params.SetOrvixFileList(&list);
                services->RunFileListOperation(nullptr, &params, true, provider, 0, 0);
            }
            else
            {
                services->Shutdown();
            }
            EXPECT_EQ(GetModuleHandleW(Recording(L"recording_full").c_str()), nullptr) << "all is released";
            if (act == Act::Shutdown || act == Act::Initialize)
            {
                ReleaseIOrvixServices(services);
            }
        }
    }
}
