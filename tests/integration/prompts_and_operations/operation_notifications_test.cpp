#include "OperationTest.h"
#include "OrvixNotification.h"

#include <array>
#include <stdexcept>
#include <string>

namespace
{

class OperationNotifications : public OperationTest
{
protected:
    OperationNotifications() { AddFile(L"a"); }
};

struct OperationRow
{
    std::uint32_t bit;
    const char* provider;
    const char* before;
    const char* after;
};

/// In the order in which the identifiers are chosen.
constexpr std::array<OperationRow, 5> ByPrecedence = {
    {{Operation::CheckIn, "CheckIn [a] comment", "BeforeCheckIn", "AfterCheckIn"},
     {Operation::Add, "Add [a] comment", "BeforeAdd", "AfterAdd"},
     {Operation::GetLatest, "GetLatest [a]", "BeforeGetLatest", "AfterGetLatest"},
     {Operation::CheckOut, "CheckOut [a] comment", "BeforeCheckOut", "AfterCheckOut"},
     {Operation::UndoCheckOut, "UndoCheckOut [a]", "BeforeUndoCheckOut", "AfterUndoCheckOut"}}};

/// In the order in which the provider is called.
constexpr std::array<std::uint32_t, 5> ByCall = {Operation::Add, Operation::CheckIn, Operation::GetLatest,
                                                 Operation::CheckOut, Operation::UndoCheckOut};

const OperationRow& RowOf(std::uint32_t bit)
{
    for (const OperationRow& row : ByPrecedence)
    {
        if (row.bit == bit)
        {
            return row;
        }
    }
    throw std::out_of_range("no such operation");
}

TEST_F(OperationNotifications, NameTheFirstOperationWhileTheProviderRunsAllInAnotherOrder)
{
    for (unsigned int choice = 1; choice < 1U << ByCall.size(); ++choice)
    {
        std::uint32_t operations = 0;
        for (std::size_t i = 0; i < ByCall.size(); ++i)
        {
            operations |= (choice >> i & 1U) != 0 ? ByCall[i] : 0;
        }
        const OperationRow* first = nullptr;
        for (const OperationRow& row : ByPrecedence)
        {
            if (first == nullptr && (operations & row.bit) != 0)
            {
                first = &row;
            }
        }
        Lines expected = {"Dialog [a] EntriesCanBeCleared"};
        for (const std::uint32_t bit : ByCall)
        {
            if ((operations & bit) != 0)
            {
                expected.emplace_back(RowOf(bit).provider);
            }
        }

        m_params.SetOptions(0);
        m_log.clear();
        EXPECT_EQ(Run(operations), OperationResult::Done);
        EXPECT_EQ(m_log, expected) << operations;

        expected.insert(expected.begin(), "Notify " + std::string(first->before) + " [a]");
        expected.insert(expected.begin() + 2, "Notify FilesConfirmed [a]");
        expected.push_back("Notify " + std::string(first->after) + " [a]");
        m_params.SetOptions(0);
        m_log.clear();
        EXPECT_EQ(Run(operations | Operation::Notify), OperationResult::Done);
        EXPECT_EQ(m_log, expected) << operations;
    }
}

TEST_F(OperationNotifications, AreNotSentWithoutAnOperation)
{
    constexpr std::uint32_t published = Operation::Notify | Operation::CheckIn | Operation::Add | Operation::GetLatest |
                                        Operation::CheckOut | Operation::UndoCheckOut;
    m_listener.onNotify = [](OrvixNotifyParams&) { return OrvixListenerAnswer::Veto; };
    m_params.SetDialogPromptID(DialogPrompt);
    AddPrompt(DialogPrompt, Action::Yes);
    for (const std::uint32_t operations : {0U, Operation::Notify, ~published, ~published | Operation::Notify})
    {
        EXPECT_EQ(Run(operations), OperationResult::Done);
        EXPECT_TRUE(m_log.empty()) << operations;
    }
    m_services->SetPromptAction(DialogPrompt, Action::No);
    EXPECT_EQ(Run(Operation::Notify), OperationResult::Cancelled);
    EXPECT_TRUE(m_log.empty());
}

TEST_F(OperationNotifications, AreNotSentForACancelledOperationWithoutTheNotifyBit)
{
    m_dialogResult = DialogResult::Cancelled;
    EXPECT_EQ(Run(Operation::CheckIn), OperationResult::Cancelled);
    EXPECT_EQ(m_log, (Lines{"Dialog [a] EntriesCanBeCleared"}));
}

TEST_F(OperationNotifications, CarryTheFileListAndNothingElse)
{
    m_dialogResult = DialogResult::Confirmed;
    int records = 0;
    m_listener.onNotify = [&](OrvixNotifyParams& params) {
        ++records;
        EXPECT_EQ(params.GetOrvixFileList(), &m_list);
        EXPECT_EQ(params.GetProviderIndex(), 0U);
        EXPECT_FALSE(params.IsCancelled());
        return OrvixListenerAnswer::Accept;
    };
    Run(Operation::Notify | Operation::CheckOut);
    EXPECT_EQ(records, 3);
}

TEST_F(OperationNotifications, ListTheEntriesThatAreLeft)
{
    AddFile(L"b", State::OutOfDate);
    AddFile(L"c");
    m_cleared = {"a"};
    Run(Operation::Notify | Operation::CheckOut, State::Controlled);
    EXPECT_EQ(m_log, (Lines{"Notify BeforeCheckOut [a c]", "Dialog [a c] EntriesCanBeCleared",
                            "Notify FilesConfirmed [c]", "CheckOut [c] comment", "Notify AfterCheckOut [c]"}));
}

TEST_F(OperationNotifications, LetAListenerVetoBeforeTheDialog)
{
    AddFile(L"b", State::OutOfDate);
    m_listener.Answer(OrvixNotificationID::BeforeCheckIn, OrvixListenerAnswer::Veto);
    EXPECT_EQ(Run(Operation::Notify | Operation::CheckIn, State::Controlled), OperationResult::Cancelled);
    EXPECT_EQ(m_log, (Lines{"Notify BeforeCheckIn [a]"}));
    EXPECT_EQ(ActiveNames(&m_list), "[a]");
}

TEST_F(OperationNotifications, LetAListenerVetoAStoredAnswer)
{
    m_params.SetDialogPromptID(DialogPrompt);
    AddPrompt(DialogPrompt, Action::Yes);
    m_listener.Answer(OrvixNotificationID::BeforeCheckIn, OrvixListenerAnswer::Veto);
    EXPECT_EQ(Run(Operation::Notify | Operation::CheckIn), OperationResult::Cancelled);
    EXPECT_EQ(m_log, (Lines{"Notify BeforeCheckIn [a]"}));
}

TEST_F(OperationNotifications, TellTheListenersBeforeTheOneThatVetoedOnceMore)
{
    RecordingListener second(m_log, "Second");
    const RecordingListener third(m_log, "Third");
    second.Answer(OrvixNotificationID::BeforeCheckOut, OrvixListenerAnswer::Veto);
    EXPECT_EQ(Run(Operation::Notify | Operation::CheckOut), OperationResult::Cancelled);
    EXPECT_EQ(m_log,
              (Lines{"Notify BeforeCheckOut [a]", "Second BeforeCheckOut [a]", "Notify BeforeCheckOut [a] cancelled"}));
}

TEST_F(OperationNotifications, AreVetoedOnlyByTheAnswerThatMeansSo)
{
    for (const std::uint32_t answer : {OrvixListenerAnswer::Stop, OrvixListenerAnswer::Veto | UnpublishedBit, AllBits})
    {
        m_params.SetOptions(0);
        m_log.clear();
        m_listener.Answer(OrvixNotificationID::BeforeCheckIn, answer);
        EXPECT_EQ(Run(Operation::Notify | Operation::CheckIn), OperationResult::Done) << answer;
        EXPECT_EQ(m_log, (Lines{"Notify BeforeCheckIn [a]", "Dialog [a] EntriesCanBeCleared",
                                "Notify FilesConfirmed [a]", "CheckIn [a] comment", "Notify AfterCheckIn [a]"}));
    }
}

TEST_F(OperationNotifications, AreNotVetoedByAListenerThatMarksTheRecordAsCancelled)
{
    m_listener.onNotify = [](OrvixNotifyParams& params) {
        params.SetCancelled(params.GetID() == OrvixNotificationID::BeforeCheckIn);
        return OrvixListenerAnswer::Accept;
    };
    EXPECT_EQ(Run(Operation::Notify | Operation::CheckIn), OperationResult::Done);
    EXPECT_EQ(m_log, (Lines{"Notify BeforeCheckIn [a]", "Dialog [a] EntriesCanBeCleared", "Notify FilesConfirmed [a]",
                            "CheckIn [a] comment", "Notify AfterCheckIn [a]"}));
}

TEST_F(OperationNotifications, CannotBeVetoedAfterTheDialogOrAfterTheOperation)
{
    for (const std::uint32_t id : {OrvixNotificationID::FilesConfirmed, OrvixNotificationID::AfterCheckIn})
    {
        m_params.SetOptions(0);
        m_log.clear();
        m_listener.Answer(id, OrvixListenerAnswer::Veto);
        EXPECT_EQ(Run(Operation::Notify | Operation::CheckIn), OperationResult::Done) << id;
        EXPECT_EQ(m_log, (Lines{"Notify BeforeCheckIn [a]", "Dialog [a] EntriesCanBeCleared",
                                "Notify FilesConfirmed [a]", "CheckIn [a] comment", "Notify AfterCheckIn [a]"}));
    }
}

TEST_F(OperationNotifications, RepeatTheBeforeNotificationAsCancelledWhenTheUserCancels)
{
    m_dialogResult = DialogResult::Cancelled;
    EXPECT_EQ(Run(Operation::Notify | Operation::UndoCheckOut), OperationResult::Cancelled);
    EXPECT_EQ(m_log, (Lines{"Notify BeforeUndoCheckOut [a]", "Dialog [a] EntriesCanBeCleared",
                            "Notify BeforeUndoCheckOut [a] cancelled"}));
}

TEST_F(OperationNotifications, RepeatTheBeforeNotificationAsCancelledWhenTheStoredAnswerIsNo)
{
    m_params.SetDialogPromptID(DialogPrompt);
    AddPrompt(DialogPrompt, Action::No);
    EXPECT_EQ(Run(Operation::Notify | Operation::GetLatest), OperationResult::Cancelled);
    EXPECT_EQ(m_log, (Lines{"Notify BeforeGetLatest [a]", "Notify BeforeGetLatest [a] cancelled"}));
}

TEST_F(OperationNotifications, IgnoreAVetoOfACancelledOperation)
{
    RecordingListener second(m_log, "Second");
    m_listener.onNotify = [](OrvixNotifyParams& params) {
        return params.IsCancelled() ? OrvixListenerAnswer::Veto : OrvixListenerAnswer::Accept;
    };
    m_dialogResult = DialogResult::Cancelled;
    EXPECT_EQ(Run(Operation::Notify | Operation::CheckIn), OperationResult::Cancelled);
    EXPECT_EQ(m_log, (Lines{"Notify BeforeCheckIn [a]", "Second BeforeCheckIn [a]", "Dialog [a] EntriesCanBeCleared",
                            "Notify BeforeCheckIn [a] cancelled"}));
}

TEST_F(OperationNotifications, SendNoAfterNotificationWhenTheUserClearedEverything)
{
    m_cleared = {"a"};
    EXPECT_EQ(Run(Operation::Notify | Operation::CheckIn), OperationResult::Done);
    EXPECT_EQ(m_log, (Lines{"Notify BeforeCheckIn [a]", "Dialog [a] EntriesCanBeCleared", "Notify FilesConfirmed []"}));
}

TEST_F(OperationNotifications, LetAListenerRemoveEntriesAfterTheDialog)
{
    m_listener.onNotify = [this](OrvixNotifyParams& params) {
        if (params.GetID() == OrvixNotificationID::FilesConfirmed)
        {
            m_list.RemoveActiveEntry(m_list.GetFileEntry(0));
        }
        return OrvixListenerAnswer::Accept;
    };
    EXPECT_EQ(Run(Operation::Notify | Operation::CheckIn), OperationResult::Done);
    EXPECT_EQ(m_log,
              (Lines{"Notify BeforeCheckIn [a]", "Dialog [a] EntriesCanBeCleared", "Notify FilesConfirmed [a]"}));
}

TEST_F(OperationNotifications, TellOfTheDialogEvenWhenNoOperationFollows)
{
    EXPECT_EQ(Run(Operation::Notify), OperationResult::Done);
    EXPECT_EQ(m_log, (Lines{"Dialog [a] EntriesCanBeCleared", "Notify FilesConfirmed [a]"}));
}

} // namespace
