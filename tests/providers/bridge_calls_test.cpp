// The operations that pass their arguments on, called by their slots as a client built by another compiler does.

#include "Bridge.h"
#include "VTable.h"

using testing::ElementsAre;
using testing::IsEmpty;

namespace
{

/// The slots after the destructor.
enum Slot : std::size_t
{
    GetProviderName,
    GetDllPath,
    IsInitialized,
    IsProjectOpen,
    GetVersion,
    Initialize,
    Uninitialize,
    OpenProject,
    CloseProject,
    GetProjPath,
    Get,
    Checkout,
    Uncheckout,
    Checkin,
    Add,
    Reserved1,
    BeginBatch,
    EndBatch,
    Reserved2,
    Reserved3,
    Reserved4,
    History,
    Properties,
    QueryInfo,
    Reserved5,
    PopulateList,
    Reserved6,
    RunScc,
    GetCommandOptions,
    AddFromScc,
    SetOption,
    Reserved7,
    Reserved8,
    Reserved9,
    Reserved10
};

constexpr const char* NoText = nullptr;
LPCSTR* const NoNames = nullptr;
const LPVOID Block = reinterpret_cast<LPVOID>(0x5500000055);
const LPVOID NoBlock = nullptr;

class BridgeCalls : public Bridge
{
protected:
    template <typename Result = SCCRTN, typename... Arguments>
    Result Call(Slot slot, Arguments... arguments)
    {
        IOrvixMSSCC* const bridge = m_bridge.get();
        return CallSlot<Result>(bridge, DestructorSlots + slot, arguments...);
    }

    /// The operation makes this one call, and returns the result of the function.
    template <typename... Arguments>
    void ExpectCall(const std::string& call, Slot slot, Arguments... arguments)
    {
        SCOPED_TRACE(call);
        for (const SCCRTN result : {SCC_OK, SCC_E_NONSPECIFICERROR, SCC_I_OPERATIONCANCELED})
        {
            m_recorder.results[call.substr(0, call.find('('))] = result;
            EXPECT_EQ(Call(slot, arguments...), result);
            EXPECT_THAT(Calls(), ElementsAre(call));
        }
    }

    LPCSTR m_names[2] = {"C:\\p\\one.txt", "C:\\p\\two.txt"};
};

using BridgeCommandOptions = BridgeCalls;
using BridgeAddFromScc = BridgeCalls;

TEST_F(BridgeCalls, ReportTheNamesAndTheState)
{
    EXPECT_STREQ(Call<const wchar_t*>(GetProviderName), L"Depot");
    EXPECT_EQ(Call<const wchar_t*>(GetDllPath), LibraryPath(L"recording_full"));
    EXPECT_FALSE(Call<bool>(IsInitialized));
    EXPECT_FALSE(Call<bool>(IsProjectOpen));
    EXPECT_EQ(Call(Initialize, "host"), SCC_OK);
    EXPECT_TRUE(Call<bool>(IsInitialized));
    EXPECT_FALSE(Call<bool>(IsProjectOpen));
    const std::string project = Project();
    EXPECT_EQ(Call(OpenProject, project.c_str(), "comment", LPTEXTOUTPROC{}), SCC_OK);
    EXPECT_TRUE(Call<bool>(IsProjectOpen));
    EXPECT_EQ(Call(CloseProject), SCC_OK);
    EXPECT_FALSE(Call<bool>(IsProjectOpen));
    EXPECT_EQ(Call(Uninitialize), SCC_OK);
    EXPECT_FALSE(Call<bool>(IsInitialized));
    EXPECT_THAT(Calls(), ElementsAre("SccGetVersion()", "SccInitialize(0x0, 0x1234, \"host\", \"Depot\", \"\")",
                                     OpenCall("", "", ""), "SccCloseProject(0x77)", "SccUninitialize(0x77)"));
}

TEST_F(BridgeCalls, AskForTheVersion)
{
    m_recorder.results["SccGetVersion"] = 0x10001;
    Start();
    EXPECT_EQ(Call<LONG>(GetVersion), 0x10001);
    EXPECT_THAT(Calls(), ElementsAre("SccGetVersion()"));
}

TEST_F(BridgeCalls, PassEveryArgumentOn)
{
    Start();
    ExpectCall("SccGet(0x77, 0x1234, 0x2, [\"C:\\p\\one.txt\", \"C:\\p\\two.txt\"], 0x3, 0x5500000055)", Get, 2L,
               m_names, 0x3L, Block);
    ExpectCall("SccCheckout(0x77, 0x1234, 0x1, [\"C:\\p\\one.txt\"], \"a comment\", 0x80000001, 0x5500000055)",
               Checkout, 1L, m_names, "a comment", static_cast<LONG>(0x80000001), Block);
    ExpectCall("SccUncheckout(0x77, 0x1234, 0x2, [\"C:\\p\\one.txt\", \"C:\\p\\two.txt\"], 0x4, 0x5500000055)",
               Uncheckout, 2L, m_names, 0x4L, Block);
    ExpectCall("SccCheckin(0x77, 0x1234, 0x2, [\"C:\\p\\one.txt\", \"C:\\p\\two.txt\"], \"louder\", 0x1000, "
               "0x5500000055)",
               Checkin, 2L, m_names, "louder", SCC_KEEP_CHECKEDOUT, Block);
    LONG perFile[] = {0x1000, -1};
    ExpectCall("SccAdd(0x77, 0x1234, 0x2, [\"C:\\p\\one.txt\", \"C:\\p\\two.txt\"], \"new\", [0x1000, 0xffffffff], "
               "0x5500000055)",
               Add, 2L, m_names, "new", static_cast<LONG*>(perFile), Block);
    ExpectCall("SccBeginBatch()", BeginBatch);
    ExpectCall("SccEndBatch()", EndBatch);
    ExpectCall("SccHistory(0x77, 0x1234, 0x1, [\"C:\\p\\one.txt\"], 0x5, 0x5500000055)", History, 1L, m_names, 0x5L,
               Block);
    ExpectCall("SccProperties(0x77, 0x1234, \"C:\\p\\one.txt\")", Properties, m_names[0]);
    ExpectCall("SccRunScc(0x77, 0x1234, 0x2, [\"C:\\p\\one.txt\", \"C:\\p\\two.txt\"])", RunScc, 2L, m_names);
    ExpectCall("SccSetOption(0x77, 0x5, 0xfffffffe)", SetOption, 5L, -2L);
}

TEST_F(BridgeCalls, PassNullOn)
{
    Start();
    ExpectCall("SccGet(0x77, 0x1234, 0x0, null, 0x0, 0x0)", Get, 0L, NoNames, 0L, NoBlock);
    ExpectCall("SccCheckout(0x77, 0x1234, 0x0, null, null, 0x0, 0x0)", Checkout, 0L, NoNames, NoText, 0L, NoBlock);
    ExpectCall("SccUncheckout(0x77, 0x1234, 0x0, null, 0x0, 0x0)", Uncheckout, 0L, NoNames, 0L, NoBlock);
    ExpectCall("SccCheckin(0x77, 0x1234, 0x0, null, null, 0x0, 0x0)", Checkin, 0L, NoNames, NoText, 0L, NoBlock);
    ExpectCall("SccAdd(0x77, 0x1234, 0x0, null, null, [], 0x0)", Add, 0L, NoNames, NoText, static_cast<LONG*>(nullptr),
               NoBlock);
    ExpectCall("SccHistory(0x77, 0x1234, 0x0, null, 0x0, 0x0)", History, 0L, NoNames, 0L, NoBlock);
    ExpectCall("SccProperties(0x77, 0x1234, null)", Properties, NoText);
    ExpectCall("SccRunScc(0x77, 0x1234, 0x0, null)", RunScc, 0L, NoNames);
}

TEST_F(BridgeCalls, PassNullForContextAndWindowBeforeTheyAreKnown)
{
    m_bridge->SetParentWindow(nullptr);
    EXPECT_EQ(Call(RunScc, 1L, m_names), SCC_OK);
    EXPECT_THAT(Calls(), ElementsAre("SccGetVersion()", "SccRunScc(0x0, 0x0, 0x1, [\"C:\\p\\one.txt\"])"));
}

TEST_F(BridgeCalls, LetQueryInfoFillTheStatusWords)
{
    Start();
    LPCSTR* given = nullptr;
    m_recorder.queryInfo = [&](LPVOID, LONG, LPCSTR* names, LPLONG status) {
        given = names;
        status[0] = SCC_STATUS_CONTROLLED;
        status[1] = SCC_STATUS_INVALID;
        return SCC_I_FILEDIFFERS;
    };
    LONG status[] = {7, 8};
    EXPECT_EQ(Call(QueryInfo, 2L, m_names, static_cast<LPLONG>(status)), SCC_I_FILEDIFFERS);
    EXPECT_THAT(Calls(), ElementsAre("SccQueryInfo(0x77, 0x2, [\"C:\\p\\one.txt\", \"C:\\p\\two.txt\"], [0x7, 0x8])"));
    EXPECT_EQ(given, m_names);
    EXPECT_THAT(status, ElementsAre(SCC_STATUS_CONTROLLED, SCC_STATUS_INVALID));
}

TEST_F(BridgeCalls, PassTheHostsOwnOptionWordsToAdd)
{
    Start();
    LONG* given = nullptr;
    m_recorder.add = [&](LPVOID, HWND, LONG, LPCSTR*, LPCSTR, LONG* options, LPCMDOPTS) {
        given = options;
        return SCC_OK;
    };
    LONG perFile[] = {1};
    EXPECT_EQ(Call(Add, 1L, m_names, NoText, static_cast<LONG*>(perFile), NoBlock), SCC_OK);
    EXPECT_EQ(given, perFile);
}

TEST_F(BridgeCalls, LetPopulateListCallTheHostBack)
{
    Start();
    LONG status[] = {0};
    m_recorder.populateList = [&](LPVOID, SCCCOMMAND, LONG, LPCSTR*, POPLISTFUNC callback, LPVOID callerData,
                                  LPLONG words, LONG) {
        EXPECT_EQ(words, status);
        char name[] = "C:\\p\\three.txt";
        return callback(callerData, TRUE, SCC_STATUS_CONTROLLED, name) ? SCC_OK : SCC_I_OPERATIONCANCELED;
    };
    std::string found;
    const POPLISTFUNC callback = [](LPVOID callerData, BOOL add, LONG word, LPSTR name) -> BOOL {
        *static_cast<std::string*>(callerData) = name + std::to_string(add) + std::to_string(word);
        return FALSE;
    };
    EXPECT_EQ(Call(PopulateList, static_cast<SCCCOMMAND>(3), 1L, m_names, callback, static_cast<LPVOID>(&found),
                   static_cast<LPLONG>(status), 0x1L),
              SCC_I_OPERATIONCANCELED);
    EXPECT_EQ(found, "C:\\p\\three.txt11");
    const std::vector<std::string> calls = Calls();
    ASSERT_EQ(calls.size(), 1u);
    EXPECT_TRUE(calls[0].starts_with("SccPopulateList(0x77, 0x3, 0x1, [\"C:\\p\\one.txt\"], 0x"));
    EXPECT_TRUE(calls[0].ends_with(", 0x1)"));
}

TEST_F(BridgeCalls, OfReservedOperationsSucceedAndLoadNothing)
{
    for (const Slot slot : {Reserved1, Reserved2, Reserved3, Reserved4, Reserved5, Reserved6, Reserved7, Reserved8,
                            Reserved9, Reserved10})
    {
        EXPECT_EQ(Call(slot), SCC_OK) << slot;
    }
    EXPECT_THAT(AllCalls(), IsEmpty());
}

TEST_F(BridgeCommandOptions, AreAskedForUntilTheLibraryHasThem)
{
    Start();
    const std::string ask = "SccGetCommandOptions(0x77, 0x1234, 0xa, null)";
    const std::string show = "SccGetCommandOptions(0x77, 0x1234, 0xa, block 0x0)";
    for (const SCCRTN refusal : {SCC_OK, SCC_E_OPNOTSUPPORTED, SCC_I_OPERATIONCANCELED})
    {
        m_recorder.results["SccGetCommandOptions"] = refusal;
        EXPECT_EQ(Call(GetCommandOptions), SCC_E_OPNOTSUPPORTED);
        EXPECT_THAT(Calls(), ElementsAre(ask));
    }
    m_recorder.results["SccGetCommandOptions"] = SCC_I_ADV_SUPPORT;
    EXPECT_EQ(Call(GetCommandOptions), SCC_I_ADV_SUPPORT);
    EXPECT_THAT(Calls(), ElementsAre(ask, show));
    m_recorder.results["SccGetCommandOptions"] = SCC_E_OPNOTPERFORMED;
    EXPECT_EQ(Call(GetCommandOptions), SCC_E_OPNOTPERFORMED);
    EXPECT_THAT(Calls(), ElementsAre(show));
}

TEST_F(BridgeCommandOptions, AreTheLibrarysBlockUntilItIsEnded)
{
    m_recorder.getCommandOptions = [](LPVOID, HWND, SCCCOMMAND, LPCMDOPTS* block) {
        if (block == nullptr)
        {
            return SCC_I_ADV_SUPPORT;
        }
        if (*block == nullptr)
        {
            *block = Block;
        }
        return SCC_OK;
    };
    Start();
    EXPECT_EQ(Call(GetCommandOptions), SCC_OK);
    EXPECT_EQ(Call(GetCommandOptions), SCC_OK);
    EXPECT_EQ(Call(Uninitialize), SCC_OK);
    EXPECT_EQ(Call(GetCommandOptions), SCC_OK);
    EXPECT_THAT(Calls(), ElementsAre("SccGetCommandOptions(0x77, 0x1234, 0xa, null)",
                                     "SccGetCommandOptions(0x77, 0x1234, 0xa, block 0x0)",
                                     "SccGetCommandOptions(0x77, 0x1234, 0xa, block 0x5500000055)",
                                     "SccUninitialize(0x77)", "SccGetCommandOptions(0x0, 0x1234, 0xa, null)",
                                     "SccGetCommandOptions(0x0, 0x1234, 0xa, block 0x0)"));
}

TEST_F(BridgeAddFromScc, IsRefusedWithoutTheCapability)
{
    m_capabilities = ~SCC_CAP_ADDFROMSCC;
    m_recorder.results["SccSetOption"] = SCC_I_SHARESUBPROJOK;
    Start();
    LONG count = 0;
    EXPECT_EQ(Call(AddFromScc, &count, static_cast<LPCSTR**>(nullptr)), SCC_E_OPNOTSUPPORTED);
    EXPECT_THAT(Calls(), IsEmpty());
}

TEST_F(BridgeAddFromScc, IsRefusedWhenTheHostMayNotSetTheFolder)
{
    m_capabilities = SCC_CAP_ADDFROMSCC;
    Start();
    LONG count = 0;
    for (const SCCRTN answer : {SCC_OK, SCC_I_FILEDIFFERS, SCC_E_OPNOTSUPPORTED})
    {
        m_recorder.results["SccSetOption"] = answer;
        EXPECT_EQ(Call(AddFromScc, &count, static_cast<LPCSTR**>(nullptr)), SCC_E_OPNOTSUPPORTED);
        EXPECT_THAT(Calls(), ElementsAre("SccSetOption(0x77, 0x6, 0x1)"));
    }
}

TEST_F(BridgeAddFromScc, LetsTheLibraryFillTheHostsVariables)
{
    m_capabilities = SCC_CAP_ADDFROMSCC;
    m_recorder.results["SccSetOption"] = SCC_I_SHARESUBPROJOK;
    m_recorder.addFromScc = [this](LPVOID context, HWND window, LPLONG count, LPCSTR** names) {
        EXPECT_EQ(context, reinterpret_cast<LPVOID>(0x77));
        EXPECT_EQ(window, reinterpret_cast<HWND>(0x1234));
        if (count == nullptr)
        {
            return SCC_I_OPERATIONCANCELED; // the names are freed
        }
        EXPECT_EQ(*count, 1);
        *count = 2;
        *names = m_names;
        return SCC_I_RELOADFILE;
    };
    Start();
    LONG count = 1;
    LPCSTR* names = nullptr;
    EXPECT_EQ(Call(AddFromScc, &count, &names), SCC_I_RELOADFILE);
    EXPECT_EQ(count, 2);
    EXPECT_EQ(names, m_names);
    EXPECT_EQ(Call(AddFromScc, static_cast<LPLONG>(nullptr), &names), SCC_I_OPERATIONCANCELED);
    const std::vector<std::string> calls = Calls();
    ASSERT_EQ(calls.size(), 4u);
    EXPECT_EQ(calls[0], "SccSetOption(0x77, 0x6, 0x1)");
    EXPECT_TRUE(calls[1].starts_with("SccAddFromScc("));
}

TEST_F(BridgeAddFromScc, IsRefusedAgainAfterTheLibraryIsEnded)
{
    m_capabilities = SCC_CAP_ADDFROMSCC;
    m_recorder.results["SccSetOption"] = SCC_I_SHARESUBPROJOK;
    Start();
    EXPECT_EQ(Call(Uninitialize), SCC_OK);
    Calls();
    EXPECT_EQ(Call(AddFromScc, static_cast<LPLONG>(nullptr), static_cast<LPCSTR**>(nullptr)), SCC_E_OPNOTSUPPORTED);
    EXPECT_THAT(Calls(), IsEmpty());
}

} // namespace
