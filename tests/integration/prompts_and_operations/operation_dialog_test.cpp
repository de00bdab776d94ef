#include "OperationTest.h"

#include <climits>
#include <utility>
#include <vector>

namespace
{

/// The dialog of an operation and what its user decides.
class OperationDialog : public OperationTest
{
protected:
    OperationDialog() { AddFile(L"a"); }

    /// Runs a check-in whose user leaves the dialog with these options; returns what the provider was told.
    std::string Confirm(std::uint32_t options)
    {
        m_onDialog = [options](OrvixFileListDialogParams& params) { params.SetOptions(options); };
        m_log.clear();
        EXPECT_EQ(Run(Operation::CheckIn), OperationResult::Done);
        return m_log.back();
    }
};

TEST_F(OperationDialog, GetsTheArgumentsOfTheHost)
{
    m_services->RunFileListOperation(Token(9), &m_params, false, &m_provider, Operation::CheckIn, State::Controlled);
    ASSERT_EQ(m_script.fileLists.size(), 1U);
    EXPECT_EQ(m_script.fileLists.front().a, Token(9));
    EXPECT_EQ(m_script.fileLists.front().params, &m_params);
}

TEST_F(OperationDialog, GetsTheOptionToClearEntriesAndKeepsTheOthers)
{
    constexpr std::uint32_t others = AllBits & ~DialogOption::EntriesCanBeCleared & ~DialogOption::RememberChecked;
    std::uint32_t shown = 0;
    m_onDialog = [&](OrvixFileListDialogParams& params) { shown = params.GetOptions(); };
    m_params.SetOptions(others);
    Run(Operation::CheckIn);
    EXPECT_EQ(shown, others | DialogOption::EntriesCanBeCleared);
    EXPECT_EQ(m_params.GetOptions(), others | DialogOption::EntriesCanBeCleared);
}

TEST_F(OperationDialog, OffersToRememberUnlessThePromptIsLocked)
{
    m_params.SetDialogPromptID(DialogPrompt);
    AddPrompt(DialogPrompt, Action::Ask);
    m_params.SetOptions(DialogOption::OfferRemember | DialogOption::OfferKeepCheckedOut);
    Run(Operation::CheckIn);
    EXPECT_EQ(m_log.front(), "Dialog [a] EntriesCanBeCleared OfferKeepCheckedOut OfferRemember");

    m_params.SetDialogPromptID(DialogPrompt + 1);
    AddPrompt(DialogPrompt + 1, Action::Ask, true);
    m_log.clear();
    Run(Operation::CheckIn);
    EXPECT_EQ(m_log.front(), "Dialog [a] EntriesCanBeCleared OfferKeepCheckedOut");
}

TEST_F(OperationDialog, TakesTheLockFromTheFirstRowOfAnID)
{
    m_params.SetDialogPromptID(DialogPrompt);
    AddPrompt(DialogPrompt, Action::Ask);
    AddPrompt(DialogPrompt, Action::Ask, true);
    m_params.SetOptions(DialogOption::OfferRemember);
    Run(Operation::CheckIn);
    EXPECT_EQ(m_log.front(), "Dialog [a] EntriesCanBeCleared OfferRemember");
}

TEST_F(OperationDialog, LooksForNoLockWithoutADialogPrompt)
{
    AddPrompt(OrvixPromptID::None, Action::Ask, true);
    m_params.SetOptionPromptID(OptionPrompt);
    AddPrompt(OptionPrompt, Action::Ask, true);
    m_params.SetOptions(DialogOption::OfferRemember);
    Run(Operation::CheckIn);
    EXPECT_EQ(m_log.front(), "Dialog [a] EntriesCanBeCleared OfferRemember");
}

TEST_F(OperationDialog, DropsTheEntriesThatTheUserCleared)
{
    for (const wchar_t* name : {L"b", L"c", L"d", L"e"})
    {
        AddFile(name);
    }
    m_cleared = {"a", "b", "d"};
    EXPECT_EQ(Run(Operation::CheckIn), OperationResult::Done);
    EXPECT_EQ(m_log, (Lines{"Dialog [a b c d e] EntriesCanBeCleared", "CheckIn [c e] comment"}));
    EXPECT_EQ(m_list.NumEntries(), 5U);
}

TEST_F(OperationDialog, DropsEveryOccurrenceOfAClearedEntryThatIsListedTwice)
{
    OrvixFileEntry& cleared = AddFile(L"b");
    m_list.AddActiveEntry(&cleared);
    m_cleared = {"b"};
    EXPECT_EQ(Run(Operation::CheckIn), OperationResult::Done);
    EXPECT_EQ(m_log, (Lines{"Dialog [a b b] EntriesCanBeCleared", "CheckIn [a] comment"}));
}

TEST_F(OperationDialog, EndsWithoutTheProviderWhenTheUserClearedEverything)
{
    m_cleared = {"a"};
    EXPECT_EQ(Run(Operation::CheckIn), OperationResult::Done);
    EXPECT_EQ(m_log, (Lines{"Dialog [a] EntriesCanBeCleared"}));
    EXPECT_EQ(ActiveNames(&m_list), "[]");
}

TEST_F(OperationDialog, KeepsClearedEntriesActiveWhenTheUserCancels)
{
    AddFile(L"b");
    m_cleared = {"b"};
    m_dialogResult = DialogResult::Cancelled;
    EXPECT_EQ(Run(Operation::CheckIn), OperationResult::Cancelled);
    EXPECT_EQ(ActiveNames(&m_list), "[a b]");
}

TEST_F(OperationDialog, TellsTheProviderOfACheckedOption)
{
    EXPECT_EQ(Confirm(0), "CheckIn [a] comment");
    EXPECT_EQ(Confirm(DialogOption::OfferKeepCheckedOut | DialogOption::OfferGetLatest), "CheckIn [a] comment");
    EXPECT_EQ(Confirm(DialogOption::OptionChecked), "CheckIn [a] comment");
    EXPECT_EQ(Confirm(DialogOption::OptionChecked | DialogOption::OfferKeepCheckedOut),
              "CheckIn [a] comment KeepCheckedOut");
    EXPECT_EQ(Confirm(DialogOption::OptionChecked | DialogOption::OfferGetLatest), "CheckIn [a] comment GetLatest");
    EXPECT_EQ(Confirm(DialogOption::OptionChecked | DialogOption::OfferKeepCheckedOut | DialogOption::OfferGetLatest),
              "CheckIn [a] comment KeepCheckedOut");
}

TEST_F(OperationDialog, TellsEveryOperationOfTheProviderTheSameOption)
{
    m_params.SetOptions(DialogOption::OptionChecked | DialogOption::OfferGetLatest);
    EXPECT_EQ(
        Run(Operation::Add | Operation::CheckIn | Operation::GetLatest | Operation::CheckOut | Operation::UndoCheckOut),
        OperationResult::Done);
    EXPECT_EQ(m_log, (Lines{"Dialog [a] EntriesCanBeCleared OfferGetLatest OptionChecked", "Add [a] comment GetLatest",
                            "CheckIn [a] comment GetLatest", "GetLatest [a] GetLatest",
                            "CheckOut [a] comment GetLatest", "UndoCheckOut [a] GetLatest"}));
}

TEST_F(OperationDialog, TakesTheOptionAsItIsAfterTheNotification)
{
    m_listener.onNotify = [this](OrvixNotifyParams& params) {
        if (params.GetID() == OrvixNotificationID::FilesConfirmed)
        {
            m_params.SetOptions(DialogOption::OptionChecked | DialogOption::OfferKeepCheckedOut);
        }
        return OrvixListenerAnswer::Accept;
    };
    EXPECT_EQ(Run(Operation::Notify | Operation::CheckIn), OperationResult::Done);
    EXPECT_EQ(m_log[3], "CheckIn [a] comment KeepCheckedOut");
}

TEST_F(OperationDialog, TakesTheCommentThatTheUserWrote)
{
    m_onDialog = [](OrvixFileListDialogParams& params) { params.SetComment(L"written"); };
    Run(Operation::Add | Operation::CheckIn | Operation::CheckOut);
    EXPECT_EQ(m_log, (Lines{"Dialog [a] EntriesCanBeCleared", "Add [a] written", "CheckIn [a] written",
                            "CheckOut [a] written"}));
}

TEST_F(OperationDialog, IgnoresTheProvidersResults)
{
    for (const int result : {OrvixProviderResult::Failure, OrvixProviderResult::NotOffered, 5, INT_MIN})
    {
        m_params.SetOptions(0);
        m_log.clear();
        m_provider.result = result;
        EXPECT_EQ(Run(Operation::Notify | Operation::Add | Operation::CheckIn), OperationResult::Done);
        EXPECT_EQ(m_log,
                  (Lines{"Notify BeforeCheckIn [a]", "Dialog [a] EntriesCanBeCleared", "Notify FilesConfirmed [a]",
                         "Add [a] comment", "CheckIn [a] comment", "Notify AfterCheckIn [a]"}));
    }
}

TEST_F(OperationDialog, ReturnsAnyOtherResultAndEndsThere)
{
    AddFile(L"b", State::Modified | State::Controlled);
    m_cleared = {"b"};
    for (const std::int32_t result : {2, 3, -1, INT_MAX, INT_MIN})
    {
        m_params.SetOptions(0);
        m_log.clear();
        m_dialogResult = result;
        EXPECT_EQ(Run(Operation::Notify | Operation::CheckIn), result);
        EXPECT_EQ(m_log, (Lines{"Notify BeforeCheckIn [a b]", "Dialog [a b] EntriesCanBeCleared"}));
    }
}

TEST_F(OperationDialog, RemembersNothingUnlessTheUserSaysSo)
{
    UsePrompts();
    AddPrompt(DialogPrompt, Action::Ask);
    AddPrompt(OptionPrompt, Action::Ask);
    Confirm(~DialogOption::RememberChecked);
    EXPECT_EQ(m_services->GetPromptAction(DialogPrompt), Action::Ask);
    EXPECT_EQ(m_services->GetPromptAction(OptionPrompt), Action::Ask);
}

TEST_F(OperationDialog, RemembersTheAnswerAndTheOptionForEveryResult)
{
    UsePrompts();
    AddPrompt(DialogPrompt, Action::Ask);
    AddPrompt(OptionPrompt, Action::Ask);
    const std::vector<std::pair<std::int32_t, std::uint32_t>> actionOfResult = {
        {DialogResult::Confirmed, Action::Yes},
        {DialogResult::Cancelled, Action::No},
        {DialogResult::Confirmed + 1, Action::No},
        {-1, Action::No}};
    for (const auto& [result, action] : actionOfResult)
    {
        for (const std::uint32_t option : {0U, DialogOption::OptionChecked})
        {
            m_services->SetPromptAction(DialogPrompt, Action::Ask);
            m_dialogResult = result;
            m_onDialog = [choice = DialogOption::RememberChecked | option](auto& params) { params.SetOptions(choice); };
            EXPECT_EQ(Run(Operation::CheckIn), result);
            EXPECT_EQ(m_services->GetPromptAction(DialogPrompt), action) << result;
            EXPECT_EQ(m_services->GetPromptAction(OptionPrompt),
                      option != 0 ? Action::OptionChecked : Action::OptionCleared)
                << result;
        }
    }
}

TEST_F(OperationDialog, RemembersTheAnswerOfAUserWhoClearedEverything)
{
    UsePrompts();
    AddPrompt(DialogPrompt, Action::Ask);
    AddPrompt(OptionPrompt, Action::Ask);
    m_cleared = {"a"};
    m_onDialog = [](OrvixFileListDialogParams& params) {
        params.SetOptions(DialogOption::RememberChecked | DialogOption::OptionChecked);
    };
    EXPECT_EQ(Run(Operation::CheckIn), OperationResult::Done);
    EXPECT_EQ(m_services->GetPromptAction(DialogPrompt), Action::Yes);
    EXPECT_EQ(m_services->GetPromptAction(OptionPrompt), Action::OptionChecked);
}

TEST_F(OperationDialog, RemembersOnlyForThePromptsOfTheRecord)
{
    AddPrompt(DialogPrompt, Action::Ask);
    AddPrompt(OptionPrompt, Action::Ask);
    AddPrompt(OrvixPromptID::None, Action::Ask);
    m_params.SetOptionPromptID(OptionPrompt);
    Confirm(DialogOption::RememberChecked | DialogOption::OptionChecked);
    EXPECT_EQ(m_services->GetPromptAction(DialogPrompt), Action::Ask);
    EXPECT_EQ(m_services->GetPromptAction(OptionPrompt), Action::OptionChecked);

    m_services->SetPromptAction(OptionPrompt, Action::Ask);
    m_params.SetOptionPromptID(OrvixPromptID::Unset);
    m_params.SetDialogPromptID(DialogPrompt);
    Confirm(DialogOption::RememberChecked | DialogOption::OptionChecked);
    EXPECT_EQ(m_services->GetPromptAction(DialogPrompt), Action::Yes);
    EXPECT_EQ(m_services->GetPromptAction(OptionPrompt), Action::Ask);
    EXPECT_EQ(m_services->GetPromptAction(OrvixPromptID::None), Action::Ask);
}

TEST_F(OperationDialog, RemembersNothingForALockedPrompt)
{
    UsePrompts();
    AddPrompt(DialogPrompt, Action::Ask, true);
    AddPrompt(OptionPrompt, Action::Ask);
    Confirm(DialogOption::RememberChecked);
    EXPECT_EQ(m_services->GetPromptAction(DialogPrompt), Action::Ask);
    EXPECT_EQ(m_services->GetPromptAction(OptionPrompt), Action::OptionCleared);
}

TEST_F(OperationDialog, IsNotShownAgainOnceTheAnswerIsRemembered)
{
    UsePrompts();
    AddPrompt(DialogPrompt, Action::Ask);
    AddPrompt(OptionPrompt, Action::Ask);
    EXPECT_EQ(Confirm(DialogOption::RememberChecked | DialogOption::OptionChecked | DialogOption::OfferKeepCheckedOut),
              "CheckIn [a] comment KeepCheckedOut");
    m_log.clear();
    EXPECT_EQ(Run(Operation::CheckIn), OperationResult::Done);
    EXPECT_EQ(m_log, (Lines{"CheckIn [a] comment KeepCheckedOut NoDialog"}));
}

TEST_F(OperationDialog, IsNotShownAgainOnceACancelIsRemembered)
{
    UsePrompts();
    AddPrompt(DialogPrompt, Action::Ask);
    m_dialogResult = DialogResult::Cancelled;
    m_params.SetOptions(DialogOption::RememberChecked);
    EXPECT_EQ(Run(Operation::CheckIn), OperationResult::Cancelled);
    EXPECT_EQ(Run(Operation::CheckIn), OperationResult::Cancelled);
    EXPECT_EQ(m_script.fileLists.size(), 1U);
}

} // namespace
