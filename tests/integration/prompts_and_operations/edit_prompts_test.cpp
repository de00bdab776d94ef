#include "DialogTest.h"
#include "Files.h"
#include "OrvixPromptTable.h"

#include <climits>
#include <stdexcept>

namespace
{

class EditPrompts : public DialogTest
{
protected:
    bool IsSaved() const { return std::filesystem::exists(m_config.Path() / L"OrvixPrompts.xml"); }
};

TEST_F(EditPrompts, HandsTheArgumentsAndItsOwnTableToTheDialog)
{
    m_services->RegisterPrompt(7, L"Overwrite?", AnswerOne, 5, true);
    m_script.onEditor = [](const CoreUIScript::Editor& call) {
        EXPECT_EQ(call.prompts->NumPrompts(), 1);
        EXPECT_EQ(call.prompts->GetPromptID(0), 7);
        EXPECT_STREQ(call.prompts->GetPromptText(0), L"Overwrite?");
        call.prompts->SetPrompt(0, AnswerTwo);
        return 0;
    };
    EXPECT_EQ(m_services->EditPrompts(Token(1), Token(2)), 0);
    ASSERT_EQ(m_script.editors.size(), 1U);
    EXPECT_EQ(m_script.editors.front().a, Token(1));
    EXPECT_EQ(m_script.editors.front().b, Token(2));
    EXPECT_EQ(m_services->GetPromptAction(7), AnswerTwo);
}

TEST_F(EditPrompts, SavesTheTableWhereTheDialogChangedIt)
{
    m_script.onEditor = [](const CoreUIScript::Editor& call) {
        call.prompts->AddPrompt(7, L"Overwrite?", 0, AnswerTwo, false);
        return 1;
    };
    EXPECT_EQ(m_services->EditPrompts(nullptr, nullptr), 1);
    EXPECT_NE(ReadBytes(m_config.Path() / L"OrvixPrompts.xml").find("<Text>Overwrite?</Text>"), std::string::npos);
}

TEST_F(EditPrompts, ReturnsEveryResultUnchangedAndSavesForOneOnly)
{
    m_services->RegisterPrompt(7, L"text", AnswerOne, 0, true);
    for (const std::int32_t result : {0, 2, -1, INT_MAX, INT_MIN})
    {
        m_script.onEditor = [result](const CoreUIScript::Editor&) { return result; };
        EXPECT_EQ(m_services->EditPrompts(nullptr, nullptr), result);
    }
    EXPECT_FALSE(IsSaved());
}

TEST_F(EditPrompts, WritesNoFileForAnEmptyTable)
{
    m_script.onEditor = [](const CoreUIScript::Editor&) { return 1; };
    EXPECT_EQ(m_services->EditPrompts(nullptr, nullptr), 1);
    EXPECT_FALSE(IsSaved());
}

TEST_F(EditPrompts, GivesZeroAndSavesNothingWhereTheDialogThrows)
{
    m_services->RegisterPrompt(7, L"text", AnswerOne, 0, true);
    m_script.onEditor = [](const CoreUIScript::Editor&) -> std::int32_t { throw std::runtime_error("dialog"); };
    EXPECT_EQ(m_services->EditPrompts(nullptr, nullptr), 0);
    EXPECT_FALSE(IsSaved());
    EXPECT_EQ(m_services->GetPromptAction(7), AnswerOne);
}

} // namespace
