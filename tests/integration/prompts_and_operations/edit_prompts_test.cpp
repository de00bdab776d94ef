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
    static constexpr std::uint32_t Prompt = 7;
    static constexpr std::int32_t Unchanged = OrvixPromptEditorResult::Unchanged;
    static constexpr std::int32_t Changed = OrvixPromptEditorResult::Changed;

    bool IsSaved() const { return std::filesystem::exists(m_config.Path() / L"OrvixPrompts.xml"); }
};

TEST_F(EditPrompts, HandsTheArgumentsAndItsOwnTableToTheDialog)
{
    m_services->RegisterPrompt(Prompt, L"Overwrite?", Action::Yes, 0, true);
    m_script.onEditor = [](const CoreUIScript::Editor& call) {
        EXPECT_EQ(call.prompts->NumPrompts(), 1);
        EXPECT_EQ(call.prompts->GetPromptID(0), static_cast<int>(Prompt));
        EXPECT_STREQ(call.prompts->GetPromptText(0), L"Overwrite?");
        call.prompts->SetPrompt(0, Action::YesToAll);
        return Unchanged;
    };
    EXPECT_EQ(m_services->EditPrompts(Token(1), Token(2)), Unchanged);
    ASSERT_EQ(m_script.editors.size(), 1U);
    EXPECT_EQ(m_script.editors.front().a, Token(1));
    EXPECT_EQ(m_script.editors.front().b, Token(2));
    EXPECT_EQ(m_services->GetPromptAction(Prompt), Action::YesToAll);
}

TEST_F(EditPrompts, SavesTheTableWhenTheDialogChangedIt)
{
    m_script.onEditor = [](const CoreUIScript::Editor& call) {
        call.prompts->AddPrompt(static_cast<int>(Prompt), L"Overwrite?", 0, Action::YesToAll, false);
        return Changed;
    };
    EXPECT_EQ(m_services->EditPrompts(nullptr, nullptr), Changed);
    EXPECT_NE(ReadBytes(m_config.Path() / L"OrvixPrompts.xml").find("<Text>Overwrite?</Text>"), std::string::npos);
}

TEST_F(EditPrompts, ReturnsEveryResultAndSavesOnlyForChanged)
{
    m_services->RegisterPrompt(Prompt, L"text", Action::Yes, 0, true);
    for (const std::int32_t result : {Unchanged, Changed + 1, -1, INT_MAX, INT_MIN})
    {
        m_script.onEditor = [result](const CoreUIScript::Editor&) { return result; };
        EXPECT_EQ(m_services->EditPrompts(nullptr, nullptr), result);
    }
    EXPECT_FALSE(IsSaved());
}

TEST_F(EditPrompts, WritesNoFileForAnEmptyTable)
{
    m_script.onEditor = [](const CoreUIScript::Editor&) { return Changed; };
    EXPECT_EQ(m_services->EditPrompts(nullptr, nullptr), Changed);
    EXPECT_FALSE(IsSaved());
}

TEST_F(EditPrompts, IsUnchangedAndSavesNothingWhenTheDialogThrows)
{
    m_services->RegisterPrompt(Prompt, L"text", Action::Yes, 0, true);
    m_script.onEditor = [](const CoreUIScript::Editor&) -> std::int32_t { throw std::runtime_error("dialog"); };
    EXPECT_EQ(m_services->EditPrompts(nullptr, nullptr), Unchanged);
    EXPECT_FALSE(IsSaved());
    EXPECT_EQ(m_services->GetPromptAction(Prompt), Action::Yes);
}

} // namespace
