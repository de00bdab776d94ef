// Finding the library and its functions.

#include "Bridge.h"
#include "Files.h"
#include "ImportHook.h"
#include "ProcessDllDirectory.h"
#include "SccFunctions.h"

#include <algorithm>
#include <filesystem>
#include <iterator>

using testing::Contains;
using testing::ElementsAre;
using testing::IsEmpty;
using testing::Not;

namespace
{

const std::wstring NeededFolder = std::wstring(ORVIX_RECORDING_MSSCCI) + L"\\needed";

/// The folders that the program sets as DLL directory, in order; "none" for null.
class GivenDllDirectories
{
public:
    GivenDllDirectories()
    {
        s_folders.clear();
        s_hook = &m_hook;
    }
    GivenDllDirectories(const GivenDllDirectories&) = delete;
    GivenDllDirectories& operator=(const GivenDllDirectories&) = delete;
    ~GivenDllDirectories() { s_hook = nullptr; }

    static const std::vector<std::wstring>& Folders() { return s_folders; }

private:
    static BOOL WINAPI Set(LPCWSTR folder)
    {
        s_folders.emplace_back(folder != nullptr ? folder : L"none");
        return s_hook->Original<BOOL WINAPI(LPCWSTR)>()(folder);
    }

    inline static std::vector<std::wstring> s_folders;
    inline static const ImportHook* s_hook = nullptr;
    ImportHook m_hook{GetModuleHandleW(nullptr), "SetDllDirectoryW", reinterpret_cast<void*>(&Set)};
};

/// Counts the functions that the program looks up in libraries.
class AskedNames
{
public:
    AskedNames()
    {
        s_names.clear();
        s_hook = &m_hook;
    }
    AskedNames(const AskedNames&) = delete;
    AskedNames& operator=(const AskedNames&) = delete;
    ~AskedNames() { s_hook = nullptr; }

    static long Count(const std::string& name) { return static_cast<long>(std::ranges::count(s_names, name)); }

private:
    static FARPROC WINAPI Ask(HMODULE module, LPCSTR name)
    {
        s_names.emplace_back(name);
        return s_hook->Original<FARPROC WINAPI(HMODULE, LPCSTR)>()(module, name);
    }

    inline static std::vector<std::string> s_names;
    inline static const ImportHook* s_hook = nullptr;
    ImportHook m_hook{GetModuleHandleW(nullptr), "GetProcAddress", reinterpret_cast<void*>(&Ask)};
};

/// An operation that calls one function of the library and nothing else.
struct Operation
{
    std::string function;
    SCCRTN (*run)(OrvixMSSCC& bridge);
    SCCRTN result = SCC_OK;
};

/// In an order in which a host may call them.
const Operation Operations[] = {
    {SccFunctions::GetVersion.name, [](OrvixMSSCC& bridge) { return bridge.GetVersion(); }, 0x00010003},
    {SccFunctions::Initialize.name, [](OrvixMSSCC& bridge) { return bridge.Initialize("host"); }},
    {SccFunctions::OpenProject.name, [](OrvixMSSCC& bridge) { return bridge.OpenProject("C:\\p", "", nullptr); }},
    {SccFunctions::GetProjPath.name,
     [](OrvixMSSCC& bridge) { return bridge.GetProjPath(nullptr, nullptr, nullptr, nullptr, FALSE); }},
    {SccFunctions::Get.name, [](OrvixMSSCC& bridge) { return bridge.Get(0, nullptr, 0, nullptr); }},
    {SccFunctions::Checkout.name, [](OrvixMSSCC& bridge) { return bridge.Checkout(0, nullptr, "", 0, nullptr); }},
    {SccFunctions::Uncheckout.name, [](OrvixMSSCC& bridge) { return bridge.Uncheckout(0, nullptr, 0, nullptr); }},
    {SccFunctions::Checkin.name, [](OrvixMSSCC& bridge) { return bridge.Checkin(0, nullptr, "", 0, nullptr); }},
    {SccFunctions::Add.name, [](OrvixMSSCC& bridge) { return bridge.Add(0, nullptr, "", nullptr, nullptr); }},
    {SccFunctions::BeginBatch.name, [](OrvixMSSCC& bridge) { return bridge.BeginBatch(); }},
    {SccFunctions::EndBatch.name, [](OrvixMSSCC& bridge) { return bridge.EndBatch(); }},
    {SccFunctions::History.name, [](OrvixMSSCC& bridge) { return bridge.History(0, nullptr, 0, nullptr); }},
    {SccFunctions::Properties.name, [](OrvixMSSCC& bridge) { return bridge.Properties(""); }},
    {SccFunctions::QueryInfo.name, [](OrvixMSSCC& bridge) { return bridge.QueryInfo(0, nullptr, nullptr); }},
    {SccFunctions::PopulateList.name,
     [](OrvixMSSCC& bridge) {
         return bridge.PopulateList(SCC_COMMAND_OPTIONS, 0, nullptr, nullptr, nullptr, nullptr, 0);
     }},
    {SccFunctions::RunScc.name, [](OrvixMSSCC& bridge) { return bridge.RunScc(0, nullptr); }},
    {SccFunctions::GetCommandOptions.name, [](OrvixMSSCC& bridge) { return bridge.GetCommandOptions(); },
     SCC_I_ADV_SUPPORT},
    {SccFunctions::SetOption.name, [](OrvixMSSCC& bridge) { return bridge.SetOption(1, 1); }, SCC_I_SHARESUBPROJOK},
    {SccFunctions::AddFromScc.name, [](OrvixMSSCC& bridge) { return bridge.AddFromScc(nullptr, nullptr); }},
    {SccFunctions::CloseProject.name, [](OrvixMSSCC& bridge) { return bridge.CloseProject(); }},
    {SccFunctions::Uninitialize.name, [](OrvixMSSCC& bridge) { return bridge.Uninitialize(); }},
};
static_assert(std::size(Operations) == std::size(SccFunctions::Names), "every function has its operation");

class BridgeLoading : public Bridge
{
protected:
    /// Lets every operation reach its function.
    void AllowEverything()
    {
        m_capabilities = SCC_CAP_ADDFROMSCC;
        m_recorder.results["SccSetOption"] = SCC_I_SHARESUBPROJOK;
        m_recorder.results["SccGetCommandOptions"] = SCC_I_ADV_SUPPORT;
    }

    void Copy(const std::wstring& library, const std::filesystem::path& to)
    {
        ASSERT_TRUE(std::filesystem::copy_file(LibraryPath(library), to));
    }
};

using BridgeFunctions = BridgeLoading;
using BridgeDllDirectory = BridgeLoading;

TEST_F(BridgeLoading, HappensWithTheFirstCallAndAsksForTheVersionOnce)
{
    EXPECT_THAT(AllCalls(), IsEmpty());
    EXPECT_EQ(m_bridge->Initialize("host"), SCC_OK);
    EXPECT_THAT(AllCalls(), ElementsAre("load recording_full", "SccGetVersion()",
                                        "SccInitialize(0x0, 0x1234, \"host\", \"Depot\", \"\")"));
}

TEST_F(BridgeLoading, HappensWithWhicheverOperationComesFirst)
{
    for (const Operation& operation : Operations)
    {
        if (operation.function == "SccAddFromScc" || operation.function == "SccCloseProject")
        {
            continue; // they have nothing to do for a library that was not started
        }
        SCOPED_TRACE(operation.function);
        NewBridge(L"recording_full");
        operation.run(*m_bridge);
        const std::vector<std::string> calls = AllCalls();
        ASSERT_GE(calls.size(), 3u);
        EXPECT_EQ(calls[0], "load recording_full");
        EXPECT_EQ(calls[1], "SccGetVersion()");
        EXPECT_TRUE(calls[2].starts_with(operation.function + "("));
        operation.run(*m_bridge);
        EXPECT_THAT(AllCalls(), Not(Contains("load recording_full")));
    }
}

TEST_F(BridgeLoading, IsNotCausedByAddFromSccOrCloseProjectBeforeTheyHaveWork)
{
    EXPECT_EQ(m_bridge->AddFromScc(nullptr, nullptr), SCC_E_OPNOTSUPPORTED);
    EXPECT_EQ(m_bridge->CloseProject(), SCC_E_PROJNOTOPEN);
    EXPECT_THAT(AllCalls(), IsEmpty());
}

TEST_F(BridgeLoading, ReportsTheNamesOfSetProviderAndThatNothingIsDoneYet)
{
    EXPECT_STREQ(m_bridge->GetProviderName(), L"Depot");
    EXPECT_EQ(m_bridge->GetDllPath(), LibraryPath(L"recording_full"));
    EXPECT_FALSE(m_bridge->IsInitialized());
    EXPECT_FALSE(m_bridge->IsProjectOpen());
    EXPECT_THAT(AllCalls(), IsEmpty());
}

TEST_F(BridgeLoading, AtOnceReportsWhetherTheLibraryLoaded)
{
    OrvixMSSCC bridge;
    EXPECT_TRUE(bridge.SetProvider(LibraryPath(L"recording_full").c_str(), nullptr, L"Depot", true));
    EXPECT_THAT(AllCalls(), ElementsAre("load recording_full", "SccGetVersion()"));
    EXPECT_EQ(bridge.BeginBatch(), SCC_OK);
    EXPECT_THAT(AllCalls(), ElementsAre("SccBeginBatch()"));

    EXPECT_FALSE(OrvixMSSCC().SetProvider(LibraryPath(L"missing").c_str(), nullptr, L"Depot", true));
    EXPECT_TRUE(OrvixMSSCC().SetProvider(LibraryPath(L"missing").c_str(), nullptr, L"Depot", false));
}

TEST_F(BridgeLoading, AtOnceFailsWithoutSccGetVersionAndKeepsTheLibrary)
{
    OrvixMSSCC bridge;
    EXPECT_FALSE(bridge.SetProvider(LibraryPath(L"recording_without_SccGetVersion").c_str(), nullptr, L"Depot", true));
    EXPECT_THAT(AllCalls(), ElementsAre("load recording_without_SccGetVersion"));
    EXPECT_EQ(bridge.Initialize("host"), SCC_OK);
    EXPECT_THAT(AllCalls(), ElementsAre("SccInitialize(0x0, 0x0, \"host\", \"Depot\", \"\")"));
}

TEST_F(BridgeLoading, FailsOnlyTheFirstOperationWithoutSccGetVersion)
{
    NewBridge(L"recording_without_SccGetVersion");
    EXPECT_EQ(m_bridge->Initialize("host"), SCC_E_INITIALIZEFAILED);
    EXPECT_FALSE(m_bridge->IsInitialized());
    EXPECT_THAT(AllCalls(), ElementsAre("load recording_without_SccGetVersion"));
    EXPECT_EQ(m_bridge->Initialize("host"), SCC_OK);
    EXPECT_EQ(m_bridge->GetVersion(), 0);
    EXPECT_THAT(AllCalls(), ElementsAre("SccInitialize(0x0, 0x1234, \"host\", \"Depot\", \"\")"));
}

TEST_F(BridgeLoading, IsTriedAgainByALaterCall)
{
    const std::filesystem::path path = m_folder.Path() / L"late.dll";
    m_bridge = std::make_unique<OrvixMSSCC>();
    m_bridge->SetProvider(path.c_str(), nullptr, L"Depot", false);
    for (const Operation& operation : Operations)
    {
        const bool isVersion = operation.function == "SccGetVersion";
        const bool isSilent = operation.function == "SccAddFromScc" || operation.function == "SccCloseProject";
        if (!isSilent)
        {
            EXPECT_EQ(operation.run(*m_bridge), isVersion ? 0 : SCC_E_INITIALIZEFAILED) << operation.function;
        }
    }
    WriteBytes(path, "no library");
    EXPECT_EQ(m_bridge->Initialize("host"), SCC_E_INITIALIZEFAILED);
    std::filesystem::remove(path);
    Copy(L"recording_full", path);
    EXPECT_EQ(m_bridge->Initialize("host"), SCC_OK);
    EXPECT_THAT(AllCalls(),
                ElementsAre("load late", "SccGetVersion()", "SccInitialize(0x0, 0x0, \"host\", \"Depot\", \"\")"));
}

TEST_F(BridgeLoading, FindsWhatTheLibraryNeedsInTheSearchFolder)
{
    NewBridge(L"recording_dependent", NeededFolder.c_str());
    EXPECT_EQ(m_bridge->Initialize("host"), SCC_OK);
    NewBridge(L"recording_dependent");
    EXPECT_EQ(m_bridge->Initialize("host"), SCC_E_INITIALIZEFAILED);
    NewBridge(L"recording_dependent", L"");
    EXPECT_EQ(m_bridge->Initialize("host"), SCC_E_INITIALIZEFAILED);
}

TEST_F(BridgeLoading, KeepsTheSearchFolderWhenSetProviderHasNone)
{
    NewBridge(L"recording_dependent", NeededFolder.c_str());
    EXPECT_TRUE(m_bridge->SetProvider(LibraryPath(L"recording_dependent").c_str(), nullptr, L"Depot", true));
}

TEST_F(BridgeDllDirectory, IsTheSearchFolderDuringTheLoadAndIsRestored)
{
    const ProcessDllDirectory process(L"C:\\some folder");
    NewBridge(L"recording_full", NeededFolder.c_str());
    Start();
    EXPECT_EQ(m_recorder.dllDirectoryAtLoad, NeededFolder);
    EXPECT_EQ(ProcessDllDirectory::Current(), L"C:\\some folder");
}

TEST_F(BridgeDllDirectory, OfTheProcessStaysWithoutASearchFolder)
{
    const ProcessDllDirectory process(L"C:\\some folder");
    Start();
    EXPECT_EQ(m_recorder.dllDirectoryAtLoad, L"C:\\some folder");
    EXPECT_EQ(ProcessDllDirectory::Current(), L"C:\\some folder");
}

TEST_F(BridgeDllDirectory, IsNotTouchedWithoutASearchFolder)
{
    const GivenDllDirectories given;
    Start();
    EXPECT_TRUE(GivenDllDirectories::Folders().empty()) << "a host may have set an empty one, which cannot be read";
}

TEST_F(BridgeDllDirectory, ThatWasNotSetIsNotSetAfterwards)
{
    NewBridge(L"recording_full", NeededFolder.c_str());
    const GivenDllDirectories given;
    Start();
    EXPECT_EQ(m_recorder.dllDirectoryAtLoad, NeededFolder);
    EXPECT_EQ(ProcessDllDirectory::Current(), L"");
    // An empty text would take the current folder out of the search.
    EXPECT_THAT(GivenDllDirectories::Folders(), ElementsAre(NeededFolder, L"none"));
}

TEST_F(BridgeDllDirectory, IsRestoredWhenTheLoadFails)
{
    NewBridge(L"missing", NeededFolder.c_str());
    EXPECT_EQ(m_bridge->BeginBatch(), SCC_E_INITIALIZEFAILED);
    EXPECT_EQ(ProcessDllDirectory::Current(), L"");

    const ProcessDllDirectory process(L"C:\\some folder");
    EXPECT_EQ(m_bridge->BeginBatch(), SCC_E_INITIALIZEFAILED);
    EXPECT_EQ(ProcessDllDirectory::Current(), L"C:\\some folder");
}

TEST_F(BridgeFunctions, ThatIsMissingFailsItsOwnOperationAlone)
{
    for (const Operation& missing : Operations)
    {
        SCOPED_TRACE("without " + missing.function);
        NewBridge(L"recording_without_" + std::wstring(missing.function.begin(), missing.function.end()));
        AllowEverything();
        m_bridge->EndBatch(); // loads the library, which fails the first operation without SccGetVersion
        AllCalls();
        for (const Operation& operation : Operations)
        {
            SCOPED_TRACE(operation.function);
            const auto is = [&](const char* one, const char* other) {
                return missing.function == one && operation.function == other;
            };
            SCCRTN expected = operation.result;
            if (operation.function == missing.function)
            {
                expected = operation.function == "SccGetVersion" ? 0 : SCC_E_INITIALIZEFAILED;
            }
            else if (is("SccInitialize", "SccAddFromScc") || is("SccSetOption", "SccAddFromScc"))
            {
                expected = SCC_E_OPNOTSUPPORTED; // no capability, no answer to the option
            }
            else if (is("SccOpenProject", "SccCloseProject"))
            {
                expected = SCC_E_PROJNOTOPEN;
            }
            EXPECT_EQ(operation.run(*m_bridge), expected);
            const std::vector<std::string> calls = Calls();
            if (operation.function == missing.function)
            {
                EXPECT_THAT(calls, IsEmpty());
            }
            else if (expected == operation.result)
            {
                EXPECT_TRUE(!calls.empty() && calls.back().starts_with(operation.function + "("));
            }
        }
    }
}

TEST_F(BridgeFunctions, ThatIsMissingLeavesTheStateAsItWas)
{
    NewBridge(L"recording_without_SccCloseProject");
    StartAndOpen();
    EXPECT_EQ(m_bridge->CloseProject(), SCC_E_INITIALIZEFAILED);
    EXPECT_TRUE(m_bridge->IsProjectOpen());

    NewBridge(L"recording_without_SccUninitialize");
    StartAndOpen();
    EXPECT_EQ(m_bridge->Uninitialize(), SCC_E_INITIALIZEFAILED);
    EXPECT_TRUE(m_bridge->IsInitialized());
    EXPECT_TRUE(m_bridge->IsProjectOpen());
    EXPECT_THAT(Calls(), IsEmpty());
}

TEST_F(BridgeFunctions, ThatIsMissingIsLookedForAgainByEachCall)
{
    NewBridge(L"recording_without_SccBeginBatch");
    const AskedNames asked;
    for (long call = 1; call <= 3; ++call)
    {
        EXPECT_EQ(m_bridge->BeginBatch(), SCC_E_INITIALIZEFAILED);
        EXPECT_EQ(AskedNames::Count("SccBeginBatch"), call);
    }
}

TEST_F(BridgeFunctions, ThatIsFoundIsLookedForOnceForGood)
{
    AllowEverything();
    const AskedNames asked;
    for (int round = 0; round < 2; ++round)
    {
        for (const Operation& operation : Operations)
        {
            EXPECT_EQ(operation.run(*m_bridge), operation.result) << operation.function;
        }
    }
    for (const Operation& operation : Operations)
    {
        EXPECT_EQ(AskedNames::Count(operation.function), 1) << operation.function;
    }
}

TEST_F(BridgeFunctions, ThatThrowsFailsItsOperationAndLetsNothingOut)
{
    for (const Operation& throwing : Operations)
    {
        SCOPED_TRACE(throwing.function);
        NewBridge(L"recording_full");
        AllowEverything();
        for (const Operation& operation : Operations)
        {
            if (operation.function == throwing.function)
            {
                break;
            }
            EXPECT_EQ(operation.run(*m_bridge), operation.result) << operation.function;
        }
        m_recorder.throwing = {throwing.function};
        EXPECT_EQ(throwing.run(*m_bridge), throwing.function == "SccGetVersion"          ? 0
                                           : throwing.function == "SccGetCommandOptions" ? SCC_E_OPNOTSUPPORTED
                                                                                         : SCC_E_INITIALIZEFAILED);
        m_recorder.throwing.clear();
        EXPECT_EQ(m_bridge->BeginBatch(), SCC_OK);
    }
}

} // namespace
