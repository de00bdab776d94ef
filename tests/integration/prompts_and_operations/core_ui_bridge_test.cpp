#include "IOrvixCoreUIClientAccess.h"
#include "OperationTest.h"

#include <windows.h>

#include <vector>

namespace
{

class CoreUIBridge : public OperationTest
{
protected:
    /// The interface that the services object offers to the user-interface library.
    IOrvixCoreUIClientAccess& Access(IOrvixServices& services)
    {
        services.EditPrompts(nullptr, nullptr);
        return *m_script.accesses.back();
    }

    std::vector<void*> m_tokens = {Token(1), nullptr, Token(UINTPTR_MAX), Token(0x123456789ABCDEF0)};
};

TEST_F(CoreUIBridge, IsNeverObtainedNorReleasedByAnObjectThatShowsNoDialog)
{
    m_services->RegisterPrompt(DialogPrompt, L"text", Action::Yes, 0, true);
    bool dontAskAgain = false;
    EXPECT_EQ(m_services->ShowPrompt(nullptr, nullptr, nullptr, 0, DialogPrompt, &dontAskAgain), Answer::Yes);
    AddFile(L"a");
    m_params.SetDialogPromptID(DialogPrompt);
    EXPECT_EQ(Run(Operation::Notify | Operation::CheckIn), OperationResult::Done);
    m_services->Shutdown();
    m_services.reset();
    EXPECT_TRUE(m_script.obtained.empty());
    EXPECT_TRUE(m_script.released.empty());
}

TEST_F(CoreUIBridge, IsObtainedAndGivenItsClientAccessByTheFirstDialogOfEveryKind)
{
    AddFile(L"a");
    const std::vector<std::function<void(IOrvixServices&)>> dialogs = {
        [](IOrvixServices& services) {
            services.ShowPrompt(nullptr, nullptr, nullptr, 0, OrvixPromptID::None, nullptr);
        },
        [](IOrvixServices& services) { services.ShowFileListDialog(nullptr, nullptr); },
        [this](IOrvixServices& services) {
            services.RunFileListOperation(nullptr, &m_params, false, &m_provider, Operation::CheckIn,
                                          State::Controlled);
        },
        [](IOrvixServices& services) { services.EditPrompts(nullptr, nullptr); },
    };
    for (const auto& showFirst : dialogs)
    {
        m_script = {};
        bool accessCameFirst = false;
        const auto answer = [&](const auto&) {
            accessCameFirst = m_script.accesses.size() == 1;
            return 0; // no, cancelled or unchanged
        };
        m_script.onPrompt = answer;
        m_script.onFileList = answer;
        m_script.onEditor = answer;
        const OrvixServicesPointer services = MakeOrvixServices();
        showFirst(*services);
        EXPECT_TRUE(accessCameFirst);
        for (const auto& showLater : dialogs)
        {
            showLater(*services);
        }
        EXPECT_EQ(m_script.obtained.size(), 1U);
        ASSERT_EQ(m_script.accesses.size(), 1U);
        EXPECT_NE(m_script.accesses.front(), nullptr);
    }
}

TEST_F(CoreUIBridge, SurvivesShutdownAndIsReleasedByTheDestructor)
{
    m_services->EditPrompts(nullptr, nullptr);
    m_services->Shutdown();
    EXPECT_TRUE(m_script.released.empty());
    Initialize(&m_host);
    m_services->EditPrompts(nullptr, nullptr);
    EXPECT_EQ(m_script.obtained.size(), 1U);
    m_services.reset();
    EXPECT_EQ(m_script.released, m_script.obtained);
}

TEST_F(CoreUIBridge, IsReleasedByAnObjectThatWasNeverInitialised)
{
    OrvixServicesPointer services = MakeOrvixServices();
    services->EditPrompts(nullptr, nullptr);
    services.reset();
    EXPECT_EQ(m_script.obtained.size(), 1U);
    EXPECT_EQ(m_script.released, m_script.obtained);
}

TEST_F(CoreUIBridge, BelongsToOneServicesObject)
{
    OrvixServicesPointer other = MakeOrvixServices();
    Access(*m_services);
    Access(*other);
    ASSERT_EQ(m_script.obtained.size(), 2U);
    EXPECT_NE(m_script.accesses[0], m_script.accesses[1]);
    other.reset();
    EXPECT_EQ(m_script.released, std::vector<IOrvixCoreUI*>{m_script.obtained[1]});
}

TEST_F(CoreUIBridge, FallsBackToTheSystemBeforeInitialize)
{
    const OrvixServicesPointer services = MakeOrvixServices();
    IOrvixCoreUIClientAccess& access = Access(*services);
    for (const std::int32_t index : {COLOR_WINDOW, COLOR_WINDOWTEXT, COLOR_HIGHLIGHT, COLOR_BTNFACE})
    {
        EXPECT_EQ(access.GetColor(index), GetSysColor(index));
    }
    EXPECT_EQ(access.ClientRelayA(m_tokens[0], m_tokens[1], m_tokens[2], m_tokens[3]), 0);
    EXPECT_EQ(access.ClientRelayB(m_tokens[0], m_tokens[1], m_tokens[2], m_tokens[3]), 0);
}

TEST_F(CoreUIBridge, FallsBackToTheSystemWhenTheHostGaveNoClientAccess)
{
    Initialize(nullptr);
    IOrvixCoreUIClientAccess& access = Access(*m_services);
    EXPECT_EQ(access.GetColor(COLOR_WINDOW), GetSysColor(COLOR_WINDOW));
    EXPECT_EQ(access.ClientRelayA(nullptr, nullptr, nullptr, nullptr), 0);
    EXPECT_EQ(access.ClientRelayB(nullptr, nullptr, nullptr, nullptr), 0);
    EXPECT_TRUE(m_host.relays.empty());
}

TEST_F(CoreUIBridge, RelaysArgumentsAndResultsUnchanged)
{
    IOrvixCoreUIClientAccess& access = Access(*m_services);
    m_host.relayResult = INTPTR_MIN;
    EXPECT_EQ(access.ClientRelayA(m_tokens[0], m_tokens[1], m_tokens[2], m_tokens[3]), INTPTR_MIN);
    m_host.relayResult = INTPTR_MAX;
    EXPECT_EQ(access.ClientRelayB(m_tokens[3], m_tokens[2], m_tokens[1], m_tokens[0]), INTPTR_MAX);
    EXPECT_EQ(m_host.relays, (std::vector<RecordingHost::Relay>{
                                 {"A", m_tokens}, {"B", {m_tokens[3], m_tokens[2], m_tokens[1], m_tokens[0]}}}));
}

TEST_F(CoreUIBridge, AsksTheHostForColors)
{
    IOrvixCoreUIClientAccess& access = Access(*m_services);
    m_host.color = 0xFEDCBA98;
    EXPECT_EQ(access.GetColor(COLOR_WINDOW), 0xFEDCBA98);
    EXPECT_EQ(access.GetColor(-1), 0xFEDCBA98);
    EXPECT_EQ(m_host.colors, (std::vector<std::int32_t>{COLOR_WINDOW, -1}));
}

TEST_F(CoreUIBridge, UsesTheClientAccessOfTheLastInitialize)
{
    IOrvixCoreUIClientAccess& access = Access(*m_services);
    RecordingHost last;
    last.color = 2;
    Initialize(&last);
    EXPECT_EQ(access.GetColor(0), 2U);
    Initialize(nullptr);
    EXPECT_EQ(access.GetColor(0), GetSysColor(0));
}

TEST_F(CoreUIBridge, KeepsTheClientAccessAfterShutdown)
{
    IOrvixCoreUIClientAccess& access = Access(*m_services);
    m_services->Shutdown();
    m_host.color = 3;
    EXPECT_EQ(access.GetColor(0), 3U);
}

} // namespace
