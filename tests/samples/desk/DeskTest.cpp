#include "DeskTest.h"

#include "BuiltFile.h"
#include "Display.h"

#include <commctrl.h>
#include <objbase.h>

#include <stdexcept>

void Desk::Command(int id) const
{
    PostMessageW(m_window.Handle(), WM_COMMAND, static_cast<WPARAM>(id), 0);
    m_window.Settle();
}

void Desk::Command(int id, const wchar_t* title, const std::function<void(const DialogWindow&)>& handle) const
{
    PostMessageW(m_window.Handle(), WM_COMMAND, static_cast<WPARAM>(id), 0);
    const DialogWindow dialog = Await(title);
    EXPECT_EQ(GetWindow(dialog.Handle(), GW_OWNER), m_window.Handle());
    handle(dialog);
    m_window.Settle();
}

void Desk::Confirm(int id, const wchar_t* title) const
{
    Command(id, title, &::Confirm);
}

bool Desk::IsEnabled(int id) const
{
    return (GetMenuState(GetMenu(m_window.Handle()), static_cast<UINT>(id), MF_BYCOMMAND) & MF_GRAYED) == 0;
}

bool Desk::IsChecked(int id) const
{
    return (GetMenuState(GetMenu(m_window.Handle()), static_cast<UINT>(id), MF_BYCOMMAND) & MF_CHECKED) != 0;
}

std::wstring Desk::Status(int part) const
{
    wchar_t text[256] = {};
    SendMessageW(GetDlgItem(m_window.Handle(), IDC_STATUS), SB_GETTEXTW, static_cast<WPARAM>(part),
                 reinterpret_cast<LPARAM>(text));
    return text;
}

DialogWindow Desk::Await(const wchar_t* title) const
{
    const auto window = AwaitWindow(GetWindowThreadProcessId(m_window.Handle(), nullptr), title);
    return window ? *window : throw std::runtime_error("no window appears");
}

void Desk::Close() const
{
    m_window.Close();
}

void Confirm(const DialogWindow& dialog)
{
    PostMessageW(dialog.Handle(), WM_COMMAND, IDOK, 0);
    dialog.Settle();
}

DeskTest::DeskTest()
{
    CoInitializeEx(nullptr, COINIT_APARTMENTTHREADED);
    m_project.Write(L"one.txt", "1");
    m_project.Write(L"two.txt", "2");
    m_project.Write(L"parts\\three.txt", "3");
    m_arguments.project = m_project.Text();
    m_arguments.config = m_config.Text();
    std::filesystem::copy_file(BuiltFile(L"plugins") / L"archive.dll", m_plugins.Text() + L"\\archive.dll");
    m_arguments.plugins = m_plugins.Text() + L'\\';
}

DeskTest::~DeskTest()
{
    CoUninitialize();
}

void DeskTest::SetUp()
{
    if (!HasDisplay())
    {
        GTEST_SKIP() << "no display to show windows on";
    }
}

void DeskTest::Run(const std::function<void(const Desk&)>& handle)
{
    Run(m_arguments.project + L" - Desk", handle);
}

void DeskTest::Run(const std::wstring& title, const std::function<void(const Desk&)>& handle)
{
    const User user(title, [&](const DialogWindow& window) {
        try
        {
            handle(Desk(window));
        }
        catch (const std::exception& failure)
        {
            ADD_FAILURE() << failure.what();
        }
        for (int i = 0; i < 1000 && window.IsOpen(); ++i)
        {
            Sleep(10); // it may close after the last dialog
        }
        if (window.IsOpen())
        {
            ADD_FAILURE() << "the window is still open";
            PostThreadMessageW(GetWindowThreadProcessId(window.Handle(), nullptr), WM_QUIT, 0, 0);
            while (window.IsOpen())
            {
                Sleep(10);
            }
        }
    });
    MainWindow window(m_arguments);
    EXPECT_EQ(window.Run(), 0);
}
