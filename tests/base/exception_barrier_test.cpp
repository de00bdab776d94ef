#include "ExceptionBarrier.h"

#include <gtest/gtest.h>

#include <memory>
#include <new>
#include <stdexcept>

TEST(Completes, IsTrueWhenTheBodyReturnsWhichRunsOnce)
{
    int runs = 0;
    EXPECT_TRUE(Completes([&] { ++runs; }));
    EXPECT_EQ(runs, 1);
}

TEST(Completes, IsFalseWhateverIsThrown)
{
    EXPECT_FALSE(Completes([] { throw std::bad_alloc(); }));
    EXPECT_FALSE(Completes([] { throw std::runtime_error("text"); }));
    EXPECT_FALSE(Completes([] { throw 1; }));
    EXPECT_FALSE(Completes([] { throw _com_error(E_FAIL); }));
}

TEST(Completes, KeepsWhatTheBodyDidBeforeItThrew)
{
    int done = 0;
    EXPECT_FALSE(Completes([&] {
        done = 1;
        throw 1;
    }));
    EXPECT_EQ(done, 1);
}

TEST(Completes, TakesABodyThatCanOnlyBeMoved)
{
    EXPECT_TRUE(Completes([text = std::make_unique<int>(1)] { ++*text; }));
}

TEST(WithBarrier, GivesTheResultOfTheBody)
{
    EXPECT_EQ(WithBarrier(-1, [] { return 7; }), 7);
}

TEST(WithBarrier, GivesTheFailureValueWhateverIsThrown)
{
    EXPECT_EQ(WithBarrier(-1, []() -> int { throw std::bad_alloc(); }), -1);
    EXPECT_EQ(WithBarrier(-1, []() -> int { throw 1; }), -1);
    EXPECT_EQ(WithBarrier(-1, []() -> int { throw _com_error(E_FAIL); }), -1);
}

TEST(WithXmlBarrier, LetsAComErrorOutAndNothingElse)
{
    EXPECT_EQ(WithXmlBarrier(-1, [] { return 7; }), 7);
    EXPECT_EQ(WithXmlBarrier(-1, []() -> int { throw std::bad_alloc(); }), -1);
    EXPECT_THROW(WithXmlBarrier(-1, []() -> int { throw _com_error(E_FAIL); }), _com_error);
}
