#include "DialogTest.h"

#include <climits>
#include <stdexcept>
#include <utility>
#include <vector>

namespace
{

constexpr std::uint32_t OfferDoNotAsk = 0x100;
constexpr std::uint32_t Prompt = 7;

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

    std::int32_t m_answer = 1;
    bool m_userStopsAsking = false;
    bool m_flagOnEntry = true;
    bool m_dontAskAgain = false;
};

/// The answer that a stored action stands for, written out for every combination of the answer bits.
constexpr std::int32_t AnswerOfBits[16] = {
    0, // none
    1, // 0x2
    0, // 0x4
    1, // 0x2 0x4
    2, // 0x8
    1, // 0x2 0x8
    2, // 0x4 0x8
    1, // 0x2 0x4 0x8
    3, // 0x10
    1, // 0x2 0x10
    3, // 0x4 0x10
    1, // 0x2 0x4 0x10
    2, // 0x8 0x10
    1, // 0x2 0x8 0x10
    2, // 0x4 0x8 0x10
    1, // all
};

TEST_F(ShowPrompt, AnswersFromTheStoredActionByPrecedenceWithoutADialog)
{
    for (std::uint32_t bits = 0; bits < 16; ++bits)
    {
        AddPrompt(1000 + bits, bits << 1);
        m_dontAskAgain = false;
        EXPECT_EQ(Show(OfferDoNotAsk, 1000 + bits), AnswerOfBits[bits]) << bits;
        EXPECT_TRUE(m_dontAskAgain) << bits;
    }
    EXPECT_TRUE(m_script.prompts.empty());
}

TEST_F(ShowPrompt, AnswersForAnUnattendedHostEvenWhereTheAskBitIsSet)
{
    m_host.unattended = true;
    for (std::uint32_t bits = 0; bits < 16; ++bits)
    {
        AddPrompt(1000 + bits, bits << 1 | Ask);
        EXPECT_EQ(Show(OfferDoNotAsk, 1000 + bits), AnswerOfBits[bits]) << bits;
    }
    EXPECT_TRUE(m_script.prompts.empty());
}

TEST_F(ShowPrompt, IgnoresActionBitsWithoutMeaning)
{
    AddPrompt(Prompt, 0xFFFFFFE0);
    EXPECT_EQ(Show(), 0);
    EXPECT_TRUE(m_script.prompts.empty());
}

TEST_F(ShowPrompt, AnswersZeroForAPromptWithoutARow)
{
    EXPECT_EQ(Show(), 0);
    EXPECT_TRUE(m_dontAskAgain);
    EXPECT_TRUE(m_script.prompts.empty());
}

TEST_F(ShowPrompt, TellsAnUnattendedHostOnlyOfAnswersThatAreNotAsked)
{
    m_host.unattended = true;
    AddPrompt(Prompt, Ask | AnswerOne);
    EXPECT_EQ(Show(), 1);
    EXPECT_FALSE(m_dontAskAgain);
    m_dontAskAgain = true;
    EXPECT_EQ(Show(), 1);
    EXPECT_TRUE(m_dontAskAgain);

    m_dontAskAgain = false;
    AddPrompt(Prompt + 1, AnswerOne);
    EXPECT_EQ(Show(0, Prompt + 1), 1);
    EXPECT_TRUE(m_dontAskAgain);
}

TEST_F(ShowPrompt, HandsTheArgumentsToTheDialogUnchanged)
{
    AddPrompt(Prompt, Ask);
    Show(0xFFFFFFFF);
    ASSERT_EQ(m_script.prompts.size(), 1U);
    const CoreUIScript::Prompt& call = m_script.prompts.front();
    EXPECT_EQ(call.a, Token(1));
    EXPECT_EQ(call.b, Token(2));
    EXPECT_EQ(call.c, Token(3));
    EXPECT_EQ(call.options, 0xFFFFFFFF);
    EXPECT_NE(call.dontAskAgain, &m_dontAskAgain);
}

TEST_F(ShowPrompt, ReturnsTheDialogsAnswer)
{
    AddPrompt(Prompt, Ask | AnswerOne);
    for (const std::int32_t answer : {0, 1, 2, 3, 4, -1, INT_MAX, INT_MIN})
    {
        m_answer = answer;
        EXPECT_EQ(Show(), answer);
    }
}

TEST_F(ShowPrompt, ShowsTheDialogWhereTheHostGaveNoClientAccess)
{
    Initialize(nullptr);
    AddPrompt(Prompt, Ask);
    EXPECT_EQ(Show(), 1);
    EXPECT_EQ(m_script.prompts.size(), 1U);
}

TEST_F(ShowPrompt, StartsTheDialogWithAskingAndReportsItsChoice)
{
    AddPrompt(Prompt, Ask);
    m_dontAskAgain = true;
    Show();
    EXPECT_FALSE(m_flagOnEntry);
    EXPECT_FALSE(m_dontAskAgain);

    m_userStopsAsking = true;
    Show();
    EXPECT_TRUE(m_dontAskAgain);
}

TEST_F(ShowPrompt, TakesNoPlaceForTheChoice)
{
    AddPrompt(Prompt, AnswerTwo);
    EXPECT_EQ(m_services->ShowPrompt(nullptr, nullptr, nullptr, 0, Prompt, nullptr), 2);

    AddPrompt(Prompt + 1, Ask);
    m_userStopsAsking = true;
    EXPECT_EQ(m_services->ShowPrompt(nullptr, nullptr, nullptr, OfferDoNotAsk, Prompt + 1, nullptr), 1);
    EXPECT_EQ(m_services->GetPromptAction(Prompt + 1), AnswerOne);
}

TEST_F(ShowPrompt, StoresTheAnswerWhereTheUserStopsAsking)
{
    const std::vector<std::pair<std::int32_t, std::uint32_t>> actionOfAnswer = {
        {1, AnswerOne}, {0, AnswerZero}, {2, AnswerTwo}, {3, AnswerThree}, {4, AnswerThree}, {-1, AnswerThree}};
    m_userStopsAsking = true;
    for (const auto& [answer, action] : actionOfAnswer)
    {
        const auto id = static_cast<std::uint32_t>(1000 + answer);
        AddPrompt(id, Ask);
        m_answer = answer;
        EXPECT_EQ(Show(OfferDoNotAsk, id), answer);
        EXPECT_EQ(m_services->GetPromptAction(id), action) << answer;
    }
}

TEST_F(ShowPrompt, StoresNothingWhereTheUserGoesOnBeingAsked)
{
    AddPrompt(Prompt, Ask | AnswerTwo);
    Show(OfferDoNotAsk);
    EXPECT_EQ(m_services->GetPromptAction(Prompt), Ask | AnswerTwo);
}

TEST_F(ShowPrompt, StoresNothingWhereTheHostDoesNotOfferIt)
{
    AddPrompt(Prompt, Ask);
    m_userStopsAsking = true;
    Show(~OfferDoNotAsk);
    EXPECT_EQ(m_services->GetPromptAction(Prompt), Ask);
    EXPECT_TRUE(m_dontAskAgain);
}

TEST_F(ShowPrompt, OffersNothingForALockedPrompt)
{
    AddPrompt(Prompt, Ask, true);
    m_userStopsAsking = true;
    EXPECT_EQ(Show(0xFFFFFFFF), 1);
    ASSERT_EQ(m_script.prompts.size(), 1U);
    EXPECT_EQ(m_script.prompts.front().options, ~OfferDoNotAsk);
    EXPECT_EQ(m_services->GetPromptAction(Prompt), Ask);
    EXPECT_TRUE(m_dontAskAgain);
}

TEST_F(ShowPrompt, AnswersFromALockedPrompt)
{
    AddPrompt(Prompt, AnswerThree, true);
    EXPECT_EQ(Show(OfferDoNotAsk), 3);
    EXPECT_TRUE(m_script.prompts.empty());
}

TEST_F(ShowPrompt, ReadsTheFirstRowOfAnIdAndWritesTheLast)
{
    AddPrompt(Prompt, Ask);
    AddPrompt(Prompt, AnswerThree);
    m_userStopsAsking = true;
    EXPECT_EQ(Show(OfferDoNotAsk), 1);
    EXPECT_EQ(m_services->GetPromptAction(Prompt), Ask);
    EXPECT_EQ(LastAction(Prompt), AnswerOne);
}

TEST_F(ShowPrompt, TakesTheLockFromTheFirstRowOfAnId)
{
    AddPrompt(Prompt, Ask, true);
    AddPrompt(Prompt, AnswerThree);
    m_userStopsAsking = true;
    Show(OfferDoNotAsk);
    EXPECT_EQ(m_script.prompts.front().options, 0U);
    EXPECT_EQ(LastAction(Prompt), AnswerThree);
}

TEST_F(ShowPrompt, LeavesALockedLastRowAlone)
{
    AddPrompt(Prompt, Ask);
    AddPrompt(Prompt, AnswerThree, true);
    m_userStopsAsking = true;
    Show(OfferDoNotAsk);
    EXPECT_EQ(m_script.prompts.front().options, OfferDoNotAsk);
    EXPECT_EQ(m_services->GetPromptAction(Prompt), Ask);
    EXPECT_EQ(LastAction(Prompt), AnswerThree);
}

TEST_F(ShowPrompt, AlwaysAsksAQuestionWithoutAPrompt)
{
    // A row that carries the number for "no prompt" is not looked at either.
    AddPrompt(NoPrompt, AnswerTwo, true);
    m_host.unattended = true;
    m_userStopsAsking = true;
    EXPECT_EQ(Show(OfferDoNotAsk, NoPrompt), 1);
    ASSERT_EQ(m_script.prompts.size(), 1U);
    EXPECT_EQ(m_script.prompts.front().options, OfferDoNotAsk);
    EXPECT_TRUE(m_dontAskAgain);
}

TEST_F(ShowPrompt, StoresNothingForAQuestionWithoutAPrompt)
{
    AddPrompt(NoPrompt, AnswerTwo);
    m_userStopsAsking = true;
    Show(OfferDoNotAsk, NoPrompt);
    EXPECT_EQ(LastAction(NoPrompt), AnswerTwo);
}

TEST_F(ShowPrompt, GivesZeroWhereTheDialogThrowsAndAsksAgainLater)
{
    AddPrompt(Prompt, Ask);
    auto dialog = m_script.onPrompt;
    m_script.onPrompt = [](const CoreUIScript::Prompt&) -> std::int32_t { throw std::runtime_error("dialog"); };
    EXPECT_EQ(Show(OfferDoNotAsk), 0);
    m_script.onPrompt = dialog;
    EXPECT_EQ(Show(OfferDoNotAsk), 1);
}

} // namespace
