#include "StoredAnswers.h"

#include "FileBytes.h"
#include "Files.h"
#include "OrvixPrompt.h"
#include "TempFolder.h"
#include "UniqueHandle.h"

#include <gtest/gtest.h>

#include <cstdint>
#include <filesystem>
#include <random>
#include <string>
#include <vector>

namespace
{

constexpr std::uint32_t Save = 7;
constexpr std::uint32_t Other = 8;
constexpr bool Locked = true;
constexpr bool Overwrite = true;

/// Answers with a table that the test fills.
class StoredAnswersTest : public testing::Test
{
protected:
    void AddRow(std::uint32_t id, std::uint32_t action, bool locked = false)
    {
        m_answers.Table().AddPrompt(static_cast<int>(id), L"text", 0, action, locked);
    }

    std::uint32_t ActionOfRow(unsigned int row) { return m_answers.Table().GetPrompt(row); }

    StoredAnswers m_answers;
};

} // namespace

TEST_F(StoredAnswersTest, AnswerNeutrallyWithoutARow)
{
    AddRow(Other, OrvixPromptAction::Yes, Locked);
    EXPECT_EQ(m_answers.GetAction(Save), 0U);
    EXPECT_FALSE(m_answers.IsLocked(Save));
    EXPECT_FALSE(m_answers.SetAction(Save, OrvixPromptAction::No));
    EXPECT_EQ(ActionOfRow(0), OrvixPromptAction::Yes);
}

TEST_F(StoredAnswersTest, AreReadFromTheFirstRowOfAnID)
{
    AddRow(Other, OrvixPromptAction::Ask);
    AddRow(Save, OrvixPromptAction::Yes);
    AddRow(Save, OrvixPromptAction::No);
    EXPECT_EQ(m_answers.GetAction(Save), OrvixPromptAction::Yes);
}

TEST_F(StoredAnswersTest, AreWrittenToTheLastRowOfAnID)
{
    AddRow(Save, OrvixPromptAction::Yes);
    AddRow(Save, OrvixPromptAction::No);
    AddRow(Other, OrvixPromptAction::Ask);
    EXPECT_TRUE(m_answers.SetAction(Save, OrvixPromptAction::NoToAll));
    EXPECT_EQ(ActionOfRow(0), OrvixPromptAction::Yes);
    EXPECT_EQ(ActionOfRow(1), OrvixPromptAction::NoToAll);
    EXPECT_EQ(ActionOfRow(2), OrvixPromptAction::Ask);
    EXPECT_EQ(m_answers.GetAction(Save), OrvixPromptAction::Yes);
}

TEST_F(StoredAnswersTest, AreLockedWhereTheFirstRowIs)
{
    AddRow(Save, OrvixPromptAction::Yes, Locked);
    AddRow(Save, OrvixPromptAction::No);
    AddRow(Other, OrvixPromptAction::Yes);
    AddRow(Other, OrvixPromptAction::No, Locked);
    EXPECT_TRUE(m_answers.IsLocked(Save));
    EXPECT_FALSE(m_answers.IsLocked(Other));
}

TEST_F(StoredAnswersTest, AreNotWrittenWhereTheLastRowIsLocked)
{
    AddRow(Save, OrvixPromptAction::Yes);
    AddRow(Save, OrvixPromptAction::No, Locked);
    AddRow(Other, OrvixPromptAction::Yes, Locked);
    AddRow(Other, OrvixPromptAction::No);
    EXPECT_FALSE(m_answers.SetAction(Save, OrvixPromptAction::NoToAll));
    EXPECT_EQ(ActionOfRow(1), OrvixPromptAction::No);
    EXPECT_TRUE(m_answers.SetAction(Other, OrvixPromptAction::NoToAll));
    EXPECT_EQ(ActionOfRow(3), OrvixPromptAction::NoToAll);
}

TEST_F(StoredAnswersTest, UseAll32BitsOfAnID)
{
    AddRow(OrvixPromptID::None - 1, OrvixPromptAction::Yes);
    EXPECT_EQ(m_answers.GetAction(OrvixPromptID::None - 1), OrvixPromptAction::Yes);
    EXPECT_TRUE(m_answers.SetAction(OrvixPromptID::None - 1, OrvixPromptAction::No));
    EXPECT_EQ(ActionOfRow(0), OrvixPromptAction::No);
}

TEST_F(StoredAnswersTest, RegisterAddsAnUnlockedRow)
{
    m_answers.Register(Save, L"Save?", OrvixPromptAction::Yes, OrvixPromptOption::WarningIcon, !Overwrite);
    OrvixPromptTable& table = m_answers.Table();
    ASSERT_EQ(table.NumPrompts(), 1);
    EXPECT_EQ(table.GetPromptID(0), static_cast<int>(Save));
    EXPECT_STREQ(table.GetPromptText(0), L"Save?");
    EXPECT_EQ(table.GetPrompt(0), OrvixPromptAction::Yes);
    EXPECT_EQ(table.GetPromptOptions(0), OrvixPromptOption::WarningIcon);
    EXPECT_FALSE(table.GetLocked(0));
}

TEST_F(StoredAnswersTest, RegisterGivesTheLastRowOfAnIDItsTextAlone)
{
    AddRow(Save, OrvixPromptAction::Yes);
    AddRow(Save, OrvixPromptAction::No, Locked);
    m_answers.Register(Save, L"new", OrvixPromptAction::NoToAll, OrvixPromptOption::WarningIcon, !Overwrite);
    OrvixPromptTable& table = m_answers.Table();
    ASSERT_EQ(table.NumPrompts(), 2);
    EXPECT_STREQ(table.GetPromptText(0), L"text");
    EXPECT_STREQ(table.GetPromptText(1), L"new");
    EXPECT_EQ(table.GetPrompt(1), OrvixPromptAction::No);
    EXPECT_EQ(table.GetPromptOptions(1), 0U);
    EXPECT_TRUE(table.GetLocked(1));
}

TEST_F(StoredAnswersTest, RegisterWithOverwriteReplacesOptionsAndActionEvenOfALockedRow)
{
    AddRow(Save, OrvixPromptAction::Yes);
    AddRow(Save, OrvixPromptAction::No, Locked);
    m_answers.Register(Save, L"new", OrvixPromptAction::NoToAll, OrvixPromptOption::WarningIcon, Overwrite);
    OrvixPromptTable& table = m_answers.Table();
    EXPECT_EQ(table.GetPrompt(0), OrvixPromptAction::Yes);
    EXPECT_EQ(table.GetPrompt(1), OrvixPromptAction::NoToAll);
    EXPECT_EQ(table.GetPromptOptions(1), OrvixPromptOption::WarningIcon);
    EXPECT_TRUE(table.GetLocked(1));
}

TEST_F(StoredAnswersTest, RegisterWithoutATextAddsNothingAndLeavesAnOldText)
{
    AddRow(Save, OrvixPromptAction::Yes);
    m_answers.Register(Other, nullptr, OrvixPromptAction::No, 0, Overwrite);
    m_answers.Register(Save, nullptr, OrvixPromptAction::No, 0, !Overwrite);
    ASSERT_EQ(m_answers.Table().NumPrompts(), 1);
    EXPECT_STREQ(m_answers.Table().GetPromptText(0), L"text");
}

/// The rows are found through an index, which every change of the table keeps right.
TEST_F(StoredAnswersTest, AreThoseOfTheTableAfterAnyChangeOfIt)
{
    std::mt19937 random(1);
    const auto anyID = [&] { return static_cast<std::uint32_t>(random() % 40); };
    OrvixPromptTable& table = m_answers.Table();
    const auto rowsWith = [&](std::uint32_t id) {
        std::vector<unsigned int> rows;
        for (unsigned int row = 0; row < static_cast<unsigned int>(table.NumPrompts()); ++row)
        {
            if (table.GetPromptID(row) == static_cast<int>(id))
            {
                rows.push_back(row);
            }
        }
        return rows;
    };
    for (std::uint32_t step = 0; step < 20000; ++step)
    {
        const auto count = static_cast<unsigned int>(table.NumPrompts());
        switch (random() % 8)
        {
        case 0:
            AddRow(anyID(), step, random() % 4 == 0);
            break;
        case 1:
            table.SetPromptID(count != 0 ? random() % count : 0, static_cast<int>(anyID()));
            break;
        case 2:
            if (random() % 100 == 0)
            {
                table.RemoveAll();
            }
            break;
        default:
            const std::uint32_t id = anyID();
            const std::vector<unsigned int> rows = rowsWith(id);
            ASSERT_EQ(m_answers.GetAction(id), rows.empty() ? 0 : table.GetPrompt(rows.front()));
            ASSERT_EQ(m_answers.IsLocked(id), !rows.empty() && table.GetLocked(rows.front()));
            const bool isWritable = !rows.empty() && !table.GetLocked(rows.back());
            ASSERT_EQ(m_answers.SetAction(id, step), isWritable);
            ASSERT_TRUE(!isWritable || table.GetPrompt(rows.back()) == step);
        }
    }
}

namespace
{

class StoredAnswersFile : public StoredAnswersTest
{
protected:
    bool Load() { return m_answers.Load(m_path.c_str()); }
    bool SaveFile() { return m_answers.Save(m_path.c_str()); }

    TempFolder m_folder;
    std::wstring m_path = (m_folder.Path() / L"OrvixPrompts.xml").wstring();
    std::wstring m_kept = FileBytes::KeptName(m_path);
};

} // namespace

TEST_F(StoredAnswersFile, ThatCannotBeReadIsKeptBeforeTheFirstSaveReplacesIt)
{
    for (const std::string bad : {"<?xml version=\"1.0\"?><OrvixPrompts><Prompt>", "<OrvixPrompts/>", "",
                                  "<?xml version=\"1.0\"?><!-- mine --><OrvixPrompts><Prompt/></OrvixPrompts>"})
    {
        WriteBytes(m_path, bad);
        EXPECT_FALSE(Load());
        AddRow(Save, OrvixPromptAction::Yes);
        EXPECT_TRUE(SaveFile());
        EXPECT_EQ(ReadBytes(m_kept), bad);
        std::filesystem::remove(m_kept);
        EXPECT_TRUE(SaveFile());
        EXPECT_FALSE(std::filesystem::exists(m_kept)) << "kept twice";
        EXPECT_TRUE(Load());
        EXPECT_EQ(m_answers.GetAction(Save), OrvixPromptAction::Yes);
    }
}

TEST_F(StoredAnswersFile, ThatWasLockedWhileItWasLoadedIsKept)
{
    AddRow(Other, OrvixPromptAction::No);
    EXPECT_TRUE(SaveFile());
    const std::string before = ReadBytes(m_path);
    {
        const UniqueFile owner(CreateFileW(m_path.c_str(), GENERIC_READ, 0, nullptr, OPEN_EXISTING, 0, nullptr));
        EXPECT_FALSE(Load());
    }
    AddRow(Save, OrvixPromptAction::Yes);
    EXPECT_TRUE(SaveFile());
    EXPECT_EQ(ReadBytes(m_kept), before);
}

TEST_F(StoredAnswersFile, ThatWasMissingOrReadIsNotKept)
{
    EXPECT_FALSE(Load());
    AddRow(Save, OrvixPromptAction::Yes);
    EXPECT_TRUE(SaveFile());
    EXPECT_TRUE(Load());
    EXPECT_TRUE(SaveFile());
    EXPECT_FALSE(std::filesystem::exists(m_kept));
}

TEST_F(StoredAnswersFile, StaysAsItIsWhileThereAreNoAnswersToSave)
{
    WriteBytes(m_path, "bad");
    EXPECT_FALSE(Load());
    EXPECT_TRUE(SaveFile());
    EXPECT_EQ(ReadBytes(m_path), "bad");
    AddRow(Save, OrvixPromptAction::Yes);
    EXPECT_TRUE(SaveFile());
    EXPECT_EQ(ReadBytes(m_kept), "bad") << "the first save that replaces the file makes the copy";
}

TEST_F(StoredAnswersFile, ThatWasNeverLoadedIsKept)
{
    WriteBytes(m_path, "another program's");
    AddRow(Save, OrvixPromptAction::Yes);
    EXPECT_TRUE(SaveFile());
    EXPECT_EQ(ReadBytes(m_kept), "another program's");
}

TEST_F(StoredAnswersFile, OfAnotherFolderThanTheOneThatWasLoadedIsKept)
{
    AddRow(Save, OrvixPromptAction::Yes);
    EXPECT_TRUE(SaveFile());
    EXPECT_TRUE(Load());
    const std::wstring other = (m_folder.Path() / L"other.xml").wstring();
    WriteBytes(other, "not read");
    EXPECT_TRUE(m_answers.Save(other.c_str()));
    EXPECT_EQ(ReadBytes(FileBytes::KeptName(other)), "not read");
}
