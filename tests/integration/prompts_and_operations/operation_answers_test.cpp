#include "OperationTest.h"

namespace
{

/// Stored answers in the place of the dialog.
class OperationAnswers : public OperationTest
{
protected:
    OperationAnswers() { AddFile(L"a"); }

    /// The option word that the provider is given for these stored actions and options.
    std::string Mode(std::uint32_t optionAction, std::uint32_t options)
    {
        m_services->RegisterPrompt(OptionPrompt, L"text", optionAction, 0, true);
        m_params.SetOptions(options);
        m_log.clear();
        EXPECT_EQ(Run(CheckIn), 1);
        return m_log.empty() ? "not run" : m_log.front();
    }
};

TEST_F(OperationAnswers, RunTheOperationWithoutADialogForAnyActionWithAYes)
{
    m_params.SetDialogPromptID(DialogPrompt);
    for (const std::uint32_t action : {0x2U, 0x6U, 0xAU, 0x12U, 0x1EU, 0xFFFFFFFEU})
    {
        m_services->RegisterPrompt(DialogPrompt, L"text", action, 0, true);
        m_log.clear();
        EXPECT_EQ(Run(Notify | CheckIn), 1);
        EXPECT_EQ(m_log, (Lines{"Notify 13 [a]", "CheckIn [a] comment 4", "Notify 14 [a]"})) << action;
    }
}

TEST_F(OperationAnswers, CancelTheOperationForAnyActionWithoutAYes)
{
    m_params.SetDialogPromptID(DialogPrompt);
    for (const std::uint32_t action : {0x0U, 0x4U, 0x8U, 0x10U, 0x1CU, 0xFFFFFFFCU})
    {
        m_services->RegisterPrompt(DialogPrompt, L"text", action, 0, true);
        m_log.clear();
        EXPECT_EQ(Run(CheckIn), 0);
        EXPECT_TRUE(m_log.empty()) << action;
    }
}

TEST_F(OperationAnswers, CancelAnOperationWhosePromptHasNoRow)
{
    m_params.SetDialogPromptID(DialogPrompt);
    EXPECT_EQ(Run(Notify | CheckIn), 0);
    EXPECT_EQ(m_log, (Lines{"Notify 13 [a]", "Notify 13 [a] cancelled"}));
}

TEST_F(OperationAnswers, ShowTheDialogWhereTheActionSaysAsk)
{
    m_params.SetDialogPromptID(DialogPrompt);
    for (const std::uint32_t action : {0x1U, 0x3U, 0x5U, 0xFFFFFFFFU})
    {
        m_services->RegisterPrompt(DialogPrompt, L"text", action, 0, true);
        m_params.SetOptions(0);
        m_log.clear();
        EXPECT_EQ(Run(CheckIn), 1);
        EXPECT_EQ(m_log, (Lines{"Dialog [a] 1", "CheckIn [a] comment 0"})) << action;
    }
}

TEST_F(OperationAnswers, TakeTheOptionFromItsOwnStoredAnswer)
{
    UsePrompts();
    AddPrompt(DialogPrompt, AnswerOne);
    EXPECT_EQ(Mode(AnswerTwo, 0), "CheckIn [a] comment 4");
    EXPECT_EQ(Mode(AnswerTwo, KeepOption), "CheckIn [a] comment 5");
    EXPECT_EQ(Mode(AnswerTwo, LatestOption), "CheckIn [a] comment 6");
    EXPECT_EQ(Mode(AnswerTwo, KeepOption | LatestOption), "CheckIn [a] comment 5");
    EXPECT_EQ(Mode(AnswerTwo, ~(KeepOption | LatestOption)), "CheckIn [a] comment 4");
}

TEST_F(OperationAnswers, TakeTheOptionForExactlyOneStoredAction)
{
    UsePrompts();
    AddPrompt(DialogPrompt, AnswerOne);
    for (const std::uint32_t action : {0x0U, 0x1U, 0x2U, 0x4U, 0x9U, 0xAU, 0x10U, 0x18U, 0x80000008U})
    {
        EXPECT_EQ(Mode(action, KeepOption | LatestOption | OptionTicked), "CheckIn [a] comment 4") << action;
    }
}

TEST_F(OperationAnswers, LeaveTheOptionAloneWhereItsPromptHasNoRowOrIsNotNamed)
{
    AddPrompt(DialogPrompt, AnswerOne);
    // A row that carries the number for "no prompt" is not looked at.
    AddPrompt(NoPrompt, AnswerTwo);
    m_params.SetOptions(KeepOption);
    m_params.SetDialogPromptID(DialogPrompt);
    EXPECT_EQ(Run(CheckIn), 1);
    m_params.SetOptionPromptID(OptionPrompt);
    EXPECT_EQ(Run(CheckIn), 1);
    EXPECT_EQ(m_log, (Lines{"CheckIn [a] comment 4", "CheckIn [a] comment 4"}));
}

TEST_F(OperationAnswers, ReadTheFirstRowOfAnId)
{
    UsePrompts();
    AddPrompt(DialogPrompt, AnswerOne);
    AddPrompt(DialogPrompt, AnswerZero);
    AddPrompt(OptionPrompt, AnswerTwo);
    AddPrompt(OptionPrompt, AnswerThree);
    m_params.SetOptions(KeepOption);
    EXPECT_EQ(Run(CheckIn), 1);
    EXPECT_EQ(m_log, (Lines{"CheckIn [a] comment 5"}));
}

TEST_F(OperationAnswers, ServeIdsAboveTheSignedRange)
{
    m_params.SetDialogPromptID(-2);
    AddPrompt(0xFFFFFFFE, AnswerOne);
    EXPECT_EQ(Run(CheckIn), 1);
    EXPECT_EQ(m_log, (Lines{"CheckIn [a] comment 4"}));
}

TEST_F(OperationAnswers, LeaveTheRecordAndTheEntriesAsTheyAre)
{
    UsePrompts();
    AddPrompt(DialogPrompt, AnswerOne);
    AddPrompt(OptionPrompt, AnswerTwo);
    AddFile(L"b", 0x20);
    m_params.SetOptions(OfferRemember | Remember | KeepOption);
    EXPECT_EQ(Run(CheckIn), 1);
    EXPECT_EQ(m_log, (Lines{"CheckIn [a b] comment 5"}));
    EXPECT_EQ(m_params.GetOptions(), OfferRemember | Remember | KeepOption);
    EXPECT_EQ(LastAction(DialogPrompt), AnswerOne);
    EXPECT_EQ(LastAction(OptionPrompt), AnswerTwo);
}

TEST_F(OperationAnswers, AreReadAfterTheBeforeNotification)
{
    m_params.SetDialogPromptID(DialogPrompt);
    AddPrompt(DialogPrompt, AnswerZero);
    m_listener.onNotify = [this](OrvixNotifyParams&) {
        m_services->SetPromptAction(DialogPrompt, AnswerOne);
        return 0;
    };
    EXPECT_EQ(Run(Notify | CheckIn), 1);
}

TEST_F(OperationAnswers, StandForAnUnattendedUserEvenWhereTheActionSaysAsk)
{
    m_host.unattended = true;
    m_params.SetDialogPromptID(DialogPrompt);
    AddPrompt(DialogPrompt, Ask | AnswerOne);
    EXPECT_EQ(Run(CheckIn), 1);
    EXPECT_EQ(m_log, (Lines{"CheckIn [a] comment 4"}));

    m_log.clear();
    m_services->SetPromptAction(DialogPrompt, Ask);
    EXPECT_EQ(Run(Notify | CheckIn), 0);
    EXPECT_EQ(m_log, (Lines{"Notify 13 [a]", "Notify 13 [a] cancelled"}));
}

TEST_F(OperationAnswers, GiveAnUnattendedUserTheOptionOnlyWhereTheDialogIsNotAsked)
{
    m_host.unattended = true;
    UsePrompts();
    AddPrompt(OptionPrompt, AnswerTwo);
    m_params.SetOptions(KeepOption);
    AddPrompt(DialogPrompt, Ask | AnswerOne);
    EXPECT_EQ(Run(CheckIn), 1);
    m_services->SetPromptAction(DialogPrompt, AnswerOne);
    EXPECT_EQ(Run(CheckIn), 1);
    EXPECT_EQ(m_log, (Lines{"CheckIn [a] comment 4", "CheckIn [a] comment 5"}));
}

TEST_F(OperationAnswers, CannotReplaceADialogThatNamesNoPrompt)
{
    m_host.unattended = true;
    AddPrompt(NoPrompt, AnswerOne);
    EXPECT_EQ(Run(CheckIn), 1);
    EXPECT_EQ(m_log, (Lines{"Dialog [a] 1", "CheckIn [a] comment 0"}));
}

} // namespace
