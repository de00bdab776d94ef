#include "ImportHook.h"
#include "InstalledTest.h"

#include <cstring>

using testing::Contains;
using testing::HasSubstr;
using testing::IsEmpty;
using testing::Not;

namespace
{

using InstalledSettings = InstalledTest;

std::string Utf8(const std::wstring& ascii)
{
    return {ascii.begin(), ascii.end()};
}

/// The path that OrvixCore.dll tried to load last, and the DLL directories that it set. The system gets neither.
class LoadWatch
{
public:
    LoadWatch()
    {
        s_path.clear();
        s_folders.clear();
    }
    const std::wstring& Path() const { return s_path; }
    const std::vector<std::wstring>& Folders() const { return s_folders; }

private:
    static HMODULE WINAPI Load(const wchar_t* path, HANDLE, DWORD)
    {
        s_path = path;
        return nullptr;
    }
    static BOOL WINAPI SetFolder(const wchar_t* folder)
    {
        s_folders.emplace_back(folder != nullptr ? folder : L"");
        return TRUE;
    }

    inline static std::wstring s_path;
    inline static std::vector<std::wstring> s_folders;
    ImportHook m_load{GetModuleHandleW(L"OrvixCore.dll"), "LoadLibraryExW", reinterpret_cast<void*>(&Load)};
    ImportHook m_setFolder{GetModuleHandleW(L"OrvixCore.dll"), "SetDllDirectoryW", reinterpret_cast<void*>(&SetFolder)};
};

} // namespace

TEST_F(InstalledSettings, DisableAProvider)
{
    Install(L"Recorded");
    Install(L"Other", Recording(L"recording_without_SccAdd"));
    WriteProviders("<a><Name>recorded</Name><Enabled>false</Enabled></a>");
    EXPECT_TRUE(Initialize(OrvixProviderSource::InstalledMSSCCI));
    EXPECT_EQ(ProviderNames(), Names{L"Other"});
    EXPECT_EQ(m_services->GetProvider(0)->RunProviderClient(), OrvixProviderResult::Success);
    EXPECT_THAT(m_scc.calls, Not(Contains("load recording_full")));
}

TEST_F(InstalledSettings, DisableAProviderWithoutReadingItsPath)
{
    SetBytes(Install(L"Recorded"), ServerPath, REG_SZ, std::string(2048, 'x'));
    WriteProviders("<a><Name>Recorded</Name><Enabled>false</Enabled></a>");
    EXPECT_TRUE(Initialize(OrvixProviderSource::InstalledMSSCCI)) << "a text that would end the process is not read";
    EXPECT_EQ(m_services->GetProviderCount(), 0u);
}

TEST_F(InstalledSettings, OfTheProvidersNameBelongToIt)
{
    Install(L"My Recorded Things");
    Install(L"Other");
    WriteProviders("<a><Name>recorded</Name><FixedProjectRoot>root</FixedProjectRoot>"
                   "<AltProviderExecutable>a.exe</AltProviderExecutable>"
                   "<Filters><f><Name>Temporary</Name><FileType>tmp</FileType></f></Filters></a>");
    EXPECT_TRUE(Initialize(OrvixProviderSource::InstalledMSSCCI));
    ASSERT_EQ(ProviderNames(), (Names{L"My Recorded Things", L"Other"}));
    EXPECT_STREQ(m_services->GetProviderFixedProjectRoot(0), L"root");
    EXPECT_STREQ(m_services->GetProviderAltExecutable(0), L"a.exe");
    EXPECT_TRUE(m_services->IsFileExcludedByProvider(0, L"a.tmp", nullptr));
    EXPECT_EQ(m_services->GetProviderFixedProjectRoot(1), nullptr);
    EXPECT_FALSE(m_services->IsFileExcludedByProvider(1, L"a.tmp", nullptr));
}

TEST_F(InstalledSettings, ReplaceTheRegisteredLibrary)
{
    Install(L"Recorded", Recording(L"recording_full"));
    WriteProviders("<a><Name>Recorded</Name><MSSCCDllFullPath>" + Utf8(Recording(L"recording_without_SccAdd")) +
                   "</MSSCCDllFullPath></a>");
    IOrvixProvider* provider = InitializeAndGet();
    ASSERT_NE(provider, nullptr);
    EXPECT_EQ(provider->RunProviderClient(), OrvixProviderResult::Success);
    EXPECT_THAT(m_scc.calls, Contains("load recording_without_SccAdd"));
    EXPECT_THAT(m_scc.calls, Not(Contains("load recording_full")));
}

TEST_F(InstalledSettings, NameTheLibraryOfAProviderThatRegistersNone)
{
    AddKey().SetString(ServerName, L"Recorded");
    m_list.SetString(L"1", m_keys.back().Path());
    Install(L"Recorded too").SetBytes(ServerPath, REG_SZ, std::string(2048, 'x').data(), 2048);
    WriteProviders("<a><Name>Recorded</Name><MSSCCDllFullPath>" + Utf8(Recording(L"recording_full")) +
                   "</MSSCCDllFullPath></a>");
    EXPECT_TRUE(Initialize(OrvixProviderSource::InstalledMSSCCI)) << "a text that would end the process is not read";
    ASSERT_EQ(ProviderNames(), (Names{L"Recorded", L"Recorded too"}));
    EXPECT_EQ(m_services->GetProvider(0)->RunProviderClient(), OrvixProviderResult::Success);
    EXPECT_EQ(m_services->GetProvider(1)->RunProviderClient(), OrvixProviderResult::Success);
}

TEST_F(InstalledSettings, WithoutALibraryLeaveTheRegisteredOne)
{
    Install(L"Recorded");
    AddKey().SetString(ServerName, L"Recorded without path");
    m_list.SetString(L"2", m_keys.back().Path());
    WriteProviders("<a><Name>Recorded</Name><MSSCCDllFullPath></MSSCCDllFullPath></a>");
    IOrvixProvider* provider = InitializeAndGet();
    ASSERT_NE(provider, nullptr);
    EXPECT_EQ(provider->RunProviderClient(), OrvixProviderResult::Success);
}

TEST_F(InstalledSettings, AreCutAtTheirLongest)
{
    Install(L"Recorded");
    const std::string path = "C:\\" + std::string(1022, 'p') + "q";
    const std::string folder = "C:\\" + std::string(258, 'f') + "g";
    ASSERT_EQ(path.size(), 1026u);
    ASSERT_EQ(folder.size(), 262u);
    WriteProviders("<a><Name>Recorded</Name><MSSCCDllFullPath>" + path + "</MSSCCDllFullPath><MSSCCDllSearchPath>" +
                   folder + "</MSSCCDllSearchPath></a>");
    IOrvixProvider* provider = InitializeAndGet();
    ASSERT_NE(provider, nullptr);
    const LoadWatch loads;
    EXPECT_EQ(provider->RunProviderClient(), OrvixProviderResult::Failure);
    EXPECT_EQ(loads.Path(), std::wstring(path.begin(), path.begin() + 1024));
    ASSERT_THAT(loads.Folders(), Not(IsEmpty()));
    EXPECT_EQ(loads.Folders().front(), std::wstring(folder.begin(), folder.begin() + 260));
}

TEST_F(InstalledSettings, NameTheFolderOfWhatTheLibraryNeeds)
{
    Install(L"Recorded", Recording(L"recording_dependent"));
    IOrvixProvider* provider = InitializeAndGet();
    ASSERT_NE(provider, nullptr);
    EXPECT_EQ(provider->RunProviderClient(), OrvixProviderResult::Failure)
        << "what the library needs is found without the setting";
    m_services->Shutdown();

    const std::wstring needed = ORVIX_RECORDING_MSSCCI L"\\needed";
    WriteProviders("<a><Name>Recorded</Name><MSSCCDllSearchPath>" + Utf8(needed) + "</MSSCCDllSearchPath></a>");
    provider = InitializeAndGet();
    ASSERT_NE(provider, nullptr);
    EXPECT_EQ(provider->RunProviderClient(), OrvixProviderResult::Success);
    EXPECT_EQ(m_scc.dllDirectoryAtLoad, needed);
}

TEST_F(InstalledSettings, NameTheFileBesideTheProject)
{
    Install(L"Recorded");
    WriteProviders("<a><Name>Recorded</Name><MSSCCProjectFile>project.xml</MSSCCProjectFile></a>");
    IOrvixProvider* provider = InitializeAndGet();
    ASSERT_NE(provider, nullptr);
    ASSERT_EQ(provider->Initialize(&m_info), OrvixProviderResult::Success);
    m_scc.openProject = [](LPVOID, HWND, LPSTR, LPCSTR, LPCSTR, LPSTR aux, LPCSTR, LPTEXTOUTPROC, LONG) {
        std::strcpy(aux, "server:1");
        return SCC_OK;
    };
    const TempFolder project;
    ASSERT_EQ(provider->OpenProject(project.Text().c_str(), L""), OrvixProviderResult::Success);
    EXPECT_THAT(ReadBytes(project.Path() / L"project.xml"), HasSubstr("<AuxPath>server:1</AuxPath>"));
}

TEST_F(InstalledSettings, WithoutAFileLeaveTheProjectFolderAlone)
{
    Install(L"Recorded");
    Install(L"Other");
    WriteProviders("<a><Name>Recorded</Name></a>");
    ASSERT_TRUE(Initialize(OrvixProviderSource::InstalledMSSCCI));
    for (std::uint32_t i = 0; i < 2; ++i)
    {
        const TempFolder project;
        IOrvixProvider* provider = m_services->GetProvider(i);
        ASSERT_EQ(provider->Initialize(&m_info), OrvixProviderResult::Success);
        ASSERT_EQ(provider->OpenProject(project.Text().c_str(), L""), OrvixProviderResult::Success);
        EXPECT_TRUE(std::filesystem::is_empty(project.Path()));
    }
}
