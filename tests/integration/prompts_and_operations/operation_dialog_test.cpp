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
        EXPECT_EQ(Run(CheckIn), 1);
        return m_log.back();
    }
};

TEST_F(OperationDialog, GetsTheHostsArgumentsUnchanged)
{
    m_services->RunFileListOperation(Token(9), &m_params, false, &m_provider, CheckIn, Controlled);
    ASSERT_EQ(m_script.fileLists.size(), 1U);
    EXPECT_EQ(m_script.fileLists.front().a, Token(9));
    EXPECT_EQ(m_script.fileLists.front().params, &m_params);
}

TEST_F(OperationDialog, GetsOneMoreOptionBitAndKeepsTheOthers)
{
    m_params.SetOptions(0xFFFFFF7E);
    Run(CheckIn);
    EXPECT_EQ(m_log.front(), "Dialog [a] ffffff7f");
    EXPECT_EQ(m_params.GetOptions(), 0xFFFFFF7FU);
}

TEST_F(OperationDialog, OffersToRememberUnlessThePromptIsLocked)
{
    m_params.SetDialogPromptID(DialogPrompt);
    AddPrompt(DialogPrompt, Ask);
    m_params.SetOptions(OfferRemember | KeepOption);
    Run(CheckIn);
    EXPECT_EQ(m_log.front(), "Dialog [a] 45");

    m_params.SetDialogPromptID(DialogPrompt + 1);
    AddPrompt(DialogPrompt + 1, Ask, true);
    m_log.clear();
    Run(CheckIn);
    EXPECT_EQ(m_log.front(), "Dialog [a] 5");
}

TEST_F(OperationDialog, TakesTheLockFromTheFirstRowOfAnId)
{
    m_params.SetDialogPromptID(DialogPrompt);
    AddPrompt(DialogPrompt, Ask);
    AddPrompt(DialogPrompt, Ask, true);
    m_params.SetOptions(OfferRemember);
    Run(CheckIn);
    EXPECT_EQ(m_log.front(), "Dialog [a] 41");
}

TEST_F(OperationDialog, LooksForNoLockWhereNoPromptIsNamed)
{
    AddPrompt(NoPrompt, Ask, true);
    m_params.SetOptionPromptID(OptionPrompt);
    AddPrompt(OptionPrompt, Ask, true);
    m_params.SetOptions(OfferRemember);
    Run(CheckIn);
    EXPECT_EQ(m_log.front(), "Dialog [a] 41");
}

TEST_F(OperationDialog, DropsTheEntriesThatTheUserUnticked)
{
    for (const wchar_t* name : {L"b", L"c", L"d", L"e"})
    {
        AddFile(name);
    }
    m_unticked = {"a", "b", "d"};
    EXPECT_EQ(Run(CheckIn), 1);
    EXPECT_EQ(m_log, (Lines{"Dialog [a b c d e] 1", "CheckIn [c e] comment 0"}));
    EXPECT_EQ(m_list.NumEntries(), 5U);
}

TEST_F(OperationDialog, DropsEveryOccurrenceOfAnUntickedEntryThatIsListedTwice)
{
    OrvixFileEntry& unticked = AddFile(L"b");
    m_list.AddActiveEntry(&unticked);
    m_unticked = {"b"};
    EXPECT_EQ(Run(CheckIn), 1);
    EXPECT_EQ(m_log, (Lines{"Dialog [a b b] 1", "CheckIn [a] comment 0"}));
}

TEST_F(OperationDialog, EndsWithoutTheProviderWhereTheUserUntickedEverything)
{
    m_unticked = {"a"};
    EXPECT_EQ(Run(CheckIn), 1);
    EXPECT_EQ(m_log, (Lines{"Dialog [a] 1"}));
    EXPECT_EQ(ActiveNames(&m_list), "[]");
}

TEST_F(OperationDialog, KeepsUntickedEntriesActiveWhereTheUserCancels)
{
    AddFile(L"b");
    m_unticked = {"b"};
    m_dialogResult = 0;
    EXPECT_EQ(Run(CheckIn), 0);
    EXPECT_EQ(ActiveNames(&m_list), "[a b]");
}

TEST_F(OperationDialog, TellsTheProviderOfATickedOption)
{
    EXPECT_EQ(Confirm(0), "CheckIn [a] comment 0");
    EXPECT_EQ(Confirm(KeepOption | LatestOption), "CheckIn [a] comment 0");
    EXPECT_EQ(Confirm(OptionTicked), "CheckIn [a] comment 0");
    EXPECT_EQ(Confirm(OptionTicked | KeepOption), "CheckIn [a] comment 1");
    EXPECT_EQ(Confirm(OptionTicked | LatestOption), "CheckIn [a] comment 2");
    EXPECT_EQ(Confirm(OptionTicked | KeepOption | LatestOption), "CheckIn [a] comment 1");
}

TEST_F(OperationDialog, TellsEveryOperationOfTheProviderTheSameOption)
{
    m_params.SetOptions(OptionTicked | LatestOption);
    EXPECT_EQ(Run(Add | CheckIn | GetLatest | CheckOut | UndoCheckOut), 1);
    EXPECT_EQ(m_log, (Lines{"Dialog [a] 19", "Add [a] comment 2", "CheckIn [a] comment 2", "GetLatest [a] 2",
                            "CheckOut [a] comment 2", "UndoCheckOut [a] 2"}));
}

TEST_F(OperationDialog, TakesTheOptionAsItStandsAfterTheNotification)
{
    m_listener.onNotify = [this](OrvixNotifyParams& params) {
        if (params.GetID() == 27)
        {
            m_params.SetOptions(OptionTicked | KeepOption);
        }
        return 0;
    };
    EXPECT_EQ(Run(Notify | CheckIn), 1);
    EXPECT_EQ(m_log[3], "CheckIn [a] comment 1");
}

TEST_F(OperationDialog, TakesTheCommentThatTheUserWrote)
{
    m_onDialog = [](OrvixFileListDialogParams& params) { params.SetComment(L"written"); };
    Run(Add | CheckIn | CheckOut);
    EXPECT_EQ(m_log, (Lines{"Dialog [a] 1", "Add [a] written 0", "CheckIn [a] written 0", "CheckOut [a] written 0"}));
}

TEST_F(OperationDialog, IgnoresTheProvidersResults)
{
    for (const int result : {-1, -2, 5, INT_MIN})
    {
        m_params.SetOptions(0);
        m_log.clear();
        m_provider.result = result;
        EXPECT_EQ(Run(Notify | Add | CheckIn), 1);
        EXPECT_EQ(m_log, (Lines{"Notify 13 [a]", "Dialog [a] 1", "Notify 27 [a]", "Add [a] comment 0",
                                "CheckIn [a] comment 0", "Notify 14 [a]"}));
    }
}

TEST_F(OperationDialog, ReturnsAnyOtherResultAndEndsThere)
{
    AddFile(L"b", 0x80 | Controlled);
    m_unticked = {"b"};
    for (const std::int32_t result : {2, 3, -1, INT_MAX, INT_MIN})
    {
        m_params.SetOptions(0);
        m_log.clear();
        m_dialogResult = result;
        EXPECT_EQ(Run(Notify | CheckIn), result);
        EXPECT_EQ(m_log, (Lines{"Notify 13 [a b]", "Dialog [a b] 1"}));
    }
}

TEST_F(OperationDialog, RemembersNothingUnlessTheUserSaysSo)
{
    UsePrompts();
    AddPrompt(DialogPrompt, Ask);
    AddPrompt(OptionPrompt, Ask);
    Confirm(~Remember);
    EXPECT_EQ(m_services->GetPromptAction(DialogPrompt), Ask);
    EXPECT_EQ(m_services->GetPromptAction(OptionPrompt), Ask);
}

TEST_F(OperationDialog, RemembersTheAnswerAndTheOptionForEveryResult)
{
    UsePrompts();
    AddPrompt(DialogPrompt, Ask);
    AddPrompt(OptionPrompt, Ask);
    const std::vector<std::pair<std::int32_t, std::uint32_t>> actionOfResult = {
        {1, AnswerOne}, {0, AnswerZero}, {2, AnswerZero}, {-1, AnswerZero}};
    for (const auto& [result, action] : actionOfResult)
    {
        for (const std::uint32_t option : {0U, OptionTicked})
        {
            m_services->SetPromptAction(DialogPrompt, Ask);
            m_dialogResult = result;
            m_onDialog = [choice = Remember | option](auto& params) { params.SetOptions(choice); };
            EXPECT_EQ(Run(CheckIn), result);
            EXPECT_EQ(m_services->GetPromptAction(DialogPrompt), action) << result;
            EXPECT_EQ(m_services->GetPromptAction(OptionPrompt), option != 0 ? AnswerTwo : AnswerThree) << result;
        }
    }
}

TEST_F(OperationDialog, RemembersTheAnswerOfAUserWhoUntickedEverything)
{
    UsePrompts();
    AddPrompt(DialogPrompt, Ask);
    AddPrompt(OptionPrompt, Ask);
    m_unticked = {"a"};
    m_onDialog = [](OrvixFileListDialogParams& params) { params.SetOptions(Remember | OptionTicked); };
    EXPECT_EQ(Run(CheckIn), 1);
    EXPECT_EQ(m_services->GetPromptAction(DialogPrompt), AnswerOne);
    EXPECT_EQ(m_services->GetPromptAction(OptionPrompt), AnswerTwo);
}

TEST_F(OperationDialog, RemembersForThePromptsThatAreNamedOnly)
{
    AddPrompt(DialogPrompt, Ask);
    AddPrompt(OptionPrompt, Ask);
    AddPrompt(NoPrompt, Ask);
    m_params.SetOptionPromptID(OptionPrompt);
    Confirm(Remember | OptionTicked);
    EXPECT_EQ(m_services->GetPromptAction(DialogPrompt), Ask);
    EXPECT_EQ(m_services->GetPromptAction(OptionPrompt), AnswerTwo);

    m_services->SetPromptAction(OptionPrompt, Ask);
    m_params.SetOptionPromptID(-1);
    m_params.SetDialogPromptID(DialogPrompt);
    Confirm(Remember | OptionTicked);
    EXPECT_EQ(m_services->GetPromptAction(DialogPrompt), AnswerOne);
    EXPECT_EQ(m_services->GetPromptAction(OptionPrompt), Ask);
    EXPECT_EQ(m_services->GetPromptAction(NoPrompt), Ask);
}

TEST_F(OperationDialog, RemembersNothingForALockedPrompt)
{
    UsePrompts();
    AddPrompt(DialogPrompt, Ask, true);
    AddPrompt(OptionPrompt, Ask);
    Confirm(Remember);
    EXPECT_EQ(m_services->GetPromptAction(DialogPrompt), Ask);
    EXPECT_EQ(m_services->GetPromptAction(OptionPrompt), AnswerThree);
}

TEST_F(OperationDialog, IsNotShownAgainOnceTheAnswerIsRemembered)
{
    UsePrompts();
    AddPrompt(DialogPrompt, Ask);
    AddPrompt(OptionPrompt, Ask);
    EXPECT_EQ(Confirm(Remember | OptionTicked | KeepOption), "CheckIn [a] comment 1");
    m_log.clear();
    EXPECT_EQ(Run(CheckIn), 1);
    EXPECT_EQ(m_log, (Lines{"CheckIn [a] comment 5"}));
}

TEST_F(OperationDialog, IsNotShownAgainOnceACancelIsRemembered)
{
    UsePrompts();
    AddPrompt(DialogPrompt, Ask);
    m_dialogResult = 0;
    m_params.SetOptions(Remember);
    EXPECT_EQ(Run(CheckIn), 0);
    EXPECT_EQ(Run(CheckIn), 0);
    EXPECT_EQ(m_script.fileLists.size(), 1U);
}

} // namespace
