#include "OperationTest.h"

#include <windows.h>

#include <comdef.h>

#include <functional>
#include <stdexcept>
#include <vector>

namespace
{

/// No mistake of a host, a plug-in or a dialog reaches the host as an exception.
class OperationFailures : public OperationTest
{
protected:
    OperationFailures() { AddFile(L"a"); }

    std::int32_t RunAll()
    {
        return m_services->RunFileListOperation(nullptr, &m_params, true, &m_provider,
                                                Operation::Notify | Operation::CheckIn, AllBits);
    }

    /// The object still does its work.
    void ExpectUsable()
    {
        m_provider.onCall = nullptr;
        m_listener.onNotify = nullptr;
        m_onDialog = nullptr;
        m_host.onUnattended = nullptr;
        m_params.SetDialogPromptID(OrvixPromptID::Unset);
        m_params.SetOptions(0);
        m_log.clear();
        EXPECT_EQ(RunAll(), OperationResult::Done);
        EXPECT_EQ(m_log, (Lines{"QueryStatus [a]", "Notify BeforeCheckIn [a]", "Dialog [a] EntriesCanBeCleared",
                                "Notify FilesConfirmed [a]", "CheckIn [a] comment", "Notify AfterCheckIn [a]"}));
    }

    const std::vector<std::function<void()>> m_exceptions = {[] { throw std::runtime_error("foreign"); },
                                                             [] { throw 1; }, [] { throw std::bad_alloc(); },
                                                             [] { throw _com_error(E_FAIL); }};
};

TEST_F(OperationFailures, AProviderThatThrowsHasFailedAndTheNextOperationRuns)
{
    for (const auto& fail : m_exceptions)
    {
        m_provider.onCall = [&](const std::string&, OrvixFileList&) { fail(); };
        m_log.clear();
        EXPECT_EQ(m_services->RunFileListOperation(nullptr, &m_params, true, &m_provider,
                                                   Operation::Notify | Operation::Add | Operation::CheckIn |
                                                       Operation::GetLatest | Operation::CheckOut |
                                                       Operation::UndoCheckOut,
                                                   AllBits),
                  OperationResult::Done);
        EXPECT_EQ(m_log, (Lines{"QueryStatus [a]", "Notify BeforeCheckIn [a]", "Dialog [a] EntriesCanBeCleared",
                                "Notify FilesConfirmed [a]", "Add [a] comment", "CheckIn [a] comment", "GetLatest [a]",
                                "CheckOut [a] comment", "UndoCheckOut [a]", "Notify AfterCheckIn [a]"}));
        ExpectUsable();
    }
}

TEST_F(OperationFailures, AListenerThatThrowsBeforeTheOperationVetoesIt)
{
    for (const auto& fail : m_exceptions)
    {
        RecordingListener second(m_log, "Second");
        second.onNotify = [&](OrvixNotifyParams&) {
            fail();
            return OrvixListenerAnswer::Accept;
        };
        RecordingListener third(m_log, "Third");
        m_log.clear();
        EXPECT_EQ(RunAll(), OperationResult::Cancelled);
        EXPECT_EQ(m_log, (Lines{"QueryStatus [a]", "Notify BeforeCheckIn [a]", "Second BeforeCheckIn [a]",
                                "Notify BeforeCheckIn [a] cancelled"}));
    }
    ExpectUsable();
}

TEST_F(OperationFailures, AListenerThatThrowsLaterStopsNothing)
{
    for (const auto& fail : m_exceptions)
    {
        RecordingListener second(m_log, "Second");
        m_listener.onNotify = [&](OrvixNotifyParams& params) {
            if (params.GetID() != OrvixNotificationID::BeforeCheckIn)
            {
                fail();
            }
            return OrvixListenerAnswer::Accept;
        };
        m_log.clear();
        EXPECT_EQ(RunAll(), OperationResult::Done);
        EXPECT_EQ(m_log,
                  (Lines{"QueryStatus [a]", "Notify BeforeCheckIn [a]", "Second BeforeCheckIn [a]",
                         "Dialog [a] EntriesCanBeCleared", "Notify FilesConfirmed [a]", "Second FilesConfirmed [a]",
                         "CheckIn [a] comment", "Notify AfterCheckIn [a]", "Second AfterCheckIn [a]"}));
    }
    ExpectUsable();
}

TEST_F(OperationFailures, ADialogThatThrowsHasBeenCancelled)
{
    for (const auto& fail : m_exceptions)
    {
        m_onDialog = [&](OrvixFileListDialogParams&) { fail(); };
        m_log.clear();
        EXPECT_EQ(RunAll(), OperationResult::Cancelled);
        EXPECT_EQ(m_log, (Lines{"QueryStatus [a]", "Notify BeforeCheckIn [a]", "Dialog [a] EntriesCanBeCleared",
                                "Notify BeforeCheckIn [a] cancelled"}));
        ExpectUsable();
    }
}

TEST_F(OperationFailures, ADialogThatThrowsLeavesTheStoredAnswer)
{
    m_params.SetDialogPromptID(DialogPrompt);
    AddPrompt(DialogPrompt, Action::Ask);
    m_params.SetOptions(DialogOption::RememberChecked);
    m_onDialog = [](OrvixFileListDialogParams&) { throw std::runtime_error("dialog"); };
    EXPECT_EQ(Run(Operation::CheckIn), OperationResult::Cancelled);
    EXPECT_EQ(m_services->GetPromptAction(DialogPrompt), Action::Ask);
}

TEST_F(OperationFailures, AHostThatThrowsCancelsTheOperation)
{
    AddPrompt(DialogPrompt, Action::Ask | Action::Yes);
    for (const auto& fail : m_exceptions)
    {
        m_params.SetDialogPromptID(DialogPrompt);
        m_host.onUnattended = fail;
        EXPECT_EQ(RunAll(), OperationResult::Cancelled);
        EXPECT_EQ(m_services->ShowPrompt(nullptr, nullptr, nullptr, 0, DialogPrompt, nullptr), Answer::No);
        ExpectUsable();
    }
}

TEST_F(OperationFailures, AMissingRecordCancelsAtOnce)
{
    for (const bool callProviderFirst : {false, true})
    {
        EXPECT_EQ(m_services->RunFileListOperation(nullptr, nullptr, callProviderFirst, &m_provider,
                                                   Operation::Notify | Operation::CheckIn, State::Controlled),
                  OperationResult::Cancelled);
    }
    EXPECT_TRUE(m_log.empty());
}

TEST_F(OperationFailures, ARecordWithoutAListCancelsAtOnce)
{
    m_params.SetOrvixFileList(nullptr);
    EXPECT_EQ(RunAll(), OperationResult::Cancelled);
    EXPECT_TRUE(m_log.empty());
}

TEST_F(OperationFailures, AMissingProviderThatWouldBeCalledCancelsAtOnce)
{
    EXPECT_EQ(m_services->RunFileListOperation(nullptr, &m_params, true, nullptr, 0, State::Controlled),
              OperationResult::Cancelled);
    for (const std::uint32_t operation :
         {Operation::CheckIn, Operation::Add, Operation::GetLatest, Operation::CheckOut, Operation::UndoCheckOut})
    {
        EXPECT_EQ(m_services->RunFileListOperation(nullptr, &m_params, false, nullptr, Operation::Notify | operation,
                                                   State::Controlled),
                  OperationResult::Cancelled);
    }
    EXPECT_TRUE(m_log.empty());
    EXPECT_EQ(ActiveNames(&m_list), "[a]");
}

TEST_F(OperationFailures, AMissingProviderThatIsNotCalledDoesNoHarm)
{
    EXPECT_EQ(m_services->RunFileListOperation(nullptr, &m_params, false, nullptr, 0, State::Controlled),
              OperationResult::Done);
    EXPECT_EQ(m_log, (Lines{"Dialog [a] EntriesCanBeCleared"}));
}

} // namespace
