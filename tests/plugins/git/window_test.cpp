// The host's window while Git works: painted, disabled, and with a way to cancel.

#include "Display.h"
#include "GitTest.h"
#include "IdleWindow.h"
#include "PaintDelay.h"

#include <windows.h>

#include <commctrl.h>

#include <algorithm>
#include <atomic>
#include <bit>
#include <chrono>
#include <functional>
#include <limits>
#include <mutex>
#include <string>
#include <thread>
#include <vector>

namespace
{

using namespace std::chrono_literals;

constexpr UINT CallProvider = WM_APP + 1;
constexpr int ManyFiles = 20000;

/// The host's window. It notes when it is painted, and calls the provider when it is told to.
class HostWindow
{
public:
    HostWindow()
    {
        WNDCLASSW windowClass{};
        windowClass.lpfnWndProc = &Procedure;
        windowClass.hInstance = GetModuleHandleW(nullptr);
        windowClass.lpszClassName = L"GitTestHost";
        RegisterClassW(&windowClass);
        m_window = CreateWindowExW(0, L"GitTestHost", L"Host", WS_OVERLAPPEDWINDOW | WS_VISIBLE, 0, 0, 600, 400,
                                   nullptr, nullptr, windowClass.hInstance, nullptr);
        SetWindowLongPtrW(m_window, GWLP_USERDATA, std::bit_cast<LONG_PTR>(this));
    }
    HostWindow(const HostWindow&) = delete;
    HostWindow& operator=(const HostWindow&) = delete;
    ~HostWindow() { DestroyWindow(m_window); }

    HWND Get() const { return m_window; }

    PaintDelay painting;
    std::function<void()> onCall;

private:
    static LRESULT CALLBACK Procedure(HWND window, UINT message, WPARAM wParam, LPARAM lParam)
    {
        if (auto* host = std::bit_cast<HostWindow*>(GetWindowLongPtrW(window, GWLP_USERDATA)))
        {
            if (message == WM_PAINT)
            {
                host->painting.NotePaint();
            }
            if (message == CallProvider && host->onCall)
            {
                host->onCall();
            }
        }
        return DefWindowProcW(window, message, wParam, lParam);
    }

    HWND m_window = nullptr;
};

/// The waiting window, from another thread.
HWND FindWaitingWindow()
{
    HWND window = FindWindowW(L"#32770", L"Git");
    return window != nullptr && IsWindowVisible(window) ? window : nullptr;
}

std::wstring ProgressText(HWND window)
{
    std::wstring progress;
    for (HWND label = nullptr; (label = FindWindowExW(window, label, WC_STATICW, nullptr)) != nullptr;)
    {
        wchar_t text[256] = L"";
        SendMessageW(label, WM_GETTEXT, std::size(text), std::bit_cast<LPARAM>(&text[0]));
        if (std::wstring(text).find(L" of ") != std::wstring::npos)
        {
            progress = text;
        }
    }
    return progress;
}

/// A user who looks at the waiting window and may press its button. The host's window is asked to paint all the time.
class Watcher
{
public:
    /// Presses Cancel when `wantsCancel` says so.
    Watcher(HostWindow& host, std::function<bool(HWND)> wantsCancel)
        : m_thread([this, &host, wantsCancel = std::move(wantsCancel)] { Watch(host, wantsCancel); })
    {
    }
    Watcher(const Watcher&) = delete;
    Watcher& operator=(const Watcher&) = delete;
    ~Watcher() { Stop(); }

    void Stop()
    {
        m_stop = true;
        if (m_thread.joinable())
        {
            m_thread.join();
        }
    }

    /// How much longer than an idle window the host's window waited to be painted. Read after `Stop`.
    long long LongestGap(const HostWindow& host) const
    {
        return host.painting.LongestMilliseconds() - m_idle.LongestMilliseconds();
    }

    std::atomic<bool> sawWindow = false;
    std::atomic<bool> hostWasDisabled = false;
    Texts progress; ///< every text that was shown; read after `Stop`

private:
    void Watch(HostWindow& host, const std::function<bool(HWND)>& wantsCancel)
    {
        bool pressed = false;
        while (!m_stop)
        {
            host.painting.Ask(host.Get());
            m_idle.Ask();
            if (HWND window = FindWaitingWindow())
            {
                sawWindow = true;
                hostWasDisabled = hostWasDisabled || IsWindowEnabled(host.Get()) == FALSE;
                std::wstring text = ProgressText(window);
                if (!text.empty() && (progress.empty() || progress.back() != text))
                {
                    progress.push_back(std::move(text));
                }
                if (!pressed && wantsCancel(window))
                {
                    pressed = true;
                    PostMessageW(FindWindowExW(window, nullptr, WC_BUTTONW, nullptr), BM_CLICK, 0, 0);
                }
            }
            std::this_thread::sleep_for(10ms);
        }
    }

    std::atomic<bool> m_stop = false;
    IdleWindow m_idle;
    std::thread m_thread;
};

bool Never(HWND)
{
    return false;
}

class GitWindow : public GitTest
{
protected:
    void SetUp() override
    {
        if (!HasDisplay())
        {
            GTEST_SKIP() << "no display";
        }
        FreeConsole(); // as a program with windows: Git can then be asked to end
        m_git.Commit(L"first.txt", "1\n");
        ASSERT_EQ(m_user.Open(m_git.Folder()), Success);
    }

    /// Deletes the files with the machine's own shell, which is quick.
    void TearDown() override
    {
        if (HasDisplay())
        {
            m_git({L"-c", L"alias.clear=!rm -rf many .git", L"clear"});
        }
    }

    /// Makes many files with the machine's own shell, which is quick. Git takes a while for some of them, as for
    /// large files.
    Texts MakeManyFiles() const
    {
        m_git({L"-c",
               L"alias.fill=!mkdir many && for i in $(seq " + std::to_wstring(ManyFiles) +
                   L"); do echo $i > many/$i; done",
               L"fill"});
        m_git({L"config", L"filter.slow.clean", L"sleep 0.02; cat"});
        m_git.Write(L".git/info/attributes", "many/*[02468]00 filter=slow\n");
        Texts files;
        for (int i = 1; i <= ManyFiles; ++i)
        {
            files.push_back(m_git.File(L"many/" + std::to_wstring(i)));
        }
        return files;
    }

    bool HasLockFiles() const
    {
        for (const auto& entry : std::filesystem::recursive_directory_iterator(m_git.Folder() + L"\\.git"))
        {
            if (entry.path().extension() == L".lock")
            {
                return true;
            }
        }
        return false;
    }

    PlainGit m_git = MakeRepository(L"town");
    HostWindow m_host;
    GitUser m_user{m_host.Get()};
};

TEST_F(GitWindow, PaintsTheHostAndShowsProgressWhileManyFilesAreAdded)
{
    OrvixFileList list;
    for (const std::wstring& file : MakeManyFiles())
    {
        list.AddActiveEntry(list.CreateEntry(file.c_str(), nullptr, 0, 0));
    }
    long long shortest = std::numeric_limits<long long>::max();
    for (int attempt = 0; attempt < 5 && shortest > 100; ++attempt) // a busy machine may stop every program for a while
    {
        if (attempt > 0)
        {
            m_git({L"reset", L"--quiet"});
        }
        m_host.painting.Restart();
        Watcher watcher(m_host, Never);
        const int result = m_user.Provider().Add(&list, L"", 0);
        watcher.Stop();
        EXPECT_EQ(result, Success) << testing::PrintToString(m_user.client.lines);
        EXPECT_TRUE(watcher.sawWindow);
        EXPECT_TRUE(watcher.hostWasDisabled);
        EXPECT_TRUE(IsWindowEnabled(m_host.Get()));
        EXPECT_EQ(FindWaitingWindow(), nullptr);
        EXPECT_GT(watcher.progress.size(), 2u);
        EXPECT_GT(m_host.painting.Count(), 10u);
        shortest = std::min(shortest, watcher.LongestGap(m_host));
    }
    EXPECT_LE(shortest, 100);
}

TEST_F(GitWindow, PaintsTheHostWithoutAGap)
{
    AddHook(m_git, L"pre-commit", "sleep 2\n");
    long long shortest = std::numeric_limits<long long>::max();
    for (int attempt = 0; attempt < 5 && shortest > 100; ++attempt) // a busy machine may stop every program for a while
    {
        const std::wstring file = m_git.Write(L"first.txt", std::to_string(attempt));
        m_host.painting.Restart();
        Watcher watcher(m_host, Never);
        EXPECT_EQ(m_user.CheckIn({file}, L"Slow"), Success);
        watcher.Stop();
        EXPECT_TRUE(watcher.sawWindow);
        EXPECT_GT(m_host.painting.Count(), 20u);
        shortest = std::min(shortest, watcher.LongestGap(m_host));
    }
    EXPECT_LE(shortest, 100);
}

TEST_F(GitWindow, CancelsInTheMiddleOfAdding)
{
    const Texts files = MakeManyFiles();
    Watcher watcher(m_host, [](HWND window) {
        const std::wstring text = ProgressText(window);
        return !text.empty() && text.front() != L'0';
    });
    EXPECT_EQ(m_user.Add(files), Failure);
    watcher.Stop();
    EXPECT_EQ(m_user.client.lines, Texts{L"cancelled"});
    EXPECT_FALSE(HasLockFiles());
    EXPECT_EQ(m_git({L"ls-files"}), "first.txt\n");
    EXPECT_EQ(m_user.Add({files.front()}), Success) << "the repository can be used";
    m_git({L"fsck"});
}

TEST_F(GitWindow, CancelsASlowHookTogetherWithWhatItHasStarted)
{
    const std::wstring file = m_git.Write(L"first.txt", "2\n");
    AddHook(m_git, L"pre-commit", "echo on > .git/started\nsleep 8\necho late > .git/late\n");
    Watcher watcher(m_host, [&](HWND) { return m_git.Has(L".git/started"); });
    EXPECT_EQ(m_user.CheckIn({file}, L"Never"), Failure);
    watcher.Stop();
    std::this_thread::sleep_for(10s); // longer than the hook, were it alive
    EXPECT_FALSE(m_git.Has(L".git/late"));
    EXPECT_EQ(m_user.client.lines, Texts{L"cancelled"});
    EXPECT_FALSE(HasLockFiles());
    EXPECT_EQ(m_git({L"log", L"--format=%s"}), "By hand\n");
    EXPECT_EQ(m_git({L"status", L"--porcelain"}), " M first.txt\n");
}

TEST_F(GitWindow, RefusesACallInTheMiddleOfAnother)
{
    const std::wstring file = m_git.Write(L"first.txt", "2\n");
    AddHook(m_git, L"pre-commit", "sleep 3\n");
    int inner = Success;
    m_host.onCall = [&] {
        OrvixFileList list;
        list.AddActiveEntry(list.CreateEntry(file.c_str(), nullptr, 0, 0));
        inner = m_user.Provider().QueryStatus(&list, 0);
    };
    std::jthread caller([&] {
        std::this_thread::sleep_for(1s);
        SendMessageW(m_host.Get(), CallProvider, 0, 0);
    });
    EXPECT_EQ(m_user.CheckIn({file}, L"Slow"), Success);
    EXPECT_EQ(inner, Failure);
}

TEST_F(GitWindow, ShowsNoWindowWhenNobodyCanAnswer)
{
    const std::wstring file = m_git.Write(L"first.txt", "2\n");
    AddHook(m_git, L"pre-commit", "sleep 2\n");
    m_user.client.unattended = true;
    Watcher watcher(m_host, Never);
    EXPECT_EQ(m_user.CheckIn({file}, L"Alone"), Success);
    watcher.Stop();
    EXPECT_FALSE(watcher.sawWindow);
    EXPECT_FALSE(watcher.hostWasDisabled);
    EXPECT_GT(m_host.painting.Count(), 20u) << "it is painted all the same";
}

} // namespace
