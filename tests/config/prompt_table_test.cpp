#include "AllocationSweep.h"
#include "OrvixPromptTable.h"
#include "VTable.h"

#include <gtest/gtest.h>

#include <climits>
#include <iterator>
#include <random>
#include <string>
#include <vector>

namespace
{

/// Answers for the number of prompts.
class CountingTable : public OrvixPromptTable
{
public:
    int NumPrompts() override { return 77; }
};

/// A row as `AddPrompt` takes it.
struct Row
{
    int id;
    std::wstring text;
    unsigned long options;
    unsigned long prompt;
    bool locked;
};

int Add(OrvixPromptTable& table, const Row& row)
{
    return table.AddPrompt(row.id, row.text.c_str(), row.options, row.prompt, row.locked);
}

void ExpectRow(OrvixPromptTable& table, unsigned int index, const Row& row)
{
    EXPECT_EQ(table.GetPromptID(index), row.id);
    ASSERT_NE(table.GetPromptText(index), nullptr);
    EXPECT_EQ(table.GetPromptText(index), row.text);
    EXPECT_EQ(table.GetPromptOptions(index), row.options);
    EXPECT_EQ(table.GetPrompt(index), row.prompt);
    EXPECT_EQ(table.GetLocked(index), row.locked);
}

void ExpectNoRow(OrvixPromptTable& table, unsigned int index)
{
    EXPECT_EQ(table.GetPromptID(index), -1);
    EXPECT_EQ(table.GetPromptText(index), nullptr);
    EXPECT_EQ(table.GetPromptOptions(index), 0u);
    EXPECT_EQ(table.GetPrompt(index), 0u);
    EXPECT_FALSE(table.GetLocked(index));
}

const Row Sample{7, L"Save the file?", 0xFFFFFFFF, 0x80000001, true};
const std::wstring LongText = L"a text too long to be inside a string object";

} // namespace

TEST(PromptTable, StartsEmpty)
{
    OrvixPromptTable table;
    EXPECT_EQ(table.NumPrompts(), 0);
    ExpectNoRow(table, 0);
}

TEST(PromptTableAddPrompt, AppendsARowAndGivesTheNewCount)
{
    OrvixPromptTable table;
    const Row other{INT_MIN, L"", 0, 0, false};
    EXPECT_EQ(Add(table, Sample), 1);
    EXPECT_EQ(Add(table, other), 2);
    EXPECT_EQ(table.NumPrompts(), 2);
    ExpectRow(table, 0, Sample);
    ExpectRow(table, 1, other);
}

TEST(PromptTableAddPrompt, RefusesANullText)
{
    OrvixPromptTable table;
    EXPECT_EQ(table.AddPrompt(1, nullptr, 2, 3, true), -1);
    EXPECT_EQ(table.NumPrompts(), 0);
    Add(table, Sample);
    EXPECT_EQ(table.AddPrompt(1, nullptr, 2, 3, true), -1);
    EXPECT_EQ(table.NumPrompts(), 1);
    ExpectRow(table, 0, Sample);
    ExpectNoRow(table, 1);
}

TEST(PromptTableAddPrompt, KeepsPromptsOfTheSameIdInOrder)
{
    OrvixPromptTable table;
    EXPECT_EQ(table.AddPrompt(5, L"first", 0, 0, false), 1);
    EXPECT_EQ(table.AddPrompt(5, L"second", 0, 0, false), 2);
    EXPECT_EQ(table.GetPromptID(0), 5);
    EXPECT_EQ(table.GetPromptID(1), 5);
    EXPECT_STREQ(table.GetPromptText(0), L"first");
    EXPECT_STREQ(table.GetPromptText(1), L"second");
}

TEST(PromptTableAddPrompt, CopiesTheText)
{
    OrvixPromptTable table;
    std::wstring text = LongText;
    table.AddPrompt(1, text.c_str(), 0, 0, false);
    text.assign(text.size(), L'x');
    EXPECT_EQ(table.GetPromptText(0), LongText);
}

TEST(PromptTableAddPrompt, TakesATextThatIsTheTablesOwn)
{
    OrvixPromptTable table;
    table.AddPrompt(1, L"short", 0, 0, false);
    for (int count = 2; count <= 100; ++count)
    {
        ASSERT_EQ(table.AddPrompt(1, table.GetPromptText(0), 0, 0, false), count);
    }
    EXPECT_STREQ(table.GetPromptText(99), L"short");
}

TEST(PromptTableAddPrompt, TakesTheCountFromTheVirtualOperation)
{
    CountingTable table;
    EXPECT_EQ(Add(table, Sample), 77);
    EXPECT_EQ(table.AddPrompt(1, nullptr, 0, 0, false), -1);
    ExpectRow(table, 0, Sample);
}

TEST(PromptTableRemoveAll, RemovesEveryRow)
{
    OrvixPromptTable table;
    table.RemoveAll();
    for (int n = 0; n < 3; ++n)
    {
        Add(table, Sample);
    }
    table.RemoveAll();
    EXPECT_EQ(table.NumPrompts(), 0);
    ExpectNoRow(table, 0);
    EXPECT_EQ(Add(table, Sample), 1);
    ExpectRow(table, 0, Sample);
}

TEST(PromptTable, AnswersNeutrallyOutOfRange)
{
    OrvixPromptTable table;
    Add(table, Sample);
    Add(table, Sample);
    ExpectNoRow(table, 2);
    ExpectNoRow(table, UINT_MAX);
}

TEST(PromptTable, RefusesToSetOutOfRange)
{
    OrvixPromptTable table;
    Add(table, Sample);
    for (const unsigned int index : {1u, UINT_MAX})
    {
        EXPECT_FALSE(table.SetPromptID(index, 1));
        EXPECT_FALSE(table.SetPromptText(index, L"text"));
        EXPECT_FALSE(table.SetPromptText(index, nullptr));
        EXPECT_FALSE(table.SetPromptOptions(index, 1));
        EXPECT_FALSE(table.SetPrompt(index, 1));
        EXPECT_FALSE(table.SetLocked(index, false));
    }
    EXPECT_EQ(table.NumPrompts(), 1);
    ExpectRow(table, 0, Sample);
}

TEST(PromptTable, SetsEveryFieldOfOneRowAlone)
{
    OrvixPromptTable table;
    Row changed = Sample;
    for (int n = 0; n < 3; ++n)
    {
        Add(table, Sample);
    }
    changed.id = -1;
    EXPECT_TRUE(table.SetPromptID(1, changed.id));
    ExpectRow(table, 1, changed);
    changed.text = LongText;
    EXPECT_TRUE(table.SetPromptText(1, changed.text.c_str()));
    ExpectRow(table, 1, changed);
    changed.options = 1;
    EXPECT_TRUE(table.SetPromptOptions(1, changed.options));
    ExpectRow(table, 1, changed);
    changed.prompt = 2;
    EXPECT_TRUE(table.SetPrompt(1, changed.prompt));
    ExpectRow(table, 1, changed);
    changed.locked = false;
    EXPECT_TRUE(table.SetLocked(1, changed.locked));
    ExpectRow(table, 1, changed);
    ExpectRow(table, 0, Sample);
    ExpectRow(table, 2, Sample);
    EXPECT_EQ(table.NumPrompts(), 3);
}

TEST(PromptTableSetPromptText, RefusesNullAndChangesNothing)
{
    OrvixPromptTable table;
    Add(table, Sample);
    EXPECT_FALSE(table.SetPromptText(0, nullptr));
    ExpectRow(table, 0, Sample);
}

TEST(PromptTableSetPromptText, CopiesTheTextAlsoWhenItIsPartOfItsOwn)
{
    OrvixPromptTable table;
    table.AddPrompt(1, LongText.c_str(), 0, 0, false);
    EXPECT_TRUE(table.SetPromptText(0, table.GetPromptText(0) + 2));
    EXPECT_EQ(table.GetPromptText(0), LongText.substr(2));
    EXPECT_TRUE(table.SetPromptText(0, L""));
    EXPECT_STREQ(table.GetPromptText(0), L"");
}

TEST(PromptTable, KeepsTheLockOfEveryRowApart)
{
    constexpr unsigned int Count = 200;
    std::mt19937 random(1);
    OrvixPromptTable table;
    std::vector<bool> locked;
    for (unsigned int n = 0; n < Count; ++n)
    {
        locked.push_back(random() % 2 == 0);
        table.AddPrompt(1, L"", 0, 0, locked[n]);
    }
    for (int n = 0; n < 1'000; ++n)
    {
        const unsigned int index = static_cast<unsigned int>(random() % Count);
        locked[index] = random() % 2 == 0;
        ASSERT_TRUE(table.SetLocked(index, locked[index]));
    }
    for (unsigned int n = 0; n < Count; ++n)
    {
        ASSERT_EQ(table.GetLocked(n), locked[n]);
    }
}

TEST(PromptTable, LimitsNeitherTextsNorRows)
{
    OrvixPromptTable table;
    const std::wstring text(100'000, L't');
    table.AddPrompt(1, text.c_str(), 0, 0, false);
    EXPECT_EQ(table.GetPromptText(0), text);
    for (int count = 2; count <= 20'000; ++count)
    {
        ASSERT_EQ(table.AddPrompt(count, L"t", 0, 0, false), count);
    }
    EXPECT_EQ(table.GetPromptID(19'999), 20'000);
}

TEST(PromptTable, KeepsTheAddressOfATextWhileRowsAreAddedAndOthersChange)
{
    OrvixPromptTable table;
    const std::wstring texts[] = {L"", L"Save?", LongText};
    const wchar_t* addresses[std::size(texts)] = {};
    for (unsigned int n = 0; n < std::size(texts); ++n)
    {
        table.AddPrompt(1, texts[n].c_str(), 0, 0, false);
        addresses[n] = table.GetPromptText(n);
    }
    for (int n = 0; n < 10'000; ++n)
    {
        ASSERT_NE(table.AddPrompt(n, n % 2 == 0 ? L"short" : LongText.c_str(), 0, 0, false), -1);
    }
    for (unsigned int n = std::size(texts); n < static_cast<unsigned int>(table.NumPrompts()); ++n)
    {
        ASSERT_TRUE(table.SetPromptText(n, LongText.c_str()));
    }
    for (unsigned int n = 0; n < std::size(texts); ++n)
    {
        EXPECT_EQ(table.GetPromptText(n), addresses[n]) << "the text was moved";
        EXPECT_EQ(addresses[n], texts[n]);
    }
}

TEST(PromptTableSlots, AreInThePublishedOrder)
{
    OrvixPromptTable table;
    const auto call = [&]<typename Result>(Result, std::size_t slot, auto... arguments) {
        return CallSlot<Result>(&table, DestructorSlots + slot, arguments...);
    };
    const wchar_t* text = nullptr;
    EXPECT_EQ(call(int{}, 0, 5, L"slot", 0x80000001ul, 0x80000002ul, true), 1);
    EXPECT_EQ(call(int{}, 1), 1);
    EXPECT_EQ(call(int{}, 3, 0u), 5);
    EXPECT_STREQ(call(text, 5, 0u), L"slot");
    EXPECT_EQ(call(0ul, 7, 0u), 0x80000001);
    EXPECT_EQ(call(0ul, 9, 0u), 0x80000002);
    EXPECT_TRUE(call(bool{}, 11, 0u));
    EXPECT_TRUE(call(bool{}, 4, 0u, 6));
    EXPECT_TRUE(call(bool{}, 6, 0u, L"changed"));
    EXPECT_TRUE(call(bool{}, 8, 0u, 3ul));
    EXPECT_TRUE(call(bool{}, 10, 0u, 4ul));
    EXPECT_TRUE(call(bool{}, 12, 0u, false));
    ExpectRow(table, 0, {6, L"changed", 3, 4, false});
    CallSlot<void>(&table, DestructorSlots + 2);
    EXPECT_EQ(table.NumPrompts(), 0);
}

TEST(PromptTableAllocationFailure, GivesMinusOneFromAddPromptAndKeepsTheFiveFieldsTogether)
{
    for (const int present : {0, 1, 2, 4, 8, 63, 64, 128})
    {
        const long failures = SweepAllocations([&](AllocationRound& round) {
            OrvixPromptTable table;
            for (int n = 0; n < present; ++n)
            {
                Add(table, Sample);
            }
            const Row row{present, LongText, 1, 2, false};
            const int count = round.Attempt([&] { return Add(table, row); });
            EXPECT_EQ(count, round.Failed() ? -1 : present + 1);
            EXPECT_EQ(table.NumPrompts(), round.Failed() ? present : present + 1);
            ExpectNoRow(table, static_cast<unsigned int>(table.NumPrompts()));
            const int next = Add(table, row);
            EXPECT_EQ(next, table.NumPrompts());
            ExpectRow(table, static_cast<unsigned int>(next - 1), row);
            ExpectNoRow(table, static_cast<unsigned int>(next));
            for (unsigned int n = 0; n < static_cast<unsigned int>(present); ++n)
            {
                ExpectRow(table, n, Sample);
            }
        });
        EXPECT_GE(failures, 2) << "the text";
    }
}

TEST(PromptTableAllocationFailure, GivesFalseFromSetPromptTextAndKeepsTheText)
{
    const long failures = SweepAllocations([](AllocationRound& round) {
        OrvixPromptTable table;
        Add(table, Sample);
        const bool done = round.Attempt([&] { return table.SetPromptText(0, LongText.c_str()); });
        EXPECT_EQ(done, !round.Failed());
        EXPECT_EQ(table.GetPromptText(0), done ? LongText : Sample.text);
        EXPECT_TRUE(table.SetPromptText(0, LongText.c_str()));
        EXPECT_EQ(table.GetPromptText(0), LongText);
    });
    EXPECT_EQ(failures, 2);
}

TEST(PromptTableAllocationFailure, IsNotMetByOtherOperations)
{
    const long failures = SweepAllocations([](AllocationRound& round) {
        round.Attempt([] {
            OrvixPromptTable table;
            EXPECT_EQ(table.NumPrompts(), 0);
            ExpectNoRow(table, 0);
            EXPECT_FALSE(table.SetLocked(0, true));
            table.RemoveAll();
        });
    });
    EXPECT_EQ(failures, 0);
}
