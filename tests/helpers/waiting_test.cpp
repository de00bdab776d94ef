#include "Display.h"
#include "IdleWindow.h"
#include "OrvixWaitingWindow.h"
#include "PaintDelay.h"
#include "UniqueHandle.h"

#include <gtest/gtest.h>

#include <windows.h>

#include <commctrl.h>

#include <algorithm>
#include <atomic>
#include <bit>
#include <chrono>
#include <functional>
#include <limits>
#include <string>
#include <thread>
#include <vector>

namespace
{

using std::chrono::milliseconds;
using Result = OrvixWaitingWindow::Result;
constexpr UINT Posted = WM_APP + 1;

/// A window of a host, which notes what it is sent.
class HostWindow
{
public:
    HostWindow()
    {
        WNDCLASSW windowClass{};
        windowClass.lpfnWndProc = &Procedure;
        windowClass.hInstance = GetModuleHandleW(nullptr);
        windowClass.lpszClassName = L"WaitingTestHost";
        RegisterClassW(&windowClass);
        m_window = CreateWindowExW(0, L"WaitingTestHost", L"Host", WS_OVERLAPPEDWINDOW | WS_VISIBLE, 0, 0, 600, 400,
                                   nullptr, nullptr, windowClass.hInstance, nullptr);
        SetWindowLongPtrW(m_window, GWLP_USERDATA, std::bit_cast<LONG_PTR>(this));
        SetFocus(m_window);
        Handle();
        keys = 0;
    }
    HostWindow(const HostWindow&) = delete;
    HostWindow& operator=(const HostWindow&) = delete;
    ~HostWindow() { DestroyWindow(m_window); }

    HWND Get() const { return m_window; }

    /// Handles every message that waits.
    static void Handle()
    {
        MSG message;
        while (PeekMessageW(&message, nullptr, 0, 0, PM_REMOVE) && message.message != WM_QUIT)
        {
            DispatchMessageW(&message);
        }
    }

    PaintDelay painting;
    int posted = 0;
    int timers = 0;
    int keys = 0;

private:
    static LRESULT CALLBACK Procedure(HWND window, UINT message, WPARAM wParam, LPARAM lParam)
    {
        if (auto* host = std::bit_cast<HostWindow*>(GetWindowLongPtrW(window, GWLP_USERDATA)))
        {
            host->posted += message == Posted ? 1 : 0;
            host->timers += message == WM_TIMER ? 1 : 0;
            host->keys += message == WM_KEYDOWN ? 1 : 0;
            if (message == WM_PAINT)
            {
                host->painting.NotePaint();
            }
        }
        return DefWindowProcW(window, message, wParam, lParam);
    }

    HWND m_window = nullptr;
};

std::wstring TextOf(HWND window)
{
    wchar_t text[256] = L"";
    SendMessageW(window, WM_GETTEXT, std::size(text), std::bit_cast<LPARAM>(&text[0]));
    return text;
}

/// The waiting window, from another thread than the one that waits.
struct Shown
{
    HWND window = nullptr;

    std::vector<HWND> Children(const wchar_t* windowClass) const
    {
        std::vector<HWND> found;
        for (HWND child = nullptr; (child = FindWindowExW(window, child, windowClass, nullptr)) != nullptr;)
        {
            found.push_back(child);
        }
        return found;
    }
    bool Says(const std::wstring& text) const
    {
        const std::vector<HWND> labels = Children(WC_STATICW);
        return std::any_of(labels.begin(), labels.end(), [&](HWND label) { return TextOf(label) == text; });
    }
    /// The time that has passed, such as "0:01".
    std::wstring Time() const
    {
        for (HWND label : Children(WC_STATICW))
        {
            const std::wstring text = TextOf(label);
            if (text.size() >= 4 && text[text.size() - 3] == L':')
            {
                return text;
            }
        }
        return {};
    }
    HWND Button() const { return FindWindowExW(window, nullptr, WC_BUTTONW, nullptr); }
    HWND Bar() const { return FindWindowExW(window, nullptr, PROGRESS_CLASSW, nullptr); }
};

/// Waits for a window with the title; none when it does not come.
Shown Find(const wchar_t* title, milliseconds patience = milliseconds(5000))
{
    const auto end = std::chrono::steady_clock::now() + patience;
    do
    {
        HWND window = FindWindowW(nullptr, title);
        if (window != nullptr && IsWindowVisible(window))
        {
            return {window};
        }
        std::this_thread::sleep_for(milliseconds(10));
    } while (std::chrono::steady_clock::now() < end);
    return {};
}

/// Whether a wait that has begun then shows no window yet. On a busy machine a look may come too late.
bool IsEarly(std::chrono::steady_clock::time_point begin)
{
    return std::chrono::steady_clock::now() - begin < milliseconds(450);
}

/// A host that waits for work on another thread.
class Waiting : public testing::Test
{
protected:
    static constexpr const wchar_t* Title = L"Waiting test";

    void SetUp() override
    {
        if (!HasDisplay())
        {
            GTEST_SKIP() << "no display";
        }
    }

    using Work = std::function<void(OrvixWaitingWindow&)>;

    /// Waits until the work is done, or the user ends it.
    Result Wait(OrvixWaitingWindow& window, const Work& work)
    {
        ResetEvent(m_done.Get());
        std::jthread thread([&] {
            work(window);
            SetEvent(m_done.Get());
        });
        const Result result = window.Wait(m_done.Get());
        if (result == Result::Cancelled)
        {
            m_mayEnd = true;
            EXPECT_EQ(window.Wait(m_done.Get()), Result::Done);
        }
        return result;
    }
    Result Wait(HWND parent, const Work& work)
    {
        OrvixWaitingWindow window(parent, Title, L"Cancel");
        return Wait(window, work);
    }

    /// Work that lasts until the user has ended it.
    void WorkUntilCancelled() const
    {
        for (int i = 0; i < 500 && !m_mayEnd; ++i)
        {
            std::this_thread::sleep_for(milliseconds(10));
        }
    }

    UniqueKernelHandle m_done{CreateEventW(nullptr, TRUE, FALSE, nullptr)};
    std::atomic<bool> m_mayEnd = false;
};

TEST_F(Waiting, ShowsNoWindowInTheFirstHalfSecond)
{
    const HostWindow host;
    bool isInTime = false;
    for (int attempt = 0; attempt < 10 && !isInTime; ++attempt)
    {
        const auto begin = std::chrono::steady_clock::now();
        bool isShown = true;
        bool isEnabled = false;
        EXPECT_EQ(Wait(host.Get(),
                       [&](OrvixWaitingWindow&) {
                           isShown = Find(Title, milliseconds(250)).window != nullptr;
                           isEnabled = IsWindowEnabled(host.Get()) != FALSE;
                           isInTime = IsEarly(begin);
                       }),
                  Result::Done);
        if (isInTime)
        {
            EXPECT_FALSE(isShown);
            EXPECT_TRUE(isEnabled);
        }
    }
    EXPECT_TRUE(isInTime);
}

TEST_F(Waiting, ThenShowsTaskProgressAndTimeAndDisablesTheHost)
{
    const HostWindow host;
    HWND other = CreateWindowExW(0, WC_STATICW, L"Tools", WS_POPUP | WS_VISIBLE, 0, 0, 50, 50, nullptr, nullptr,
                                 nullptr, nullptr);
    HWND disabled = CreateWindowExW(0, WC_STATICW, L"Old", WS_POPUP | WS_VISIBLE | WS_DISABLED, 0, 0, 50, 50, nullptr,
                                    nullptr, nullptr, nullptr);
    Wait(host.Get(), [&](OrvixWaitingWindow& window) {
        window.SetTask(L"Pushing to origin");
        window.SetProgress(L"Writing objects: 40%", 40);
        const Shown shown = Find(Title);
        ASSERT_NE(shown.window, nullptr);
        EXPECT_EQ(GetWindow(shown.window, GW_OWNER), host.Get());
        EXPECT_FALSE(IsWindowEnabled(host.Get()));
        EXPECT_FALSE(IsWindowEnabled(other));
        EXPECT_TRUE(shown.Says(L"Pushing to origin"));
        EXPECT_TRUE(shown.Says(L"Writing objects: 40%"));
        EXPECT_EQ(SendMessageW(shown.Bar(), PBM_GETPOS, 0, 0), 40);
        EXPECT_EQ(TextOf(shown.Button()), L"Cancel");
        window.SetProgress(L"Resolving", -1);
        std::this_thread::sleep_for(milliseconds(1200));
        EXPECT_TRUE(shown.Says(L"Resolving"));
        const std::wstring time = shown.Time();
        EXPECT_TRUE(!time.empty() && time != L"0:00") << "more than a second has passed";
    });
    EXPECT_EQ(FindWindowW(nullptr, Title), nullptr);
    EXPECT_TRUE(IsWindowEnabled(host.Get()));
    EXPECT_TRUE(IsWindowEnabled(other));
    EXPECT_FALSE(IsWindowEnabled(disabled));
    DestroyWindow(other);
    DestroyWindow(disabled);
}

TEST_F(Waiting, PaintsTheHostAllTheTime)
{
    long long shortest = std::numeric_limits<long long>::max();
    for (int attempt = 0; attempt < 5 && shortest > 100; ++attempt) // a busy machine may stop every program for a while
    {
        HostWindow host;
        IdleWindow idle;
        Wait(host.Get(), [&](OrvixWaitingWindow&) {
            for (int i = 0; i < 150; ++i)
            {
                host.painting.Ask(host.Get());
                idle.Ask();
                std::this_thread::sleep_for(milliseconds(10));
            }
        });
        EXPECT_GT(host.painting.Count(), 20u);
        shortest = std::min(shortest, host.painting.LongestMilliseconds() - idle.LongestMilliseconds());
    }
    EXPECT_LE(shortest, 100);
}

TEST_F(Waiting, PaintsWithoutAWindowWhenThereIsNoParent)
{
    HostWindow host;
    Wait(nullptr, [&](OrvixWaitingWindow&) {
        for (int i = 0; i < 80; ++i)
        {
            host.painting.Ask(host.Get());
            std::this_thread::sleep_for(milliseconds(10));
        }
        EXPECT_EQ(FindWindowW(nullptr, Title), nullptr);
        EXPECT_TRUE(IsWindowEnabled(host.Get()));
    });
    EXPECT_GT(host.painting.Count(), 10u);
}

TEST_F(Waiting, EndsByTheButton)
{
    const HostWindow host;
    EXPECT_EQ(Wait(host.Get(),
                   [&](OrvixWaitingWindow&) {
                       const Shown shown = Find(Title);
                       SendMessageW(shown.Button(), BM_CLICK, 0, 0);
                       WorkUntilCancelled();
                       std::this_thread::sleep_for(milliseconds(150));
                       EXPECT_FALSE(IsWindowEnabled(shown.Button()));
                       EXPECT_FALSE(IsWindowEnabled(host.Get())) << "the work has not ended yet";
                   }),
              Result::Cancelled);
}

TEST_F(Waiting, EndsByEscapeAndByTheSystemsClose)
{
    const HostWindow host;
    EXPECT_EQ(Wait(host.Get(),
                   [&](OrvixWaitingWindow&) {
                       PostMessageW(Find(Title).Button(), WM_KEYDOWN, VK_ESCAPE, 0);
                       WorkUntilCancelled();
                   }),
              Result::Cancelled);
    m_mayEnd = false;
    EXPECT_EQ(Wait(host.Get(),
                   [&](OrvixWaitingWindow&) {
                       PostMessageW(Find(Title).window, WM_SYSCOMMAND, SC_CLOSE, 0);
                       WorkUntilCancelled();
                   }),
              Result::Cancelled);
}

TEST_F(Waiting, LeavesPostedMessagesAndTimersOfTheHostInItsQueue)
{
    HostWindow host;
    SetTimer(host.Get(), 1, 20, nullptr);
    Wait(host.Get(), [&](OrvixWaitingWindow&) {
        PostMessageW(host.Get(), Posted, 0, 0);
        Find(Title);
        PostMessageW(host.Get(), Posted, 0, 0);
        std::this_thread::sleep_for(milliseconds(200));
    });
    EXPECT_EQ(host.posted, 0);
    EXPECT_EQ(host.timers, 0);
    HostWindow::Handle();
    EXPECT_EQ(host.posted, 2);
    EXPECT_GT(host.timers, 0);
}

TEST_F(Waiting, AnswersMessagesThatOtherThreadsSend)
{
    HostWindow host;
    Wait(host.Get(), [&](OrvixWaitingWindow&) {
        SendMessageW(host.Get(), Posted, 0, 0);
        Find(Title);
        SendMessageW(host.Get(), Posted, 0, 0);
    });
    EXPECT_EQ(host.posted, 2);
}

TEST_F(Waiting, DropsWhatTheUserTypesWhileTheWindowIsShown)
{
    HostWindow host;
    const auto type = [] {
        INPUT keys[2]{};
        keys[0].type = keys[1].type = INPUT_KEYBOARD;
        keys[0].ki.wVk = keys[1].ki.wVk = 'A';
        keys[1].ki.dwFlags = KEYEVENTF_KEYUP;
        SendInput(2, keys, sizeof keys[0]);
        std::this_thread::sleep_for(milliseconds(100));
    };
    bool isInTime = false;
    for (int attempt = 0; attempt < 10 && !isInTime; ++attempt)
    {
        const auto begin = std::chrono::steady_clock::now();
        host.keys = 0;
        Wait(host.Get(), [&](OrvixWaitingWindow&) { type(); });
        isInTime = IsEarly(begin);
        EXPECT_EQ(host.keys, 0);
        HostWindow::Handle();
        EXPECT_TRUE(host.keys == 1 || !isInTime) << "typed in the first half second";
    }
    EXPECT_TRUE(isInTime);

    host.keys = 0;
    Wait(host.Get(), [&](OrvixWaitingWindow&) {
        Find(Title);
        type();
    });
    HostWindow::Handle();
    EXPECT_EQ(host.keys, 0);
    EXPECT_EQ(GetFocus(), host.Get());
}

TEST_F(Waiting, KeepsTheEndOfTheHost)
{
    const HostWindow host;
    PostQuitMessage(7);
    Wait(host.Get(), [&](OrvixWaitingWindow&) { Find(Title); });
    MSG message;
    ASSERT_TRUE(PeekMessageW(&message, nullptr, WM_QUIT, WM_QUIT, PM_REMOVE));
    EXPECT_EQ(message.wParam, 7u);
}

TEST_F(Waiting, TakesTurnsOfALoopThatWaitsByItself)
{
    HostWindow host;
    const auto begin = std::chrono::steady_clock::now();
    OrvixWaitingWindow window(host.Get(), Title, L"Cancel");
    window.SetTask(L"Waiting for two things");
    EXPECT_EQ(window.Update(), Result::Done);
    EXPECT_TRUE(FindWindowW(nullptr, Title) == nullptr || !IsEarly(begin));
    PostMessageW(host.Get(), Posted, 0, 0);
    PostQuitMessage(7);
    host.painting.Ask(host.Get());
    std::jthread user([] {
        const Shown shown = Find(Title);
        EXPECT_TRUE(shown.Says(L"Waiting for two things"));
        SendMessageW(shown.Button(), BM_CLICK, 0, 0);
    });
    Result result = Result::Done;
    for (int i = 0; i < 1000 && result == Result::Done; ++i)
    {
        std::this_thread::sleep_for(milliseconds(10));
        result = window.Update();
    }
    EXPECT_EQ(result, Result::Cancelled);
    EXPECT_TRUE(window.IsCancelled());
    EXPECT_EQ(window.Update(), Result::Done) << "it is said once";
    EXPECT_GT(host.painting.Count(), 0u);
    EXPECT_EQ(host.posted, 0);
    MSG message;
    ASSERT_TRUE(PeekMessageW(&message, nullptr, WM_QUIT, WM_QUIT, PM_REMOVE));
    EXPECT_EQ(message.wParam, 7u);
}

} // namespace
