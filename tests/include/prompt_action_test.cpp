#include "OrvixPrompt.h"

#include <gtest/gtest.h>

#include <climits>

namespace Action = OrvixPromptAction;
namespace Answer = OrvixPromptAnswer;

TEST(PromptActionToAnswer, TakesYesBeforeYesToAllBeforeNoToAll)
{
    EXPECT_EQ(Action::ToAnswer(Action::Yes), Answer::Yes);
    EXPECT_EQ(Action::ToAnswer(Action::YesToAll), Answer::YesToAll);
    EXPECT_EQ(Action::ToAnswer(Action::NoToAll), Answer::NoToAll);
    EXPECT_EQ(Action::ToAnswer(Action::No), Answer::No);
    EXPECT_EQ(Action::ToAnswer(Action::Yes | Action::No | Action::YesToAll | Action::NoToAll), Answer::Yes);
    EXPECT_EQ(Action::ToAnswer(Action::No | Action::YesToAll | Action::NoToAll), Answer::YesToAll);
    EXPECT_EQ(Action::ToAnswer(Action::No | Action::NoToAll), Answer::NoToAll);
}

TEST(PromptActionToAnswer, IsNoWithoutAnAnswerAndIgnoresOtherBits)
{
    EXPECT_EQ(Action::ToAnswer(0), Answer::No);
    EXPECT_EQ(Action::ToAnswer(Action::Ask), Answer::No);
    constexpr std::uint32_t answers = Action::Yes | Action::YesToAll | Action::NoToAll;
    EXPECT_EQ(Action::ToAnswer(~answers), Answer::No);
}

TEST(PromptActionFromAnswer, StoresEachAnswerAsItsOwnBit)
{
    EXPECT_EQ(Action::FromAnswer(Answer::Yes), Action::Yes);
    EXPECT_EQ(Action::FromAnswer(Answer::No), Action::No);
    EXPECT_EQ(Action::FromAnswer(Answer::YesToAll), Action::YesToAll);
    EXPECT_EQ(Action::FromAnswer(Answer::NoToAll), Action::NoToAll);
}

TEST(PromptActionFromAnswer, StoresNoToAllForAValueThatIsNoAnswer)
{
    for (const std::int32_t value : {Answer::NoToAll + 1, -1, INT_MIN, INT_MAX})
    {
        EXPECT_EQ(Action::FromAnswer(value), Action::NoToAll) << value;
    }
}
