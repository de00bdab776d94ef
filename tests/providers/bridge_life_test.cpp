// Starting and ending the library, and the end of the bridge.

#include "Bridge.h"
#include "VTable.h"

#include <cstring>

using testing::ElementsAre;
using testing::IsEmpty;

namespace
{

using BridgeInitialize = Bridge;
using BridgeUninitialize = Bridge;
using BridgeDestruction = Bridge;

TEST_F(BridgeInitialize, OfAStartedLibraryCallsNothing)
{
    Start();
    EXPECT_EQ(m_bridge->Initialize("another host"), SCC_OK);
    EXPECT_THAT(Calls(), IsEmpty());
}

TEST_F(BridgeInitialize, PassesTheHostsOwnName)
{
    const std::string name(400, 'h');
    LPCSTR given = nullptr;
    m_recorder.initialize = [&](LPVOID*, HWND, LPCSTR caller, LPSTR, LPLONG, LPSTR, LPLONG, LPLONG) {
        given = caller;
        return SCC_OK;
    };
    EXPECT_EQ(m_bridge->Initialize(name.c_str()), SCC_OK);
    EXPECT_EQ(given, name.c_str());
    EXPECT_EQ(m_bridge->Uninitialize(), SCC_OK);
    EXPECT_EQ(m_bridge->Initialize(nullptr), SCC_OK);
    EXPECT_EQ(given, nullptr);
}

TEST_F(BridgeInitialize, CutsTheProviderNameTo31Bytes)
{
    for (const std::size_t length : {31u, 32u, 500u})
    {
        m_bridge = std::make_unique<OrvixMSSCC>();
        const std::wstring name(length, L'n');
        m_bridge->SetProvider(LibraryPath(L"recording_full").c_str(), nullptr, name.c_str(), false);
        EXPECT_EQ(m_bridge->GetProviderName(), name);
        Calls();
        EXPECT_EQ(m_bridge->Initialize("host"), SCC_OK);
        EXPECT_THAT(Calls(), ElementsAre("SccGetVersion()",
                                         "SccInitialize(0x0, 0x0, \"host\", \"" + std::string(31, 'n') + "\", \"\")"));
    }
}

TEST_F(BridgeInitialize, KeepsTheNameAndTheAuxiliaryPathLabelOfTheLibrary)
{
    m_recorder.initialize = [](LPVOID*, HWND, LPCSTR, LPSTR sccName, LPLONG, LPSTR label, LPLONG checkoutLength,
                               LPLONG length) {
        EXPECT_STREQ(label, "");
        std::strcpy(sccName, "Own name");
        std::strcpy(label, "Server:");
        *checkoutLength = 100;
        *length = 200;
        return SCC_OK;
    };
    EXPECT_EQ(m_bridge->Initialize("host"), SCC_OK);
    Calls();
    EXPECT_EQ(Open(), SCC_OK);
    EXPECT_EQ(m_bridge->Uninitialize(), SCC_OK);
    EXPECT_EQ(m_bridge->Initialize("host"), SCC_OK);
    EXPECT_THAT(Calls(), ElementsAre("SccOpenProject(0x0, 0x1234, \"\", \"\", \"" + Project() +
                                         "\", \"Server:\", \"comment\", 0x1)",
                                     "SccCloseProject(0x0)", "SccUninitialize(0x0)",
                                     "SccInitialize(0x0, 0x1234, \"host\", \"Own name\", \"\")"));
    EXPECT_STREQ(m_bridge->GetProviderName(), L"Depot");
}

TEST_F(BridgeInitialize, ThatFailsLeavesTheBridgeWithoutContextCapabilitiesAndNewTexts)
{
    m_recorder.initialize = [](LPVOID* context, HWND, LPCSTR, LPSTR sccName, LPLONG capabilities, LPSTR label, LPLONG,
                               LPLONG) {
        *context = reinterpret_cast<LPVOID>(0x99);
        *capabilities = SCC_CAP_ADDFROMSCC;
        std::strcpy(sccName, "Own name");
        std::strcpy(label, "Server:");
        return SCC_E_NONSPECIFICERROR;
    };
    for (int attempt = 0; attempt < 2; ++attempt)
    {
        EXPECT_EQ(m_bridge->Initialize("host"), SCC_E_NONSPECIFICERROR);
        EXPECT_FALSE(m_bridge->IsInitialized());
        const std::vector<std::string> calls = Calls();
        ASSERT_FALSE(calls.empty());
        EXPECT_EQ(calls.back(), "SccInitialize(0x0, 0x1234, \"host\", \"Depot\", \"\")");
    }
    EXPECT_EQ(m_bridge->Properties("C:\\a"), SCC_OK);
    EXPECT_EQ(m_bridge->AddFromScc(nullptr, nullptr), SCC_E_OPNOTSUPPORTED);
    EXPECT_THAT(Calls(), ElementsAre("SccProperties(0x0, 0x1234, \"C:\\a\")"));
}

TEST_F(BridgeInitialize, WithAPositiveResultHasNotStartedTheLibrary)
{
    m_recorder.results["SccInitialize"] = SCC_I_OPERATIONCANCELED;
    EXPECT_EQ(m_bridge->Initialize("host"), SCC_I_OPERATIONCANCELED);
    EXPECT_FALSE(m_bridge->IsInitialized());
}

TEST_F(BridgeUninitialize, EndsALibraryThatWasNeverStarted)
{
    m_recorder.results["SccUninitialize"] = SCC_E_OPNOTPERFORMED;
    EXPECT_EQ(m_bridge->Uninitialize(), SCC_E_OPNOTPERFORMED);
    EXPECT_EQ(m_bridge->Uninitialize(), SCC_E_OPNOTPERFORMED);
    EXPECT_THAT(AllCalls(),
                ElementsAre("load recording_full", "SccGetVersion()", "SccUninitialize(0x0)", "SccUninitialize(0x0)"));
}

TEST_F(BridgeUninitialize, ClosesAnOpenProjectWhateverTheResult)
{
    StartAndOpen();
    m_recorder.results["SccCloseProject"] = SCC_E_NONSPECIFICERROR;
    EXPECT_EQ(m_bridge->Uninitialize(), SCC_OK);
    EXPECT_FALSE(m_bridge->IsProjectOpen());
    EXPECT_FALSE(m_bridge->IsInitialized());
    EXPECT_THAT(Calls(), ElementsAre("SccCloseProject(0x77)", "SccUninitialize(0x77)"));
}

TEST_F(BridgeUninitialize, HasClosedTheProjectEvenWhenTheLibraryCannotCloseOne)
{
    NewBridge(L"recording_without_SccCloseProject");
    StartAndOpen();
    EXPECT_EQ(m_bridge->Uninitialize(), SCC_OK);
    EXPECT_FALSE(m_bridge->IsProjectOpen());
    EXPECT_THAT(Calls(), ElementsAre("SccUninitialize(0x77)"));
}

TEST_F(BridgeUninitialize, ReturnsTheLibrarysResultAndDropsTheContextAllTheSame)
{
    Start();
    m_recorder.results["SccUninitialize"] = SCC_E_NONSPECIFICERROR;
    EXPECT_EQ(m_bridge->Uninitialize(), SCC_E_NONSPECIFICERROR);
    EXPECT_FALSE(m_bridge->IsInitialized());
    EXPECT_EQ(m_bridge->Properties("C:\\a"), SCC_OK);
    EXPECT_THAT(Calls(), ElementsAre("SccUninitialize(0x77)", "SccProperties(0x0, 0x1234, \"C:\\a\")"));
}

TEST_F(BridgeUninitialize, DropsTheContextOfALibraryThatThrows)
{
    StartAndOpen();
    m_recorder.throwing = {"SccCloseProject", "SccUninitialize"};
    EXPECT_EQ(m_bridge->Uninitialize(), SCC_E_INITIALIZEFAILED);
    EXPECT_FALSE(m_bridge->IsInitialized());
    EXPECT_EQ(m_bridge->Properties("C:\\a"), SCC_OK);
    EXPECT_THAT(Calls(),
                ElementsAre("SccCloseProject(0x77)", "SccUninitialize(0x77)", "SccProperties(0x0, 0x1234, \"C:\\a\")"));
}

TEST_F(BridgeUninitialize, ForgetsTheTextsOfTheProject)
{
    Start();
    m_recorder.getProjPath = [](LPVOID, HWND, LPSTR user, LPSTR projectName, LPSTR localPath, LPSTR auxPath, BOOL,
                                LPBOOL) {
        std::strcpy(user, "ada");
        std::strcpy(projectName, "$/song");
        std::strcpy(localPath, "C:\\song");
        std::strcpy(auxPath, "server");
        return SCC_OK;
    };
    EXPECT_EQ(m_bridge->GetProjPath(nullptr, nullptr, nullptr, nullptr, TRUE), SCC_OK);
    EXPECT_EQ(m_bridge->Uninitialize(), SCC_OK);
    Start();
    m_recorder.getProjPath = nullptr;
    EXPECT_EQ(m_bridge->GetProjPath(nullptr, nullptr, nullptr, nullptr, TRUE), SCC_OK);
    EXPECT_THAT(Calls(), ElementsAre(GetProjPathCall("", "", "", "")));
}

TEST_F(BridgeUninitialize, MayBeFollowedByAStartBeforeTheLibraryReturns)
{
    Start();
    m_recorder.uninitialize = [this](LPVOID) { return m_bridge->Initialize("host"); };
    EXPECT_EQ(m_bridge->Uninitialize(), SCC_OK);
    m_recorder.uninitialize = nullptr;
    EXPECT_TRUE(m_bridge->IsInitialized());
    EXPECT_EQ(m_bridge->Properties("C:\\a"), SCC_OK);
    EXPECT_THAT(Calls(), ElementsAre("SccUninitialize(0x77)", "SccInitialize(0x0, 0x1234, \"host\", \"Depot\", \"\")",
                                     "SccProperties(0x77, 0x1234, \"C:\\a\")"));
}

TEST_F(BridgeUninitialize, KeepsTheLibraryLoaded)
{
    Start();
    EXPECT_EQ(m_bridge->Uninitialize(), SCC_OK);
    EXPECT_EQ(m_bridge->Initialize("host"), SCC_OK);
    EXPECT_TRUE(m_bridge->IsInitialized());
    EXPECT_THAT(AllCalls(),
                ElementsAre("SccUninitialize(0x77)", "SccInitialize(0x0, 0x1234, \"host\", \"Depot\", \"\")"));
}

TEST_F(BridgeDestruction, ClosesTheProjectEndsAndFreesTheLibrary)
{
    StartAndOpen();
    IOrvixMSSCC* const bridge = m_bridge.release();
    DeleteThroughTable(bridge);
    EXPECT_THAT(AllCalls(), ElementsAre("SccCloseProject(0x77)", "SccUninitialize(0x77)", "unload recording_full"));
}

TEST_F(BridgeDestruction, OfAStartedBridgeWithoutProjectClosesNone)
{
    Start();
    m_bridge.reset();
    EXPECT_THAT(AllCalls(), ElementsAre("SccUninitialize(0x77)", "unload recording_full"));
}

TEST_F(BridgeDestruction, OnlyFreesALibraryThatWasNotStarted)
{
    EXPECT_EQ(m_bridge->BeginBatch(), SCC_OK);
    AllCalls();
    m_bridge.reset();
    EXPECT_THAT(AllCalls(), ElementsAre("unload recording_full"));
}

TEST_F(BridgeDestruction, OnlyFreesALibraryThatWasEnded)
{
    Start();
    EXPECT_EQ(m_bridge->Uninitialize(), SCC_OK);
    AllCalls();
    m_bridge.reset();
    EXPECT_THAT(AllCalls(), ElementsAre("unload recording_full"));
}

TEST_F(BridgeDestruction, OfABridgeThatLoadedNothingCallsNothing)
{
    m_bridge.reset();
    EXPECT_THAT(AllCalls(), IsEmpty());
}

TEST_F(BridgeDestruction, LeavesTheProjectOpenInALibraryThatCannotBeEnded)
{
    NewBridge(L"recording_without_SccUninitialize");
    StartAndOpen();
    m_bridge.reset();
    EXPECT_THAT(AllCalls(), ElementsAre("unload recording_without_SccUninitialize"));
}

TEST_F(BridgeDestruction, LetsNoExceptionOut)
{
    StartAndOpen();
    m_recorder.throwing = {"SccCloseProject", "SccUninitialize"};
    m_bridge.reset();
    EXPECT_THAT(AllCalls(), ElementsAre("SccCloseProject(0x77)", "SccUninitialize(0x77)", "unload recording_full"));
}

} // namespace
