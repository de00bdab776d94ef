#include "OperationTest.h"

namespace
{

/// Stored answers instead of the dialog.
class OperationAnswers : public OperationTest
{
protected:
    static constexpr std::uint32_t EveryAnswer = Action::Yes | Action::No | Action::YesToAll | Action::NoToAll;

    OperationAnswers() { AddFile(L"a"); }

    /// What a provider is told when the option has this stored action and the record these options.
    std::string CheckInWith(std::uint32_t optionAction, std::uint32_t options)
    {
        m_services->RegisterPrompt(OptionPrompt, L"text", optionAction, 0, true);
        m_params.SetOptions(options);
        m_log.clear();
        EXPECT_EQ(Run(Operation::CheckIn), OperationResult::Done);
        return m_log.empty() ? "not run" : m_log.front();
    }
};

TEST_F(OperationAnswers, RunTheOperationWithoutADialogForAnyActionWithAYes)
{
    m_params.SetDialogPromptID(DialogPrompt);
    for (const std::uint32_t action : {Action::Yes, Action::Yes | Action::No, Action::Yes | Action::YesToAll,
                                       Action::Yes | Action::NoToAll, EveryAnswer, ~Action::Ask})
    {
        m_services->RegisterPrompt(DialogPrompt, L"text", action, 0, true);
        m_log.clear();
        EXPECT_EQ(Run(Operation::Notify | Operation::CheckIn), OperationResult::Done);
        EXPECT_EQ(m_log, (Lines{"Notify BeforeCheckIn [a]", "CheckIn [a] comment NoDialog", "Notify AfterCheckIn [a]"}))
            << action;
    }
}

TEST_F(OperationAnswers, CancelTheOperationForAnyActionWithoutAYes)
{
    m_params.SetDialogPromptID(DialogPrompt);
    for (const std::uint32_t action :
         {0U, Action::No, Action::YesToAll, Action::NoToAll, EveryAnswer & ~Action::Yes, ~(Action::Ask | Action::Yes)})
    {
        m_services->RegisterPrompt(DialogPrompt, L"text", action, 0, true);
        m_log.clear();
        EXPECT_EQ(Run(Operation::CheckIn), OperationResult::Cancelled);
        EXPECT_TRUE(m_log.empty()) << action;
    }
}

TEST_F(OperationAnswers, CancelAnOperationWhosePromptHasNoRow)
{
    m_params.SetDialogPromptID(DialogPrompt);
    EXPECT_EQ(Run(Operation::Notify | Operation::CheckIn), OperationResult::Cancelled);
    EXPECT_EQ(m_log, (Lines{"Notify BeforeCheckIn [a]", "Notify BeforeCheckIn [a] cancelled"}));
}

TEST_F(OperationAnswers, ShowTheDialogWhenTheActionSaysAsk)
{
    m_params.SetDialogPromptID(DialogPrompt);
    for (const std::uint32_t action : {Action::Ask, Action::Ask | Action::Yes, Action::Ask | Action::No, AllBits})
    {
        m_services->RegisterPrompt(DialogPrompt, L"text", action, 0, true);
        m_params.SetOptions(0);
        m_log.clear();
        EXPECT_EQ(Run(Operation::CheckIn), OperationResult::Done);
        EXPECT_EQ(m_log, (Lines{"Dialog [a] EntriesCanBeCleared", "CheckIn [a] comment"})) << action;
    }
}

TEST_F(OperationAnswers, TakeTheOptionFromItsOwnStoredAnswer)
{
    UsePrompts();
    AddPrompt(DialogPrompt, Action::Yes);
    EXPECT_EQ(CheckInWith(Action::OptionChecked, 0), "CheckIn [a] comment NoDialog");
    EXPECT_EQ(CheckInWith(Action::OptionChecked, DialogOption::OfferKeepCheckedOut),
              "CheckIn [a] comment KeepCheckedOut NoDialog");
    EXPECT_EQ(CheckInWith(Action::OptionChecked, DialogOption::OfferGetLatest),
              "CheckIn [a] comment GetLatest NoDialog");
    EXPECT_EQ(CheckInWith(Action::OptionChecked, DialogOption::OfferKeepCheckedOut | DialogOption::OfferGetLatest),
              "CheckIn [a] comment KeepCheckedOut NoDialog");
    EXPECT_EQ(CheckInWith(Action::OptionChecked, ~(DialogOption::OfferKeepCheckedOut | DialogOption::OfferGetLatest)),
              "CheckIn [a] comment NoDialog");
}

TEST_F(OperationAnswers, TakeTheOptionForExactlyOneStoredAction)
{
    UsePrompts();
    AddPrompt(DialogPrompt, Action::Yes);
    for (const std::uint32_t action :
         {0U, Action::Ask, Action::Yes, Action::No, Action::Ask | Action::OptionChecked,
          Action::Yes | Action::OptionChecked, Action::OptionCleared, Action::OptionChecked | Action::OptionCleared,
          UnpublishedBit | Action::OptionChecked})
    {
        EXPECT_EQ(CheckInWith(action, DialogOption::OfferKeepCheckedOut | DialogOption::OfferGetLatest |
                                          DialogOption::OptionChecked),
                  "CheckIn [a] comment NoDialog")
            << action;
    }
}

TEST_F(OperationAnswers, IgnoreTheOptionWhenItsPromptHasNoRowOrIsNotSet)
{
    AddPrompt(DialogPrompt, Action::Yes);
    // A row with the ID that means "no prompt" does not count.
    AddPrompt(OrvixPromptID::None, Action::OptionChecked);
    m_params.SetOptions(DialogOption::OfferKeepCheckedOut);
    m_params.SetDialogPromptID(DialogPrompt);
    EXPECT_EQ(Run(Operation::CheckIn), OperationResult::Done);
    m_params.SetOptionPromptID(OptionPrompt);
    EXPECT_EQ(Run(Operation::CheckIn), OperationResult::Done);
    EXPECT_EQ(m_log, (Lines{"CheckIn [a] comment NoDialog", "CheckIn [a] comment NoDialog"}));
}

TEST_F(OperationAnswers, ReadTheFirstRowOfAnID)
{
    UsePrompts();
    AddPrompt(DialogPrompt, Action::Yes);
    AddPrompt(DialogPrompt, Action::No);
    AddPrompt(OptionPrompt, Action::OptionChecked);
    AddPrompt(OptionPrompt, Action::OptionCleared);
    m_params.SetOptions(DialogOption::OfferKeepCheckedOut);
    EXPECT_EQ(Run(Operation::CheckIn), OperationResult::Done);
    EXPECT_EQ(m_log, (Lines{"CheckIn [a] comment KeepCheckedOut NoDialog"}));
}

TEST_F(OperationAnswers, TakeIDsAboveTheSignedRange)
{
    constexpr std::uint32_t aboveSigned = OrvixPromptID::None - 1;
    m_params.SetDialogPromptID(static_cast<std::int32_t>(aboveSigned));
    AddPrompt(aboveSigned, Action::Yes);
    EXPECT_EQ(Run(Operation::CheckIn), OperationResult::Done);
    EXPECT_EQ(m_log, (Lines{"CheckIn [a] comment NoDialog"}));
}

TEST_F(OperationAnswers, LeaveTheRecordAndTheEntriesAsTheyAre)
{
    UsePrompts();
    AddPrompt(DialogPrompt, Action::Yes);
    AddPrompt(OptionPrompt, Action::OptionChecked);
    AddFile(L"b", State::Deleted);
    m_params.SetOptions(DialogOption::OfferRemember | DialogOption::RememberChecked |
                        DialogOption::OfferKeepCheckedOut);
    EXPECT_EQ(Run(Operation::CheckIn), OperationResult::Done);
    EXPECT_EQ(m_log, (Lines{"CheckIn [a b] comment KeepCheckedOut NoDialog"}));
    EXPECT_EQ(m_params.GetOptions(),
              DialogOption::OfferRemember | DialogOption::RememberChecked | DialogOption::OfferKeepCheckedOut);
    EXPECT_EQ(LastAction(DialogPrompt), Action::Yes);
    EXPECT_EQ(LastAction(OptionPrompt), Action::OptionChecked);
}

TEST_F(OperationAnswers, AreReadAfterTheBeforeNotification)
{
    m_params.SetDialogPromptID(DialogPrompt);
    AddPrompt(DialogPrompt, Action::No);
    m_listener.onNotify = [this](OrvixNotifyParams&) {
        m_services->SetPromptAction(DialogPrompt, Action::Yes);
        return OrvixListenerAnswer::Accept;
    };
    EXPECT_EQ(Run(Operation::Notify | Operation::CheckIn), OperationResult::Done);
}

TEST_F(OperationAnswers, ReplaceAnUnattendedUserEvenWhenTheActionSaysAsk)
{
    m_host.unattended = true;
    m_params.SetDialogPromptID(DialogPrompt);
    AddPrompt(DialogPrompt, Action::Ask | Action::Yes);
    EXPECT_EQ(Run(Operation::CheckIn), OperationResult::Done);
    EXPECT_EQ(m_log, (Lines{"CheckIn [a] comment NoDialog"}));

    m_log.clear();
    m_services->SetPromptAction(DialogPrompt, Action::Ask);
    EXPECT_EQ(Run(Operation::Notify | Operation::CheckIn), OperationResult::Cancelled);
    EXPECT_EQ(m_log, (Lines{"Notify BeforeCheckIn [a]", "Notify BeforeCheckIn [a] cancelled"}));
}

TEST_F(OperationAnswers, GiveAnUnattendedUserTheOptionOnlyWhenTheDialogIsNotAsked)
{
    m_host.unattended = true;
    UsePrompts();
    AddPrompt(OptionPrompt, Action::OptionChecked);
    m_params.SetOptions(DialogOption::OfferKeepCheckedOut);
    AddPrompt(DialogPrompt, Action::Ask | Action::Yes);
    EXPECT_EQ(Run(Operation::CheckIn), OperationResult::Done);
    m_services->SetPromptAction(DialogPrompt, Action::Yes);
    EXPECT_EQ(Run(Operation::CheckIn), OperationResult::Done);
    EXPECT_EQ(m_log, (Lines{"CheckIn [a] comment NoDialog", "CheckIn [a] comment KeepCheckedOut NoDialog"}));
}

TEST_F(OperationAnswers, CannotReplaceADialogWithoutAPrompt)
{
    m_host.unattended = true;
    AddPrompt(OrvixPromptID::None, Action::Yes);
    EXPECT_EQ(Run(Operation::CheckIn), OperationResult::Done);
    EXPECT_EQ(m_log, (Lines{"Dialog [a] EntriesCanBeCleared", "CheckIn [a] comment"}));
}

} // namespace
