#include "Arguments.h"
#include "ClientAccess.h"
#include "DeskTest.h"
#include "Failure.h"
#include "FileState.h"
#include "OrvixFileFlags.h"
#include "OutputPane.h"
#include "Progress.h"
#include "Theme.h"

#include <commctrl.h>

#include <thread>

namespace
{

namespace State = OrvixFileState;

class DeskParts : public DeskTest
{
protected:
    struct WindowCloser
    {
        void operator()(HWND window) const { DestroyWindow(window); }
    };

    std::unique_ptr<std::remove_pointer_t<HWND>, WindowCloser> m_window{CreateWindowExW(
        0, L"Static", L"Parts", WS_POPUP | WS_VISIBLE, 0, 0, 300, 200, nullptr, nullptr, nullptr, nullptr)};
};

Arguments Read(std::vector<const wchar_t*> arguments)
{
    arguments.insert(arguments.begin(), L"desk");
    return ReadArguments(static_cast<int>(arguments.size()), arguments.data());
}

TEST_F(DeskParts, TheCommandLineIsRead)
{
    const Arguments arguments = Read({L"--unattended", L"--provider", L"Depot", L"--plugins", L"C:\\plug/ins",
                                      L"--config", m_config.Text().c_str(), L"C:\\town\\..\\bridge\\"});
    EXPECT_TRUE(arguments.unattended);
    EXPECT_EQ(arguments.provider, L"Depot");
    EXPECT_EQ(arguments.plugins, L"C:\\plug\\ins\\");
    EXPECT_EQ(arguments.config, m_config.Text());
    EXPECT_EQ(arguments.project, L"C:\\bridge");
}

TEST_F(DeskParts, AWrongCommandLineIsRefused)
{
    EXPECT_THROW(Read({L"--provider"}), Failure);
    EXPECT_THROW(Read({L"--colour"}), Failure);
    EXPECT_THROW(Read({L"one", L"two"}), Failure);
    EXPECT_THROW(Read({L""}), Failure);
    m_project.Write(L"file", "");
    EXPECT_THROW(Read({L"--config", m_project.File(L"file").c_str()}), Failure);
}

TEST_F(DeskParts, TheMostImportantFactOfAStateHasTheIcon)
{
    const auto state = [](unsigned long flags) { return StateOf({L"", L"", flags, false}); };
    EXPECT_EQ(state(0).icon, Icon::Unknown);
    EXPECT_EQ(state(State::NotControlled).icon, Icon::NotControlled);
    EXPECT_EQ(state(State::Controlled).icon, Icon::CheckedIn);
    const FileState late = state(State::Controlled | State::CheckedOut | State::Modified | State::OutOfDate);
    EXPECT_EQ(late.icon, Icon::OutOfDate);
    EXPECT_EQ(late.words, L"Checked out, Modified, Out of date");
}

TEST_F(DeskParts, OutputComesFromAnyThreadInOrder)
{
    OutputPane output;
    output.Add(L"before the window");
    output.Create(m_window.get(), 1);
    const Theme theme;
    ClientAccess access(output, theme, false);
    std::thread([&access] {
        for (int i = 0; i < 100; ++i)
        {
            access.OutputText(std::to_wstring(i).c_str(), 0);
        }
    }).join();
    MSG message{};
    ASSERT_TRUE(PeekMessageW(&message, m_window.get(), OutputPane::Arrived, OutputPane::Arrived, PM_REMOVE));
    EXPECT_EQ(GetWindowTextLengthW(output.Window()), 0);
    access.OutputText(L"the end", 0); // on the window's thread: shown at once
    std::wstring expected = L"before the window\r\n";
    for (int i = 0; i < 100; ++i)
    {
        expected += std::to_wstring(i) + L"\r\n";
    }
    expected += L"the end\r\n";
    std::wstring shown(expected.size() + 10, L'\0');
    shown.resize(
        static_cast<std::size_t>(GetWindowTextW(output.Window(), shown.data(), static_cast<int>(shown.size()))));
    EXPECT_EQ(shown, expected);
}

TEST_F(DeskParts, RelaysServeAUserInterfaceLibrary)
{
    OutputPane output;
    output.Create(m_window.get(), 1);
    const Theme theme;
    ClientAccess access(output, theme, false);
    wchar_t text[] = L"hello";
    EXPECT_EQ(access.RelayA(text, nullptr, nullptr, nullptr), 1);
    EXPECT_EQ(access.RelayA(nullptr, nullptr, nullptr, nullptr), 0);
    EXPECT_EQ(GetWindowTextLengthW(output.Window()), 7);
    EXPECT_EQ(access.RelayB(nullptr, nullptr, nullptr, nullptr), reinterpret_cast<std::intptr_t>(m_window.get()));
}

TEST_F(DeskParts, ProgressIsShownAndLetsThePostedMessagesWait)
{
    const INITCOMMONCONTROLSEX classes{sizeof classes, ICC_PROGRESS_CLASS};
    InitCommonControlsEx(&classes);
    const HWND bar =
        CreateWindowExW(0, PROGRESS_CLASSW, L"", WS_CHILD, 0, 0, 100, 20, m_window.get(), nullptr, nullptr, nullptr);
    {
        Progress progress(bar);
        EXPECT_TRUE(IsWindowVisible(bar));
        PostMessageW(m_window.get(), WM_CLOSE, 0, 0);
        Sleep(200); // ticks may be coarse
        EXPECT_TRUE(progress.Step(30, 120));
        EXPECT_EQ(SendMessageW(bar, PBM_GETPOS, 0, 0), 25);
        EXPECT_TRUE(IsWindow(m_window.get()));
        PostMessageW(m_window.get(), WM_KEYDOWN, VK_ESCAPE, 1);
        Sleep(200); // ticks may be coarse
        EXPECT_FALSE(progress.Step(60, 120));
    }
    EXPECT_FALSE(IsWindowVisible(bar));
}

} // namespace
