#include "DialogsTest.h"
#include "Files.h"

namespace
{

constexpr const wchar_t* List = L"Prompts:";
constexpr const wchar_t* Answer = L"Answer:";

class PromptEditorDialog : public DialogsTest
{
protected:
    static constexpr std::uint32_t YesToAll = 0x2;
    static constexpr std::uint32_t NoToAll = 0x4;
    static constexpr std::uint32_t OnlyOk = 0x1;

    PromptEditorDialog()
    {
        m_services->RegisterPrompt(1, L"Overwrite?", 0x2, YesToAll | NoToAll, true);
        m_services->RegisterPrompt(2, L"Check out?", 0x1, 0, true);
        m_services->RegisterPrompt(3, L"Tell me", 0x4, OnlyOk, true);
    }

    /// Locks the first prompt, which only the file does.
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
    m_services->RegisterPrompt(4, L"a", 0x8, 0, true);
    m_services->RegisterPrompt(5, L"b", 0x10, 0, true);
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
    m_services->RegisterPrompt(4, lines.c_str(), 0x1, 0, true);
    ShowEditor([](const DialogWindow& dialog) {
        constexpr const wchar_t* Whole = L"Whole text:";
        EXPECT_EQ(dialog.Text(Whole), L"Overwrite?");
        dialog.SelectRow(List, 3);
        EXPECT_EQ(dialog.Cell(List, 3, 0).substr(0, 13), L"First second ");
        EXPECT_EQ(dialog.Text(Whole), L"First\r\nsecond\r\n" + std::wstring(1000, L'x'));
        dialog.PressAlt(L'w');
        EXPECT_EQ(dialog.Focused(), Whole);
        dialog.Type(L"more");
        EXPECT_EQ(dialog.Text(Whole).size(), 1015U) << "it can be read and not changed";
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
              1);
    EXPECT_EQ(m_services->GetPromptAction(1), 0x10U);
    EXPECT_EQ(m_services->GetPromptAction(2), 0x1U);
    EXPECT_NE(PromptFile().find("<Action>16</Action>"), std::string::npos);
}

TEST_F(PromptEditorDialog, ChangesNothingWhenItIsCancelled)
{
    EXPECT_EQ(ShowEditor([](const DialogWindow& dialog) {
                  dialog.SelectRow(List, 0);
                  dialog.Choose(Answer, L"No");
                  dialog.Press(VK_ESCAPE);
              }),
              0);
    EXPECT_EQ(m_services->GetPromptAction(1), 0x2U);
}

TEST_F(PromptEditorDialog, ReportsNoChangeWhereAnAnswerIsChangedBack)
{
    EXPECT_EQ(ShowEditor([](const DialogWindow& dialog) {
                  dialog.SelectRow(List, 0);
                  dialog.Choose(Answer, L"No");
                  dialog.Choose(Answer, L"Yes");
                  dialog.Click(L"OK");
              }),
              0);
    EXPECT_EQ(m_services->GetPromptAction(1), 0x2U);
}

TEST_F(PromptEditorDialog, ResetsAnAnswerToAsk)
{
    EXPECT_EQ(ShowEditor([](const DialogWindow& dialog) {
                  EXPECT_TRUE(dialog.IsEnabled(L"Reset to ask")) << "the first prompt is selected from the beginning";
                  dialog.SelectRow(List, 1);
                  EXPECT_FALSE(dialog.IsEnabled(L"Reset to ask")) << "it asks already";
                  dialog.SelectRow(List, 0);
                  dialog.PressAlt(L'r');
                  EXPECT_EQ(dialog.Cell(List, 0, 1), L"Ask");
                  EXPECT_EQ(dialog.Focused(), List);
                  dialog.Click(L"OK");
              }),
              1);
    EXPECT_EQ(m_services->GetPromptAction(1), 0x1U);
}

TEST_F(PromptEditorDialog, IsHandledByTabAndArrowsAlone)
{
    ShowEditor([](const DialogWindow& dialog) {
        dialog.Press(VK_TAB);
        EXPECT_EQ(dialog.Focused(), List);
        EXPECT_EQ(dialog.Chosen(Answer), L"Yes");
        dialog.Press(VK_DOWN);
        EXPECT_EQ(dialog.Chosen(Answer), L"Ask") << "the second one's";
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
        EXPECT_EQ(dialog.Items(Answer), (Texts{L"Ask", L"Yes", L"No"})) << "No is its answer as it is";
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
              0);
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
              1);
    EXPECT_EQ(m_services->GetPromptAction(1), 0x2U);
    EXPECT_EQ(m_services->GetPromptAction(2), 0x2U);
}

} // namespace
