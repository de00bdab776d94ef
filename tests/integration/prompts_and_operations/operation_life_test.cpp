// Hosts that end the services object from a call-back of an operation that still runs.

#include "OperationTest.h"

#include <functional>
#include <string>
#include <vector>

namespace
{

/// Each place of an operation and of the dialogs in which the host's, a provider's or a dialog's code runs.
class OperationLife : public OperationTest
{
protected:
    OperationLife()
    {
        AddFile(L"a");
        AddPrompt(DialogPrompt, Action::Ask);
    }

    /// Lets `act` run once, in the call whose line in the log begins so.
    void ActIn(const std::string& place, const std::function<void()>& act)
    {
        const auto actIn = [=, this] {
            if (m_log.back().starts_with(place) && m_acts++ == 0)
            {
                act();
            }
        };
        m_provider.onCall = [=](const std::string&, OrvixFileList&) { actIn(); };
        m_listener.onNotify = [=](OrvixNotifyParams&) {
            actIn();
            return OrvixListenerAnswer::Accept;
        };
        m_onDialog = [=](OrvixFileListDialogParams&) { actIn(); };
    }

    std::int32_t RunAll(IOrvixServices& services)
    {
        return services.RunFileListOperation(nullptr, &m_params, true, &m_provider,
                                             Operation::Notify | Operation::CheckIn, AllBits);
    }

    bool AnswersAreSaved() const { return std::filesystem::exists(m_config.Path() / L"OrvixPrompts.xml"); }

    const std::vector<std::string> m_places = {"QueryStatus", "Notify BeforeCheckIn", "Dialog", "Notify FilesConfirmed",
                                               "CheckIn",     "Notify AfterCheckIn"};
    const Lines m_wholeRun = {"QueryStatus [a]",           "Notify BeforeCheckIn [a]", "Dialog [a] EntriesCanBeCleared",
                              "Notify FilesConfirmed [a]", "CheckIn [a] comment",      "Notify AfterCheckIn [a]"};
    int m_acts = 0;
};

} // namespace

TEST_F(OperationLife, ShutdownInEachCallBackWaitsForTheEnd)
{
    for (const std::string& place : m_places)
    {
        Initialize(&m_host);
        std::filesystem::remove(m_config.Path() / L"OrvixPrompts.xml");
        AddPrompt(DialogPrompt, Action::Ask);
        m_log.clear();
        m_acts = 0;
        bool savedMeanwhile = false;
        ActIn(place, [&] {
            m_services->Shutdown();
            savedMeanwhile = AnswersAreSaved();
        });
        EXPECT_EQ(RunAll(*m_services), OperationResult::Done) << place;
        EXPECT_EQ(m_log, m_wholeRun) << place;
        EXPECT_FALSE(savedMeanwhile) << place;
        EXPECT_TRUE(AnswersAreSaved()) << place;
    }
}

TEST_F(OperationLife, ReleaseInEachCallBackWaitsForTheEnd)
{
    for (const std::string& place : m_places)
    {
        IOrvixServices* services = GetIOrvixServices();
        OrvixClientInfo info;
        info.SetConfigFilePath(m_config.Text().c_str());
        services->Initialize(&info, 0);
        services->RegisterPrompt(DialogPrompt, L"text", Action::Ask, 0, false);
        std::filesystem::remove(m_config.Path() / L"OrvixPrompts.xml");
        m_log.clear();
        m_acts = 0;
        ActIn(place, [&] {
            ReleaseIOrvixServices(services);
            EXPECT_FALSE(AnswersAreSaved()) << place;
        });
        EXPECT_EQ(RunAll(*services), OperationResult::Done) << place;
        EXPECT_EQ(m_log, m_wholeRun) << place;
        EXPECT_EQ(m_acts, 1) << place;
        EXPECT_TRUE(AnswersAreSaved()) << "the object is destroyed at the end; " << place;
    }
}

TEST_F(OperationLife, InitializeInEachCallBackIsRefused)
{
    OrvixClientInfo info;
    info.SetConfigFilePath(m_config.Text().c_str());
    for (const std::string& place : m_places)
    {
        m_log.clear();
        m_acts = 0;
        ActIn(place, [&] {
            EXPECT_FALSE(m_services->Initialize(&info, 0));
            EXPECT_EQ(m_services->GetPromptAction(DialogPrompt), Action::Ask) << "the answers are not read again";
        });
        EXPECT_EQ(RunAll(*m_services), OperationResult::Done) << place;
        EXPECT_EQ(m_acts, 1) << place;
    }
}

TEST_F(OperationLife, AnOperationWithinAnOperationEndsNothingEarly)
{
    ActIn("Dialog", [&] {
        m_services->Shutdown();
        OrvixFileListDialogParams empty;
        EXPECT_EQ(m_services->RunFileListOperation(nullptr, &empty, false, nullptr, 0, 0), OperationResult::Cancelled);
        EXPECT_FALSE(AnswersAreSaved()) << "the outer operation still runs";
    });
    EXPECT_EQ(RunAll(*m_services), OperationResult::Done);
    EXPECT_TRUE(AnswersAreSaved());
}

TEST_F(OperationLife, ShutdownInAPromptWaitsForItsAnswer)
{
    bool savedMeanwhile = true;
    m_script.onPrompt = [&](const CoreUIScript::Prompt&) {
        m_services->Shutdown();
        savedMeanwhile = AnswersAreSaved();
        return Answer::Yes;
    };
    EXPECT_EQ(m_services->ShowPrompt(nullptr, nullptr, nullptr, 0, DialogPrompt, nullptr), Answer::Yes);
    EXPECT_FALSE(savedMeanwhile);
    EXPECT_TRUE(AnswersAreSaved());
}
