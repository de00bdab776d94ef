#include "DeskTest.h"
#include "Files.h"

#include <commctrl.h>

namespace
{

class DeskWindow : public DeskTest
{
};

TEST_F(DeskWindow, ShowsTheFilesOfTheFolderWithTheirStates)
{
    Run([this](const Desk& desk) {
        EXPECT_EQ(desk.Names(), (Texts{L"one.txt", L"two.txt"}));
        EXPECT_EQ(desk.States(), (Texts{L"Not controlled", L"Not controlled"}));
        EXPECT_EQ(desk.Status(0), L"2 files in " + m_project.Text());
        EXPECT_EQ(desk.Status(1), L"Archive");
        EXPECT_TRUE(desk.IsEnabled(ID_ADD));
        EXPECT_FALSE(desk.IsEnabled(ID_CHECK_IN));
        m_project.Write(L"later.txt", "4");
        desk.Window().Press(VK_F5);
        EXPECT_EQ(desk.Names(), (Texts{L"later.txt", L"one.txt", L"two.txt"}));
        desk.Close();
    });
}

TEST_F(DeskWindow, ShowsAFolderOfTheTreeAndTheFoldersBelow)
{
    Run([this](const Desk& desk) {
        desk.Command(ID_SUBFOLDERS);
        EXPECT_EQ(desk.Names(), (Texts{L"one.txt", L"parts\\three.txt", L"two.txt"}));
        desk.Window().Focus(L"Folders");
        desk.Window().Press(VK_DOWN);
        EXPECT_EQ(desk.Names(), (Texts{L"three.txt"}));
        EXPECT_EQ(desk.Status(0), L"1 file in " + m_project.File(L"parts"));
        desk.Close();
    });
}

TEST_F(DeskWindow, IsUsedByKeyboard)
{
    Run([](const Desk& desk) {
        const DialogWindow& window = desk.Window();
        EXPECT_EQ(window.TabStops(), (Texts{L"Folders", Desk::Files, L"Output"}));
        EXPECT_EQ(window.Focused(), Desk::Files);
        window.Press(VK_TAB);
        EXPECT_EQ(window.Focused(), L"Output");
        window.Press(VK_TAB);
        EXPECT_EQ(window.Focused(), L"Folders");
        window.PressAlt(L'l');
        EXPECT_EQ(window.Focused(), Desk::Files);
        window.Press(VK_ESCAPE);
        EXPECT_TRUE(window.IsOpen());
        desk.Confirm(ID_ADD, L"Add");
        EXPECT_EQ(window.Focused(), Desk::Files);
        window.SelectRow(Desk::Files, 1);
        window.Press(VK_RETURN); // the properties
        EXPECT_NE(desk.Output().find(L"two.txt"), std::wstring::npos);
        desk.Close();
    });
}

TEST_F(DeskWindow, ShowsWhatTheAdministratorExcludes)
{
    WriteBytes(m_config.Path() / L"OrvixProviders.xml",
               "<OrvixProviders><Provider><Name>Archive</Name><Filters><Filter><Name>drafts</Name>"
               "<FileType>tmp</FileType></Filter></Filters></Provider></OrvixProviders>");
    m_project.Write(L"draft.tmp", "");
    Run([](const Desk& desk) {
        EXPECT_EQ(desk.States(), (Texts{L"Excluded by the administrator", L"Not controlled", L"Not controlled"}));
        desk.Window().SelectRow(Desk::Files, 0);
        EXPECT_FALSE(desk.IsEnabled(ID_ADD));
        desk.Window().SelectRow(Desk::Files, 1);
        EXPECT_TRUE(desk.IsEnabled(ID_ADD));
        desk.Close();
    });
}

TEST_F(DeskWindow, OpensTheProjectInTheFixedRoot)
{
    WriteBytes(m_config.Path() / L"OrvixProviders.xml",
               "<OrvixProviders><Provider><Name>Archive</Name><FixedProjectRoot>" + m_project.Path(L"parts").string() +
                   "</FixedProjectRoot></Provider></OrvixProviders>");
    Run(m_project.File(L"parts") + L" - Desk", [](const Desk& desk) {
        EXPECT_EQ(desk.Names(), (Texts{L"three.txt"}));
        desk.Close();
    });
}

TEST_F(DeskWindow, GivesItsColorsToTheDialogs)
{
    Run([](const Desk& desk) {
        const auto background = [](const DialogWindow& window, const std::wstring& list) {
            return static_cast<COLORREF>(SendMessageW(window.Control(list), LVM_GETBKCOLOR, 0, 0));
        };
        const COLORREF light = background(desk.Window(), Desk::Files);
        desk.Command(ID_DARK);
        const COLORREF dark = background(desk.Window(), Desk::Files);
        EXPECT_EQ(light, GetSysColor(COLOR_WINDOW));
        EXPECT_LT(GetRValue(dark), 64);
        desk.Command(ID_ADD, L"Add", [&](const DialogWindow& dialog) {
            EXPECT_EQ(background(dialog, L"Files:"), dark);
            dialog.Press(VK_ESCAPE);
        });
        desk.Close();
    });
    Run([](const Desk& desk) { // the next one remembers
        EXPECT_TRUE(desk.IsChecked(ID_DARK));
        desk.Close();
    });
}

TEST_F(DeskWindow, SaysThatAProjectCannotBeOpened)
{
    m_arguments.project = m_project.File(L"nowhere");
    const std::wstring reason = L"There is no folder " + m_arguments.project + L".";
    Run(L"Desk", [&](const Desk& desk) {
        desk.Await(L"Desk cannot do this").Press(VK_RETURN);
        EXPECT_EQ(desk.Output(), reason + L"\r\n");
        EXPECT_FALSE(desk.IsEnabled(ID_REFRESH));
        desk.Close();
    });
    m_arguments.unattended = true;
    Run(L"Desk", [&](const Desk& desk) {
        EXPECT_EQ(desk.Output(), reason + L"\r\n"); // and no message that nobody closes
        desk.Close();
    });
}

} // namespace
