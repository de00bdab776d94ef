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
constexpr std::array<OperationRow, 5> ByPrecedence = {{{CheckIn, "CheckIn [a] comment 0", "13", "14"},
                                                       {Add, "Add [a] comment 0", "19", "20"},
                                                       {GetLatest, "GetLatest [a] 0", "21", "22"},
                                                       {CheckOut, "CheckOut [a] comment 0", "15", "16"},
                                                       {UndoCheckOut, "UndoCheckOut [a] 0", "17", "18"}}};

/// In the order in which the provider is called.
constexpr std::array<std::uint32_t, 5> ByCall = {Add, CheckIn, GetLatest, CheckOut, UndoCheckOut};

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

TEST_F(OperationNotifications, NameTheFirstOperationAndTheProviderRunsAllInItsOwnOrder)
{
    for (std::uint32_t bits = 1; bits < 32; ++bits)
    {
        const std::uint32_t operations = bits << 1;
        const OperationRow* first = nullptr;
        for (const OperationRow& row : ByPrecedence)
        {
            if (first == nullptr && (operations & row.bit) != 0)
            {
                first = &row;
            }
        }
        Lines expected = {"Dialog [a] 1"};
        for (const std::uint32_t bit : ByCall)
        {
            if ((operations & bit) != 0)
            {
                expected.emplace_back(RowOf(bit).provider);
            }
        }

        m_params.SetOptions(0);
        m_log.clear();
        EXPECT_EQ(Run(operations), 1);
        EXPECT_EQ(m_log, expected) << operations;

        expected.insert(expected.begin(), "Notify " + std::string(first->before) + " [a]");
        expected.insert(expected.begin() + 2, "Notify 27 [a]");
        expected.push_back("Notify " + std::string(first->after) + " [a]");
        m_params.SetOptions(0);
        m_log.clear();
        EXPECT_EQ(Run(operations | Notify), 1);
        EXPECT_EQ(m_log, expected) << operations;
    }
}

TEST_F(OperationNotifications, AreNotSentWithoutAnOperation)
{
    m_listener.onNotify = [](OrvixNotifyParams&) { return 1; };
    m_params.SetDialogPromptID(DialogPrompt);
    AddPrompt(DialogPrompt, AnswerOne);
    for (const std::uint32_t operations : {0x0U, 0x1U, 0xFFFFFFC0U, 0xFFFFFFC1U})
    {
        EXPECT_EQ(Run(operations), 1);
        EXPECT_TRUE(m_log.empty()) << operations;
    }
    m_services->SetPromptAction(DialogPrompt, AnswerZero);
    EXPECT_EQ(Run(Notify), 0);
    EXPECT_TRUE(m_log.empty());
}

TEST_F(OperationNotifications, AreNotSentOfACancelledOperationWithoutTheNotifyBit)
{
    m_dialogResult = 0;
    EXPECT_EQ(Run(CheckIn), 0);
    EXPECT_EQ(m_log, (Lines{"Dialog [a] 1"}));
}

TEST_F(OperationNotifications, CarryTheFileListAndNothingElse)
{
    m_dialogResult = 1;
    int records = 0;
    m_listener.onNotify = [&](OrvixNotifyParams& params) {
        ++records;
        EXPECT_EQ(params.GetOrvixFileList(), &m_list);
        EXPECT_EQ(params.GetProviderIndex(), 0U);
        EXPECT_FALSE(params.IsCancelled());
        return 0;
    };
    Run(Notify | CheckOut);
    EXPECT_EQ(records, 3);
}

TEST_F(OperationNotifications, ListTheEntriesThatAreLeft)
{
    AddFile(L"b", 0x10);
    AddFile(L"c");
    m_unticked = {"a"};
    Run(Notify | CheckOut, Controlled);
    EXPECT_EQ(m_log,
              (Lines{"Notify 15 [a c]", "Dialog [a c] 1", "Notify 27 [c]", "CheckOut [c] comment 0", "Notify 16 [c]"}));
}

TEST_F(OperationNotifications, LetAListenerVetoBeforeTheDialog)
{
    AddFile(L"b", 0x10);
    m_listener.Answer(13, 1);
    EXPECT_EQ(Run(Notify | CheckIn, Controlled), 0);
    EXPECT_EQ(m_log, (Lines{"Notify 13 [a]"}));
    EXPECT_EQ(ActiveNames(&m_list), "[a]");
}

TEST_F(OperationNotifications, LetAListenerVetoAStoredAnswer)
{
    m_params.SetDialogPromptID(DialogPrompt);
    AddPrompt(DialogPrompt, AnswerOne);
    m_listener.Answer(13, 1);
    EXPECT_EQ(Run(Notify | CheckIn), 0);
    EXPECT_EQ(m_log, (Lines{"Notify 13 [a]"}));
}

TEST_F(OperationNotifications, TellTheListenersBeforeTheOneThatVetoedOnceMore)
{
    RecordingListener second(m_log, "Second");
    const RecordingListener third(m_log, "Third");
    second.Answer(15, 1);
    EXPECT_EQ(Run(Notify | CheckOut), 0);
    EXPECT_EQ(m_log, (Lines{"Notify 15 [a]", "Second 15 [a]", "Notify 15 [a] cancelled"}));
}

TEST_F(OperationNotifications, AreVetoedByExactlyOne)
{
    for (const std::uint32_t answer : {2U, 0x80000001U, 0xFFFFFFFFU})
    {
        m_params.SetOptions(0);
        m_log.clear();
        m_listener.Answer(13, answer);
        EXPECT_EQ(Run(Notify | CheckIn), 1) << answer;
        EXPECT_EQ(m_log,
                  (Lines{"Notify 13 [a]", "Dialog [a] 1", "Notify 27 [a]", "CheckIn [a] comment 0", "Notify 14 [a]"}));
    }
}

TEST_F(OperationNotifications, AreNotVetoedByARecordThatAListenerMarked)
{
    m_listener.onNotify = [](OrvixNotifyParams& params) {
        params.SetCancelled(params.GetID() == 13);
        return 0;
    };
    EXPECT_EQ(Run(Notify | CheckIn), 1);
    EXPECT_EQ(m_log,
              (Lines{"Notify 13 [a]", "Dialog [a] 1", "Notify 27 [a]", "CheckIn [a] comment 0", "Notify 14 [a]"}));
}

TEST_F(OperationNotifications, CannotBeVetoedAfterTheDialogOrAfterTheOperation)
{
    for (const std::uint32_t id : {27U, 14U})
    {
        m_params.SetOptions(0);
        m_log.clear();
        m_listener.Answer(id, 1);
        EXPECT_EQ(Run(Notify | CheckIn), 1) << id;
        EXPECT_EQ(m_log,
                  (Lines{"Notify 13 [a]", "Dialog [a] 1", "Notify 27 [a]", "CheckIn [a] comment 0", "Notify 14 [a]"}));
    }
}

TEST_F(OperationNotifications, RepeatTheBeforeNotificationMarkedWhereTheUserCancels)
{
    m_dialogResult = 0;
    EXPECT_EQ(Run(Notify | UndoCheckOut), 0);
    EXPECT_EQ(m_log, (Lines{"Notify 17 [a]", "Dialog [a] 1", "Notify 17 [a] cancelled"}));
}

TEST_F(OperationNotifications, RepeatTheBeforeNotificationMarkedWhereTheStoredAnswerIsNo)
{
    m_params.SetDialogPromptID(DialogPrompt);
    AddPrompt(DialogPrompt, AnswerZero);
    EXPECT_EQ(Run(Notify | GetLatest), 0);
    EXPECT_EQ(m_log, (Lines{"Notify 21 [a]", "Notify 21 [a] cancelled"}));
}

TEST_F(OperationNotifications, IgnoreAVetoOfACancelledOperation)
{
    RecordingListener second(m_log, "Second");
    m_listener.onNotify = [](OrvixNotifyParams& params) { return params.IsCancelled() ? 1U : 0U; };
    m_dialogResult = 0;
    EXPECT_EQ(Run(Notify | CheckIn), 0);
    EXPECT_EQ(m_log, (Lines{"Notify 13 [a]", "Second 13 [a]", "Dialog [a] 1", "Notify 13 [a] cancelled"}));
}

TEST_F(OperationNotifications, SendNoAfterNotificationWhereTheUserUntickedEverything)
{
    m_unticked = {"a"};
    EXPECT_EQ(Run(Notify | CheckIn), 1);
    EXPECT_EQ(m_log, (Lines{"Notify 13 [a]", "Dialog [a] 1", "Notify 27 []"}));
}

TEST_F(OperationNotifications, LetAListenerTakeEntriesAwayAfterTheDialog)
{
    m_listener.onNotify = [this](OrvixNotifyParams& params) {
        if (params.GetID() == 27)
        {
            m_list.RemoveActiveEntry(m_list.GetFileEntry(0));
        }
        return 0;
    };
    EXPECT_EQ(Run(Notify | CheckIn), 1);
    EXPECT_EQ(m_log, (Lines{"Notify 13 [a]", "Dialog [a] 1", "Notify 27 [a]"}));
}

TEST_F(OperationNotifications, TellOfTheDialogEvenWhereNoOperationFollows)
{
    EXPECT_EQ(Run(Notify), 1);
    EXPECT_EQ(m_log, (Lines{"Dialog [a] 1", "Notify 27 [a]"}));
}

} // namespace
