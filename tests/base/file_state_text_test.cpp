#include "FileStateText.h"

#include "OrvixFileFlags.h"

#include <gmock/gmock.h>
#include <gtest/gtest.h>

#include <string>
#include <vector>

using testing::ElementsAre;

namespace State = OrvixFileState;

namespace
{

constexpr bool Exists = true;
constexpr bool Missing = false;

std::vector<std::string> Keys(unsigned long flags, bool exists = Exists)
{
    const std::vector<const char*> keys = FileStateText::Keys(flags, exists);
    return {keys.begin(), keys.end()};
}

std::wstring Words(unsigned long flags, bool exists = Exists)
{
    return FileStateText::InWords(flags, exists);
}

} // namespace

TEST(FileStateText, WordsEachFactByItself)
{
    EXPECT_THAT(Keys(State::NotControlled), ElementsAre("not-controlled"));
    EXPECT_EQ(Words(State::NotControlled), L"not controlled");
    EXPECT_THAT(Keys(State::Controlled), ElementsAre("checked-in"));
    EXPECT_EQ(Words(State::Controlled), L"checked in");
    EXPECT_THAT(Keys(State::CheckedOut), ElementsAre("checked-out"));
    EXPECT_EQ(Words(State::CheckedOut), L"checked out");
    EXPECT_THAT(Keys(State::CheckedOutByOther), ElementsAre("checked-out-by-other"));
    EXPECT_EQ(Words(State::CheckedOutByOther), L"checked out by another user");
    EXPECT_THAT(Keys(State::Modified), ElementsAre("modified"));
    EXPECT_EQ(Words(State::Modified), L"modified");
    EXPECT_THAT(Keys(State::OutOfDate), ElementsAre("out-of-date"));
    EXPECT_EQ(Words(State::OutOfDate), L"out of date");
    EXPECT_THAT(Keys(State::Deleted), ElementsAre("deleted"));
    EXPECT_EQ(Words(State::Deleted), L"deleted in the project");
}

TEST(FileStateText, WordsTheFactsOfACombinationInOrderOfImportance)
{
    EXPECT_THAT(Keys(State::Controlled | State::CheckedOut | State::CheckedOutByOther | State::Modified |
                     State::OutOfDate | State::Deleted),
                ElementsAre("checked-out", "checked-out-by-other", "modified", "out-of-date", "deleted"));
    EXPECT_EQ(Words(State::Controlled | State::CheckedOut | State::CheckedOutByOther | State::Modified |
                    State::OutOfDate | State::Deleted),
              L"checked out, also by another user, modified, out of date, deleted in the project");
    EXPECT_THAT(Keys(State::Controlled | State::Modified), ElementsAre("checked-in", "modified"));
    EXPECT_EQ(Words(State::Controlled | State::Modified), L"checked in, modified");
}

TEST(FileStateText, SaysCheckedInOnlyOfAFileThatNobodyHasCheckedOut)
{
    EXPECT_THAT(Keys(State::Controlled | State::CheckedOut), ElementsAre("checked-out"));
    EXPECT_THAT(Keys(State::Controlled | State::CheckedOutByOther), ElementsAre("checked-out-by-other"));
}

TEST(FileStateText, SaysNothingElseOfAFileThatIsNotControlled)
{
    EXPECT_THAT(Keys(State::NotControlled | State::CheckedOut | State::Modified), ElementsAre("not-controlled"));
    EXPECT_EQ(Words(State::NotControlled | State::CheckedOut | State::Modified), L"not controlled");
}

TEST(FileStateText, BelievesControlledWhereAProviderSetsBothBits)
{
    EXPECT_THAT(Keys(State::NotControlled | State::Controlled), ElementsAre("checked-in"));
}

TEST(FileStateText, IsUnknownWithoutABitThatItKnows)
{
    constexpr unsigned long unpublishedState = 0x40;
    for (const unsigned long flags : {0UL, unpublishedState, OrvixFilePermission::CheckIn})
    {
        EXPECT_THAT(Keys(flags), ElementsAre("unknown")) << flags;
        EXPECT_EQ(Words(flags), L"unknown") << flags;
    }
}

TEST(FileStateText, SaysLastThatAFileIsMissingOnTheDisk)
{
    EXPECT_THAT(Keys(State::Controlled | State::Deleted, Missing), ElementsAre("checked-in", "deleted", "missing"));
    EXPECT_EQ(Words(State::Controlled | State::Deleted, Missing),
              L"checked in, deleted in the project, missing on disk");
    EXPECT_THAT(Keys(0, Missing), ElementsAre("unknown", "missing"));
    EXPECT_EQ(Words(0, Missing), L"unknown, missing on disk");
}

TEST(FileStateText, SaysThatThereIsNoSuchFileWhereItIsNotControlledEither)
{
    EXPECT_THAT(Keys(State::NotControlled, Missing), ElementsAre("not-controlled", "missing"));
    EXPECT_EQ(Words(State::NotControlled, Missing), L"no such file");
}
