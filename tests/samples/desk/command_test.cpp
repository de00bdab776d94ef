#include "DeskTest.h"

#include <commctrl.h>
#include <prsht.h>

#include <algorithm>

namespace
{

class DeskCommands : public DeskTest
{
protected:
    /// Puts all files of the folder under control and checks the first one out.
    static void AddAllAndCheckOutOne(const Desk& desk)
    {
        desk.Confirm(ID_ADD, L"Add");
        desk.Window().SelectRow(Desk::Files, 0);
        desk.Confirm(ID_CHECK_OUT, L"Check out");
    }
};

constexpr const wchar_t* NoProvider = L"There is no provider. Tools, Options lists those that can be used.\r\n";

bool Contains(const std::wstring& text, const std::wstring& part)
{
    return text.find(part) != std::wstring::npos;
}

TEST_F(DeskCommands, AddCheckOutAndCheckIn)
{
    Run([this](const Desk& desk) {
        AddAllAndCheckOutOne(desk);
        EXPECT_EQ(desk.States(), (Texts{L"Checked out", L"Checked in"}));
        EXPECT_EQ(desk.Status(), L"Check out: done");
        m_project.Write(L"one.txt", "changed");
        desk.Command(ID_REFRESH);
        EXPECT_EQ(desk.States(), (Texts{L"Checked out, Modified", L"Checked in"}));

        desk.Command(ID_CHECK_IN, L"Check in", [](const DialogWindow& dialog) {
            EXPECT_EQ(dialog.Column(L"Files:", 0), (Texts{L"one.txt"}));
            dialog.Focus(L"Comment:");
            dialog.Type(L"louder");
            Confirm(dialog);
        });
        EXPECT_EQ(desk.States(), (Texts{L"Checked in", L"Checked in"}));
        EXPECT_TRUE(IsReadOnly(m_project.Path(L"one.txt")));
        desk.Command(ID_HISTORY);
        EXPECT_TRUE(Contains(desk.Output(), L"Added: 2 files\r\n"));
        EXPECT_TRUE(Contains(desk.Output(), L"Checked in: 1 file\r\n"));
        EXPECT_TRUE(Contains(desk.Output(), L"louder"));
        desk.Close();
    });
}

TEST_F(DeskCommands, ActOnTheSelectedFilesOrOnAll)
{
    Run([](const Desk& desk) {
        desk.Window().SelectRow(Desk::Files, 1);
        desk.Confirm(ID_ADD, L"Add");
        EXPECT_EQ(desk.States(), (Texts{L"Not controlled", L"Checked in"}));
        EXPECT_FALSE(desk.IsEnabled(ID_ADD)); // the second one is still selected
        EXPECT_TRUE(desk.IsEnabled(ID_CHECK_OUT));
        desk.Window().UnselectRow(Desk::Files, 1);
        EXPECT_TRUE(desk.IsEnabled(ID_ADD));
        desk.Close();
    });
}

TEST_F(DeskCommands, ACancelledDialogChangesNothing)
{
    Run([](const Desk& desk) {
        desk.Command(ID_ADD, L"Add", [](const DialogWindow& dialog) { dialog.Press(VK_ESCAPE); });
        EXPECT_EQ(desk.Status(), L"Add: cancelled");
        EXPECT_EQ(desk.States(), (Texts{L"Not controlled", L"Not controlled"}));
        desk.Close();
    });
}

TEST_F(DeskCommands, ACodeFreezeVetoesCheckIns)
{
    m_arguments.unattended = true;
    Run([](const Desk& desk) {
        desk.Command(ID_ADD);
        desk.Command(ID_CHECK_OUT);
        desk.Command(ID_FREEZE);
        EXPECT_TRUE(desk.IsChecked(ID_FREEZE));
        desk.Command(ID_CHECK_IN);
        EXPECT_EQ(desk.Status(), L"Check in: cancelled");
        EXPECT_EQ(desk.States(), (Texts{L"Checked out", L"Checked out"}));
        EXPECT_TRUE(Contains(desk.Output(), L"Code freeze: nothing is checked in."));

        desk.Command(ID_FREEZE);
        desk.Command(ID_CHECK_IN);
        EXPECT_EQ(desk.Status(), L"Check in: done");
        EXPECT_EQ(desk.States(), (Texts{L"Checked in", L"Checked in"}));
        desk.Close();
    });
}

TEST_F(DeskCommands, AskNothingWhenNobodyIsThere)
{
    m_arguments.unattended = true;
    Run([](const Desk& desk) {
        EXPECT_EQ(desk.Status(1), L"Archive, unattended");
        desk.Command(ID_ADD);
        desk.Command(ID_CHECK_OUT);
        desk.Command(ID_UNDO); // loses changes, so its answer is no
        EXPECT_EQ(desk.Status(), L"Undo check-out: cancelled");
        EXPECT_EQ(desk.States(), (Texts{L"Checked out", L"Checked out"}));
        desk.Close(); // without a question about the files
    });
}

TEST_F(DeskCommands, TheLatestVersionReplacesNoChange)
{
    m_arguments.unattended = true;
    Run([](const Desk& desk) {
        desk.Command(ID_ADD);
        EXPECT_TRUE(desk.IsEnabled(ID_GET_LATEST));
        desk.Command(ID_CHECK_OUT);
        EXPECT_FALSE(desk.IsEnabled(ID_GET_LATEST));
        desk.Close();
    });
}

TEST_F(DeskCommands, RememberAnAnswerUntilItIsTakenBack)
{
    Run([](const Desk& desk) {
        desk.Command(ID_ADD, L"Add", [](const DialogWindow& dialog) {
            dialog.Click(L"Remember my answer");
            Confirm(dialog);
        });
        desk.Close();
    });
    m_project.Write(L"more.txt", "4");
    Run([](const Desk& desk) {
        desk.Command(ID_ADD); // without a dialog
        EXPECT_EQ(desk.States(), (Texts{L"Checked in", L"Checked in", L"Checked in"}));
        desk.Command(ID_ANSWERS, L"Stored answers", [](const DialogWindow& dialog) {
            const Texts prompts = dialog.Column(L"Prompts:", 0);
            const auto row = std::find(prompts.begin(), prompts.end(), L"Add: confirm the files") - prompts.begin();
            dialog.SelectRow(L"Prompts:", static_cast<int>(row));
            EXPECT_EQ(dialog.Chosen(L"Answer:"), L"Yes");
            dialog.Click(L"Reset to ask");
            Confirm(dialog);
        });
        desk.Close();
    });
    m_project.Write(L"still more.txt", "5");
    Run([](const Desk& desk) {
        desk.Confirm(ID_ADD, L"Add");
        desk.Close();
    });
}

TEST_F(DeskCommands, TheProgramAsksBeforeFilesStayCheckedOut)
{
    Run([](const Desk& desk) {
        AddAllAndCheckOutOne(desk);
        desk.Close();
        const DialogWindow question = desk.Await(L"Desk");
        EXPECT_EQ(question.Buttons(), (Texts{L"Yes", L"No"}));
        desk.Close(); // while the question is open
        question.Click(L"No");
        EXPECT_TRUE(desk.Window().IsOpen());
        desk.Close();
        desk.Await(L"Desk").Click(L"Yes");
    });
}

TEST_F(DeskCommands, OptionsShowTheProviders)
{
    Run([](const Desk& desk) {
        desk.Command(ID_PROVIDERS, L"Options", [&](const DialogWindow& sheet) {
            const DialogWindow page = sheet.Child(PropSheet_GetCurrentPageHwnd(sheet.Handle()));
            const std::wstring list = L"Providers; clear those that this program is not to use:";
            EXPECT_EQ(page.Column(list, 0), (Texts{L"Archive"}));
            EXPECT_EQ(page.Column(list, 1), (Texts{L"in use"}));
            EXPECT_TRUE(page.IsRowChecked(list, 0));
            page.Click(L"Options...");
            const DialogWindow message = desk.Await(L"Provider");
            message.Press(VK_RETURN);
            ListView_SetCheckState(page.Control(list), 0, FALSE);
            sheet.Click(L"OK");
        });
        desk.Close();
    });
    m_arguments.unattended = true;
    Run(L"Desk", [&](const Desk& desk) {
        EXPECT_EQ(desk.Output(), NoProvider);
        desk.Close();
    });
}

TEST_F(DeskCommands, OptionsWithoutAnyProviderOfferNothing)
{
    const TempFolder empty;
    m_arguments.plugins = empty.Text() + L'\\';
    m_arguments.unattended = true;
    Run(L"Desk", [&](const Desk& desk) {
        EXPECT_EQ(desk.Output(), NoProvider);
        desk.Command(ID_PROVIDERS, L"Options", [](const DialogWindow& sheet) {
            const DialogWindow page = sheet.Child(PropSheet_GetCurrentPageHwnd(sheet.Handle()));
            for (const wchar_t* button : {L"Use", L"Options...", L"Program"})
            {
                EXPECT_FALSE(page.IsEnabled(button)) << button;
            }
            sheet.Click(L"OK");
        });
        desk.Close();
    });
}

} // namespace
