#include "BuiltFile.h"
#include "DeskTest.h"
#include "UniqueHandle.h"

#include <bit>
#include <chrono>
#include <set>

namespace
{

using Clock = std::chrono::steady_clock;
constexpr std::chrono::seconds Patience{30};

struct Search
{
    const std::wstring& title;
    const std::set<HWND>& known;
    HWND found = nullptr;
};

BOOL CALLBACK Compare(HWND window, LPARAM parameter)
{
    auto& search = *std::bit_cast<Search*>(parameter);
    wchar_t title[512] = {};
    wchar_t name[64] = {};
    GetWindowTextW(window, title, 512);
    GetClassNameW(window, name, 64);
    if (IsWindowVisible(window) != FALSE && name == std::wstring(L"OrvixDesk") && title == search.title &&
        !search.known.contains(window))
    {
        search.found = window;
    }
    return search.found == nullptr ? TRUE : FALSE;
}

/// Waits for a window of the program in any process; null when none appears.
HWND AwaitProgram(const std::wstring& title, const std::set<HWND>& known = {})
{
    for (const auto end = Clock::now() + Patience; Clock::now() < end; Sleep(20))
    {
        Search search{title, known};
        EnumWindows(&Compare, reinterpret_cast<LPARAM>(&search));
        if (search.found != nullptr)
        {
            return search.found;
        }
    }
    return nullptr;
}

/// Closes a window of the program; the exit code of its process.
DWORD CloseProgram(HWND window)
{
    DWORD id = 0;
    GetWindowThreadProcessId(window, &id);
    const UniqueKernelHandle process(OpenProcess(SYNCHRONIZE | PROCESS_QUERY_LIMITED_INFORMATION, FALSE, id));
    PostMessageW(window, WM_CLOSE, 0, 0);
    DWORD code = STILL_ACTIVE;
    if (WaitForSingleObject(process.Get(), 30'000) == WAIT_OBJECT_0)
    {
        GetExitCodeProcess(process.Get(), &code);
    }
    return code;
}

class DeskProgram : public DeskTest
{
protected:
    /// Starts the program.
    static UniqueKernelHandle Start(std::wstring commandLine)
    {
        STARTUPINFOW start{};
        start.cb = sizeof start;
        PROCESS_INFORMATION process{};
        EXPECT_TRUE(CreateProcessW(BuiltFile(L"desk.exe").c_str(), commandLine.data(), nullptr, nullptr, FALSE, 0,
                                   nullptr, nullptr, &start, &process));
        const UniqueKernelHandle thread(process.hThread);
        return UniqueKernelHandle(process.hProcess);
    }
};

TEST_F(DeskProgram, HasOneProjectPerProcessAndWindow)
{
    const UniqueKernelHandle process =
        Start(L"desk --config \"" + m_config.Text() + L"\" --provider archive \"" + m_project.Text() + L'"');
    const HWND first = AwaitProgram(m_project.Text() + L" - Desk");
    ASSERT_NE(first, nullptr);
    PostMessageW(first, WM_COMMAND, ID_NEW_WINDOW, 0);
    const HWND second = AwaitProgram(L"Desk", {first});
    ASSERT_NE(second, nullptr);
    DWORD id = 0;
    GetWindowThreadProcessId(second, &id);
    EXPECT_NE(id, GetProcessId(process.Get()));
    EXPECT_EQ(CloseProgram(second), 0U);
    EXPECT_TRUE(IsWindow(first));
    EXPECT_EQ(CloseProgram(first), 0U);
}

TEST_F(DeskProgram, EndsWithoutAMessageWhenNobodyIsThere)
{
    const UniqueKernelHandle process = Start(L"desk --unattended --colour");
    ASSERT_EQ(WaitForSingleObject(process.Get(), 30'000), WAIT_OBJECT_0);
    DWORD code = 0;
    GetExitCodeProcess(process.Get(), &code);
    EXPECT_EQ(code, 2U);
}

} // namespace
