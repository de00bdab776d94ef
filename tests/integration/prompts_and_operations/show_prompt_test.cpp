#include "DialogTest.h"

#include <climits>
#include <iterator>
#include <stdexcept>
#include <utility>
#include <vector>

using OrvixPromptOption::OfferStopAsking;

namespace
{

constexpr std::uint32_t Prompt = 7;
constexpr std::uint32_t FirstOfMany = 1000;
constexpr std::int32_t NoAnswer = Answer::NoToAll + 1;

class ShowPrompt : public DialogTest
{
protected:
    ShowPrompt()
    {
        m_script.onPrompt = [this](const CoreUIScript::Prompt& call) {
            m_flagOnEntry = *call.dontAskAgain;
            *call.dontAskAgain = m_userStopsAsking;
            return m_answer;
        };
    }

    std::int32_t Show(std::uint32_t options = 0, std::uint32_t promptID = Prompt)
    {
        return m_services->ShowPrompt(Token(1), Token(2), Token(3), options, promptID, &m_dontAskAgain);
    }

    std::int32_t m_answer = Answer::Yes;
    bool m_userStopsAsking = false;
    bool m_flagOnEntry = true;
    bool m_dontAskAgain = false;
};

constexpr std::uint32_t AnswerBits[] = {Action::Yes, Action::No, Action::YesToAll, Action::NoToAll};
constexpr unsigned int Combinations = 1U << std::size(AnswerBits);

/// A stored action with some of the answer bits: the n-th one is set where the n-th bit of `combination` is.
constexpr std::uint32_t ActionOf(unsigned int combination)
{
    std::uint32_t action = 0;
    for (std::size_t n = 0; n < std::size(AnswerBits); ++n)
    {
        action |= (combination >> n & 1U) != 0 ? AnswerBits[n] : 0;
    }
    return action;
}

/// The answer of each combination.
constexpr std::int32_t AnswerOf[Combinations] = {
    Answer::No,       // no bit
    Answer::Yes,      // Yes
    Answer::No,       // No
    Answer::Yes,      // Yes, No
    Answer::YesToAll, // YesToAll
    Answer::Yes,      // Yes, YesToAll
    Answer::YesToAll, // No, YesToAll
    Answer::Yes,      // Yes, No, YesToAll
    Answer::NoToAll,  // NoToAll
    Answer::Yes,      // Yes, NoToAll
    Answer::NoToAll,  // No, NoToAll
    Answer::Yes,      // Yes, No, NoToAll
    Answer::YesToAll, // YesToAll, NoToAll
    Answer::Yes,      // Yes, YesToAll, NoToAll
    Answer::YesToAll, // No, YesToAll, NoToAll
    Answer::Yes,      // all
};

TEST_F(ShowPrompt, AnswersFromTheStoredActionByPrecedenceWithoutADialog)
{
    for (unsigned int n = 0; n < Combinations; ++n)
    {
        AddPrompt(FirstOfMany + n, ActionOf(n));
        m_dontAskAgain = false;
        EXPECT_EQ(Show(OfferStopAsking, FirstOfMany + n), AnswerOf[n]) << n;
        EXPECT_TRUE(m_dontAskAgain) << n;
    }
    EXPECT_TRUE(m_script.prompts.empty());
}

TEST_F(ShowPrompt, AnswersForAnUnattendedHostEvenWhenTheAskBitIsSet)
{
    m_host.unattended = true;
    for (unsigned int n = 0; n < Combinations; ++n)
    {
        AddPrompt(FirstOfMany + n, ActionOf(n) | Action::Ask);
        EXPECT_EQ(Show(OfferStopAsking, FirstOfMany + n), AnswerOf[n]) << n;
    }
    EXPECT_TRUE(m_script.prompts.empty());
}

TEST_F(ShowPrompt, IgnoresActionBitsWithoutMeaning)
{
    AddPrompt(Prompt, AllBits & ~Action::Ask & ~ActionOf(Combinations - 1));
    EXPECT_EQ(Show(), Answer::No);
    EXPECT_TRUE(m_script.prompts.empty());
}

TEST_F(ShowPrompt, AnswersNoForAPromptWithoutARow)
{
    EXPECT_EQ(Show(), Answer::No);
    EXPECT_TRUE(m_dontAskAgain);
    EXPECT_TRUE(m_script.prompts.empty());
}

TEST_F(ShowPrompt, ReportsDontAskAgainToAnUnattendedHostOnlyWithoutTheAskBit)
{
    m_host.unattended = true;
    AddPrompt(Prompt, Action::Ask | Action::Yes);
    EXPECT_EQ(Show(), Answer::Yes);
    EXPECT_FALSE(m_dontAskAgain);
    m_dontAskAgain = true;
    EXPECT_EQ(Show(), Answer::Yes);
    EXPECT_TRUE(m_dontAskAgain);

    m_dontAskAgain = false;
    AddPrompt(Prompt + 1, Action::Yes);
    EXPECT_EQ(Show(0, Prompt + 1), Answer::Yes);
    EXPECT_TRUE(m_dontAskAgain);
}

TEST_F(ShowPrompt, PassesItsArgumentsToTheDialog)
{
    AddPrompt(Prompt, Action::Ask);
    Show(AllBits);
    ASSERT_EQ(m_script.prompts.size(), 1U);
    const CoreUIScript::Prompt& call = m_script.prompts.front();
    EXPECT_EQ(call.a, Token(1));
    EXPECT_EQ(call.b, Token(2));
    EXPECT_EQ(call.c, Token(3));
    EXPECT_EQ(call.options, AllBits);
    EXPECT_NE(call.dontAskAgain, &m_dontAskAgain);
}

TEST_F(ShowPrompt, ReturnsTheDialogsAnswer)
{
    AddPrompt(Prompt, Action::Ask | Action::Yes);
    for (const std::int32_t answer :
         {Answer::No, Answer::Yes, Answer::YesToAll, Answer::NoToAll, NoAnswer, -1, INT_MAX, INT_MIN})
    {
        m_answer = answer;
        EXPECT_EQ(Show(), answer);
    }
}

TEST_F(ShowPrompt, ShowsTheDialogWhenTheHostGaveNoClientAccess)
{
    Initialize(nullptr);
    AddPrompt(Prompt, Action::Ask);
    EXPECT_EQ(Show(), Answer::Yes);
    EXPECT_EQ(m_script.prompts.size(), 1U);
}

TEST_F(ShowPrompt, StartsTheDialogWithoutDontAskAgainAndReportsTheChoice)
{
    AddPrompt(Prompt, Action::Ask);
    m_dontAskAgain = true;
    Show();
    EXPECT_FALSE(m_flagOnEntry);
    EXPECT_FALSE(m_dontAskAgain);

    m_userStopsAsking = true;
    Show();
    EXPECT_TRUE(m_dontAskAgain);
}

TEST_F(ShowPrompt, TakesNullForDontAskAgain)
{
    AddPrompt(Prompt, Action::YesToAll);
    EXPECT_EQ(m_services->ShowPrompt(nullptr, nullptr, nullptr, 0, Prompt, nullptr), Answer::YesToAll);

    AddPrompt(Prompt + 1, Action::Ask);
    m_userStopsAsking = true;
    EXPECT_EQ(m_services->ShowPrompt(nullptr, nullptr, nullptr, OfferStopAsking, Prompt + 1, nullptr), Answer::Yes);
    EXPECT_EQ(m_services->GetPromptAction(Prompt + 1), Action::Yes);
}

TEST_F(ShowPrompt, StoresTheAnswerWhenTheUserStopsAsking)
{
    const std::vector<std::pair<std::int32_t, std::uint32_t>> actionOfAnswer = {
        {Answer::Yes, Action::Yes},         {Answer::No, Action::No},    {Answer::YesToAll, Action::YesToAll},
        {Answer::NoToAll, Action::NoToAll}, {NoAnswer, Action::NoToAll}, {-1, Action::NoToAll}};
    m_userStopsAsking = true;
    for (const auto& [answer, action] : actionOfAnswer)
    {
        const auto id = FirstOfMany + static_cast<std::uint32_t>(answer);
        AddPrompt(id, Action::Ask);
        m_answer = answer;
        EXPECT_EQ(Show(OfferStopAsking, id), answer);
        EXPECT_EQ(m_services->GetPromptAction(id), action) << answer;
    }
}

TEST_F(ShowPrompt, StoresNothingWhenTheUserWantsToBeAsked)
{
    AddPrompt(Prompt, Action::Ask | Action::YesToAll);
    Show(OfferStopAsking);
    EXPECT_EQ(m_services->GetPromptAction(Prompt), Action::Ask | Action::YesToAll);
}

TEST_F(ShowPrompt, StoresNothingWhenTheHostDoesNotOfferIt)
{
    AddPrompt(Prompt, Action::Ask);
    m_userStopsAsking = true;
    Show(~OfferStopAsking);
    EXPECT_EQ(m_services->GetPromptAction(Prompt), Action::Ask);
    EXPECT_TRUE(m_dontAskAgain);
}

TEST_F(ShowPrompt, DoesNotOfferToStopAskingForALockedPrompt)
{
    AddPrompt(Prompt, Action::Ask, true);
    m_userStopsAsking = true;
    EXPECT_EQ(Show(AllBits), Answer::Yes);
    ASSERT_EQ(m_script.prompts.size(), 1U);
    EXPECT_EQ(m_script.prompts.front().options, ~OfferStopAsking);
    EXPECT_EQ(m_services->GetPromptAction(Prompt), Action::Ask);
    EXPECT_TRUE(m_dontAskAgain);
}

TEST_F(ShowPrompt, AnswersFromALockedPrompt)
{
    AddPrompt(Prompt, Action::NoToAll, true);
    EXPECT_EQ(Show(OfferStopAsking), Answer::NoToAll);
    EXPECT_TRUE(m_script.prompts.empty());
}

TEST_F(ShowPrompt, ReadsTheFirstRowOfAnIDAndWritesTheLast)
{
    AddPrompt(Prompt, Action::Ask);
    AddPrompt(Prompt, Action::NoToAll);
    m_userStopsAsking = true;
    EXPECT_EQ(Show(OfferStopAsking), Answer::Yes);
    EXPECT_EQ(m_services->GetPromptAction(Prompt), Action::Ask);
    EXPECT_EQ(LastAction(Prompt), Action::Yes);
}

TEST_F(ShowPrompt, TakesTheLockFromTheFirstRowOfAnID)
{
    AddPrompt(Prompt, Action::Ask, true);
    AddPrompt(Prompt, Action::NoToAll);
    m_userStopsAsking = true;
    Show(OfferStopAsking);
    EXPECT_EQ(m_script.prompts.front().options, 0U);
    EXPECT_EQ(LastAction(Prompt), Action::NoToAll);
}

TEST_F(ShowPrompt, DoesNotWriteALockedLastRow)
{
    AddPrompt(Prompt, Action::Ask);
    AddPrompt(Prompt, Action::NoToAll, true);
    m_userStopsAsking = true;
    Show(OfferStopAsking);
    EXPECT_EQ(m_script.prompts.front().options, OfferStopAsking);
    EXPECT_EQ(m_services->GetPromptAction(Prompt), Action::Ask);
    EXPECT_EQ(LastAction(Prompt), Action::NoToAll);
}

TEST_F(ShowPrompt, AlwaysAsksAQuestionWithoutAPrompt)
{
    // A row with the ID that means "no prompt" does not count either.
    AddPrompt(OrvixPromptID::None, Action::YesToAll, true);
    m_host.unattended = true;
    m_userStopsAsking = true;
    EXPECT_EQ(Show(OfferStopAsking, OrvixPromptID::None), Answer::Yes);
    ASSERT_EQ(m_script.prompts.size(), 1U);
    EXPECT_EQ(m_script.prompts.front().options, OfferStopAsking);
    EXPECT_TRUE(m_dontAskAgain);
}

TEST_F(ShowPrompt, StoresNothingForAQuestionWithoutAPrompt)
{
    AddPrompt(OrvixPromptID::None, Action::YesToAll);
    m_userStopsAsking = true;
    Show(OfferStopAsking, OrvixPromptID::None);
    EXPECT_EQ(LastAction(OrvixPromptID::None), Action::YesToAll);
}

TEST_F(ShowPrompt, AnswersNoWhenTheDialogThrowsAndAsksAgainLater)
{
    AddPrompt(Prompt, Action::Ask);
    auto dialog = m_script.onPrompt;
    m_script.onPrompt = [](const CoreUIScript::Prompt&) -> std::int32_t { throw std::runtime_error("dialog"); };
    EXPECT_EQ(Show(OfferStopAsking), Answer::No);
    m_script.onPrompt = dialog;
    EXPECT_EQ(Show(OfferStopAsking), Answer::Yes);
}

} // namespace
