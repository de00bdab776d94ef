#include "DialogsTest.h"
#include "Files.h"
#include "OrvixPrompt.h"

namespace
{

constexpr const wchar_t* List = L"Prompts:";
constexpr const wchar_t* Answer = L"Answer:";

class PromptEditorDialog : public DialogsTest
{
protected:
    PromptEditorDialog()
    {
        m_services->RegisterPrompt(1, L"Overwrite?", OrvixPromptAction::Yes,
                                   OrvixPromptOption::OfferYesToAll | OrvixPromptOption::OfferNoToAll, true);
        m_services->RegisterPrompt(2, L"Check out?", OrvixPromptAction::Ask, 0, true);
        m_services->RegisterPrompt(3, L"Tell me", OrvixPromptAction::No, OrvixPromptOption::OnlyOK, true);
    }

    /// Locks the first prompt. Only the file can do that.
    void LockFirst();
};

void PromptEditorDialog::LockFirst()
{
    m_services->Shutdown();
    std::string file = PromptFile();
    const std::string open = "<Locked>false";
    file.replace(file.find(open), open.size(), "<Locked>true");
    WriteBytes(m_config.Path() / L"OrvixPrompts.xml", file);
    m_services.reset();
    Restart();
}

TEST_F(PromptEditorDialog, ShowsEveryPromptWithItsAnswerInWords)
{
    m_services->RegisterPrompt(4, L"a", OrvixPromptAction::YesToAll, 0, true);
    m_services->RegisterPrompt(5, L"b", OrvixPromptAction::NoToAll, 0, true);
    m_services->RegisterPrompt(6, L"c", 0, 0, true);
    ShowEditor([](const DialogWindow& dialog) {
        EXPECT_EQ(dialog.Column(List, 0), (Texts{L"Overwrite?", L"Check out?", L"Tell me", L"a", L"b", L"c"}));
        EXPECT_EQ(dialog.Column(List, 1), (Texts{L"Yes", L"Ask", L"No", L"Yes to all", L"No to all", L"No"}));
        dialog.Press(VK_ESCAPE);
    });
}

TEST_F(PromptEditorDialog, ShowsTheWholeTextOfTheSelectedPrompt)
{
    const std::wstring lines = L"First\nsecond\r\n" + std::wstring(1000, L'x');
    m_services->RegisterPrompt(4, lines.c_str(), OrvixPromptAction::Ask, 0, true);
    ShowEditor([](const DialogWindow& dialog) {
        constexpr const wchar_t* Whole = L"Whole text:";
        EXPECT_EQ(dialog.Text(Whole), L"Overwrite?");
        dialog.SelectRow(List, 3);
        EXPECT_EQ(dialog.Cell(List, 3, 0).substr(0, 13), L"First second ");
        EXPECT_EQ(dialog.Text(Whole), L"First\r\nsecond\r\n" + std::wstring(1000, L'x'));
        dialog.PressAlt(L'w');
        EXPECT_EQ(dialog.Focused(), Whole);
        dialog.Type(L"more");
        EXPECT_EQ(dialog.Text(Whole).size(), 1015U) << "the field is read-only";
        SetWindowTextW(dialog.Control(L"Search:"), L"nowhere");
        EXPECT_EQ(dialog.Text(Whole), L"");
        dialog.Press(VK_ESCAPE);
    });
}

TEST_F(PromptEditorDialog, StoresAChangedAnswer)
{
    EXPECT_EQ(ShowEditor([](const DialogWindow& dialog) {
                  dialog.SelectRow(List, 0);
                  EXPECT_EQ(dialog.Chosen(Answer), L"Yes");
                  dialog.Choose(Answer, L"No to all");
                  EXPECT_EQ(dialog.Cell(List, 0, 1), L"No to all");
                  dialog.Press(VK_RETURN);
              }),
              OrvixPromptEditorResult::Changed);
    EXPECT_EQ(m_services->GetPromptAction(1), OrvixPromptAction::NoToAll);
    EXPECT_EQ(m_services->GetPromptAction(2), OrvixPromptAction::Ask);
    EXPECT_NE(PromptFile().find("<Action>" + std::to_string(OrvixPromptAction::NoToAll) + "</Action>"),
              std::string::npos);
}

TEST_F(PromptEditorDialog, ChangesNothingWhenItIsCancelled)
{
    EXPECT_EQ(ShowEditor([](const DialogWindow& dialog) {
                  dialog.SelectRow(List, 0);
                  dialog.Choose(Answer, L"No");
                  dialog.Press(VK_ESCAPE);
              }),
              OrvixPromptEditorResult::Unchanged);
    EXPECT_EQ(m_services->GetPromptAction(1), OrvixPromptAction::Yes);
}

TEST_F(PromptEditorDialog, ReportsNoChangeWhereAnAnswerIsChangedBack)
{
    EXPECT_EQ(ShowEditor([](const DialogWindow& dialog) {
                  dialog.SelectRow(List, 0);
                  dialog.Choose(Answer, L"No");
                  dialog.Choose(Answer, L"Yes");
                  dialog.Click(L"OK");
              }),
              OrvixPromptEditorResult::Unchanged);
    EXPECT_EQ(m_services->GetPromptAction(1), OrvixPromptAction::Yes);
}

TEST_F(PromptEditorDialog, ResetsAnAnswerToAsk)
{
    EXPECT_EQ(ShowEditor([](const DialogWindow& dialog) {
                  EXPECT_TRUE(dialog.IsEnabled(L"Reset to ask")) << "the first prompt is selected at the start";
                  dialog.SelectRow(List, 1);
                  EXPECT_FALSE(dialog.IsEnabled(L"Reset to ask")) << "it asks already";
                  dialog.SelectRow(List, 0);
                  dialog.PressAlt(L'r');
                  EXPECT_EQ(dialog.Cell(List, 0, 1), L"Ask");
                  EXPECT_EQ(dialog.Focused(), List);
                  dialog.Click(L"OK");
              }),
              OrvixPromptEditorResult::Changed);
    EXPECT_EQ(m_services->GetPromptAction(1), OrvixPromptAction::Ask);
}

TEST_F(PromptEditorDialog, IsOperatedByTabAndArrowsAlone)
{
    ShowEditor([](const DialogWindow& dialog) {
        dialog.Press(VK_TAB);
        EXPECT_EQ(dialog.Focused(), List);
        EXPECT_EQ(dialog.Chosen(Answer), L"Yes");
        dialog.Press(VK_DOWN);
        EXPECT_EQ(dialog.Chosen(Answer), L"Ask") << "the answer of the second prompt";
        dialog.Press(VK_ESCAPE);
    });
}

TEST_F(PromptEditorDialog, OffersNothingToChangeWhereTheSearchFindsNothing)
{
    ShowEditor([](const DialogWindow& dialog) {
        dialog.Type(L"nowhere");
        EXPECT_EQ(dialog.NumRows(List), 0);
        EXPECT_FALSE(dialog.IsEnabled(Answer));
        EXPECT_FALSE(dialog.IsEnabled(L"Reset to ask"));
        dialog.Press(VK_ESCAPE);
    });
}

TEST_F(PromptEditorDialog, OffersTheAnswersThatThePromptsOptionsName)
{
    ShowEditor([](const DialogWindow& dialog) {
        dialog.SelectRow(List, 0);
        EXPECT_EQ(dialog.Items(Answer), (Texts{L"Ask", L"Yes", L"Yes to all", L"No to all", L"No"}));
        dialog.SelectRow(List, 1);
        EXPECT_EQ(dialog.Items(Answer), (Texts{L"Ask", L"Yes", L"No"}));
        dialog.SelectRow(List, 2);
        EXPECT_EQ(dialog.Items(Answer), (Texts{L"Ask", L"Yes", L"No"})) << "No is its stored answer";
        dialog.Choose(Answer, L"Yes");
        dialog.SelectRow(List, 0);
        dialog.SelectRow(List, 2);
        EXPECT_EQ(dialog.Items(Answer), (Texts{L"Ask", L"Yes"}));
        dialog.Press(VK_ESCAPE);
    });
}

TEST_F(PromptEditorDialog, ShowsALockedAnswerAndLeavesItAlone)
{
    LockFirst();
    EXPECT_EQ(ShowEditor([](const DialogWindow& dialog) {
                  EXPECT_EQ(dialog.Cell(List, 0, 1), L"Yes (locked)");
                  dialog.SelectRow(List, 0);
                  EXPECT_EQ(dialog.Chosen(Answer), L"Yes");
                  EXPECT_FALSE(dialog.IsEnabled(Answer));
                  EXPECT_FALSE(dialog.IsEnabled(L"Reset to ask"));
                  dialog.SelectRow(List, 1);
                  EXPECT_TRUE(dialog.IsEnabled(Answer));
                  dialog.Click(L"OK");
              }),
              OrvixPromptEditorResult::Unchanged);
}

TEST_F(PromptEditorDialog, FindsPromptsByTextAndAnswerWhileTyping)
{
    EXPECT_EQ(ShowEditor([](const DialogWindow& dialog) {
                  dialog.SelectRow(List, 1);
                  dialog.Focus(L"Search:");
                  dialog.Type(L"OUT");
                  EXPECT_EQ(dialog.Column(List, 0), (Texts{L"Check out?"}));
                  EXPECT_EQ(dialog.Chosen(Answer), L"Ask") << "it stays selected";
                  dialog.Choose(Answer, L"Yes");
                  dialog.Click(L"OK");
              }),
              OrvixPromptEditorResult::Changed);
    EXPECT_EQ(m_services->GetPromptAction(1), OrvixPromptAction::Yes);
    EXPECT_EQ(m_services->GetPromptAction(2), OrvixPromptAction::Yes);
}

} // namespace
