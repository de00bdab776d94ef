#include "BraeDiagnostics.h"
#include "OrvixUserEntry.h"
#include "OrvixUserList.h"

#include <gtest/gtest.h>

#include <climits>
#include <string>
#include <vector>

namespace
{

/// A user of the host's own making; its getters write down that they were called.
class ComputedUser : public OrvixUserEntry
{
public:
    const wchar_t* GetUserNameW() override { return Answer(L"computed user"); }
    const wchar_t* GetFirstName() override { return Answer(L"computed first"); }
    const wchar_t* GetLastName() override { return Answer(L"computed last"); }
    const wchar_t* GetEmail() override { return Answer(L"computed e-mail"); }

    std::vector<std::wstring> answers;

private:
    const wchar_t* Answer(const wchar_t* text)
    {
        answers.emplace_back(text);
        return text;
    }
};

/// Answers for the operation by index and writes down what it was asked.
class RecordingUserList : public OrvixUserList
{
public:
    using OrvixUserList::RemoveEntry;
    bool RemoveEntry(unsigned int index) override
    {
        removed.push_back(index);
        return answer;
    }

    bool answer = true;
    std::vector<unsigned int> removed;
};

} // namespace

TEST(UserList, StartsEmpty)
{
    OrvixUserList list;
    EXPECT_EQ(list.NumEntries(), 0u);
    EXPECT_EQ(list.GetUserEntry(0), nullptr);
}

TEST(UserListCreateEntryFromAName, GivesAUserWithThatNameAlone)
{
    OrvixUserList list;
    OrvixUserEntry* user = list.CreateEntry(L"jdoe");
    ASSERT_NE(user, nullptr);
    EXPECT_STREQ(user->GetUserNameW(), L"jdoe");
    EXPECT_STREQ(user->GetFirstName(), L"");
    EXPECT_STREQ(user->GetLastName(), L"");
    EXPECT_STREQ(user->GetEmail(), L"");
    EXPECT_EQ(list.NumEntries(), 1u);
    EXPECT_EQ(list.GetUserEntry(0), user);
}

TEST(UserListCreateEntryFromAName, CreatesNothingForNull)
{
    OrvixUserList list;
    list.CreateEntry(L"jdoe");
    const long blocks = BraeDiagnostics::LiveBlocks();
    EXPECT_EQ(list.CreateEntry(nullptr), nullptr);
    EXPECT_EQ(list.NumEntries(), 1u);
    EXPECT_EQ(BraeDiagnostics::LiveBlocks(), blocks);
}

TEST(UserListCreateEntryFromAName, TakesAnEmptyNameAndEqualNames)
{
    OrvixUserList list;
    EXPECT_NE(list.CreateEntry(L""), nullptr);
    EXPECT_NE(list.CreateEntry(L""), nullptr);
    EXPECT_EQ(list.NumEntries(), 2u);
}

TEST(UserListCreateEntryFromAUser, CopiesTheFourTexts)
{
    OrvixUserList list;
    OrvixUserEntry source;
    source.SetUserName(L"jdoe");
    source.SetFirstName(L"Jane");
    source.SetLastName(L"Doe");
    source.SetEmail(L"jane@example.org");
    OrvixUserEntry* copy = list.CreateEntry(source);
    ASSERT_NE(copy, nullptr);
    EXPECT_NE(copy, &source);
    EXPECT_STREQ(copy->GetUserNameW(), L"jdoe");
    EXPECT_STREQ(copy->GetFirstName(), L"Jane");
    EXPECT_STREQ(copy->GetLastName(), L"Doe");
    EXPECT_STREQ(copy->GetEmail(), L"jane@example.org");
    EXPECT_EQ(list.GetUserEntry(0), copy);
    EXPECT_EQ(list.NumEntries(), 1u);
}

TEST(UserListCreateEntryFromAUser, IsIndependentOfItsSource)
{
    OrvixUserList list;
    OrvixUserEntry* source = list.CreateEntry(L"a user name longer than a short text");
    OrvixUserEntry* copy = list.CreateEntry(*source);
    source->SetUserName(L"changed");
    EXPECT_STREQ(copy->GetUserNameW(), L"a user name longer than a short text");
    copy->SetEmail(L"copy@example.org");
    EXPECT_STREQ(source->GetEmail(), L"");
    list.RemoveEntry(source);
    EXPECT_STREQ(copy->GetUserNameW(), L"a user name longer than a short text");
}

TEST(UserListCreateEntryFromAUser, ReadsTheSourceThroughItsVirtualGettersInOrder)
{
    OrvixUserList list;
    ComputedUser source;
    OrvixUserEntry* copy = list.CreateEntry(source);
    ASSERT_NE(copy, nullptr);
    EXPECT_EQ(source.answers,
              (std::vector<std::wstring>{L"computed user", L"computed first", L"computed last", L"computed e-mail"}));
    EXPECT_STREQ(copy->GetUserNameW(), L"computed user");
    EXPECT_STREQ(copy->GetFirstName(), L"computed first");
    EXPECT_STREQ(copy->GetLastName(), L"computed last");
    EXPECT_STREQ(copy->GetEmail(), L"computed e-mail");
}

TEST(UserListRemoveEntryByIndex, DeletesTheUserAndClosesTheGap)
{
    OrvixUserList list;
    list.CreateEntry(L"a");
    list.CreateEntry(L"b");
    list.CreateEntry(L"c");
    const long blocks = BraeDiagnostics::LiveBlocks();
    EXPECT_TRUE(list.RemoveEntry(1u));
    EXPECT_EQ(BraeDiagnostics::LiveBlocks(), blocks - 1);
    ASSERT_EQ(list.NumEntries(), 2u);
    EXPECT_STREQ(list.GetUserEntry(0)->GetUserNameW(), L"a");
    EXPECT_STREQ(list.GetUserEntry(1)->GetUserNameW(), L"c");
}

TEST(UserListRemoveEntryByIndex, GivesFalseOutOfRange)
{
    OrvixUserList list;
    EXPECT_FALSE(list.RemoveEntry(0u));
    list.CreateEntry(L"a");
    EXPECT_FALSE(list.RemoveEntry(1u));
    EXPECT_FALSE(list.RemoveEntry(UINT_MAX));
    EXPECT_EQ(list.NumEntries(), 1u);
}

TEST(UserListRemoveEntryByPointer, RemovesThatUser)
{
    OrvixUserList list;
    list.CreateEntry(L"a");
    OrvixUserEntry* user = list.CreateEntry(L"b");
    list.CreateEntry(L"c");
    EXPECT_TRUE(list.RemoveEntry(user));
    ASSERT_EQ(list.NumEntries(), 2u);
    EXPECT_STREQ(list.GetUserEntry(1)->GetUserNameW(), L"c");
}

TEST(UserListRemoveEntryByPointer, GivesFalseForAUserThatTheListDoesNotHold)
{
    OrvixUserList list;
    OrvixUserEntry stranger;
    EXPECT_FALSE(list.RemoveEntry(&stranger));
    list.CreateEntry(L"a");
    EXPECT_FALSE(list.RemoveEntry(&stranger));
    EXPECT_FALSE(list.RemoveEntry(static_cast<OrvixUserEntry*>(nullptr)));
    EXPECT_EQ(list.NumEntries(), 1u);
}

TEST(UserListRemoveEntryByPointer, GoesThroughTheOperationByIndex)
{
    RecordingUserList list;
    list.CreateEntry(L"a");
    OrvixUserEntry* user = list.CreateEntry(L"b");
    EXPECT_TRUE(list.RemoveEntry(user));
    list.answer = false;
    EXPECT_FALSE(list.RemoveEntry(user));
    EXPECT_EQ(list.removed, (std::vector<unsigned int>{1, 1}));
}

TEST(UserListRemoveEntryByPointer, AsksNobodyForAUserThatIsNotThere)
{
    RecordingUserList list;
    OrvixUserEntry stranger;
    list.CreateEntry(L"a");
    EXPECT_FALSE(list.RemoveEntry(&stranger));
    EXPECT_TRUE(list.removed.empty());
}

TEST(UserListRemoveAll, DeletesEveryUserAndGivesTrueAlsoWhenEmpty)
{
    OrvixUserList list;
    const long blocks = BraeDiagnostics::LiveBlocks();
    EXPECT_TRUE(list.RemoveAll());
    list.CreateEntry(L"a");
    list.CreateEntry(L"b");
    EXPECT_TRUE(list.RemoveAll());
    EXPECT_EQ(list.NumEntries(), 0u);
    EXPECT_EQ(BraeDiagnostics::LiveBlocks(), blocks);
    EXPECT_NE(list.CreateEntry(L"c"), nullptr);
}

TEST(UserListGetUserEntry, GivesNullForAnIndexOutOfRange)
{
    OrvixUserList list;
    list.CreateEntry(L"a");
    EXPECT_NE(list.GetUserEntry(0), nullptr);
    EXPECT_EQ(list.GetUserEntry(1), nullptr);
    EXPECT_EQ(list.GetUserEntry(UINT_MAX), nullptr);
}

TEST(UserListDestructor, DeletesEveryUserOnTheHostsHeap)
{
    const long blocks = BraeDiagnostics::LiveBlocks();
    const long foreignFrees = BraeDiagnostics::ForeignFrees();
    {
        OrvixUserList list;
        OrvixUserEntry source;
        list.CreateEntry(L"a");
        list.CreateEntry(source);
        EXPECT_EQ(BraeDiagnostics::LiveBlocks(), blocks + 2);
    }
    EXPECT_EQ(BraeDiagnostics::LiveBlocks(), blocks);
    EXPECT_EQ(BraeDiagnostics::ForeignFrees(), foreignFrees);
}
