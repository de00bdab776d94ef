#pragma once

#include <windows.h>

#include <algorithm>
#include <atomic>
#include <chrono>

/// How often a window was painted, and how long it waited for it after it was asked to paint. The thread that asks may
/// itself be stopped by a busy machine: the time between two paintings alone would count that too.
class PaintDelay
{
public:
    /// Asks a window to paint. Called from any one thread.
    void Ask(HWND window)
    {
        Clock::rep none = 0;
        m_asked.compare_exchange_strong(none, Now());
        InvalidateRect(window, nullptr, FALSE);
    }

    /// Called by the window's procedure for WM_PAINT.
    void NotePaint()
    {
        ++m_count;
        if (const Clock::rep asked = m_asked.exchange(0); asked != 0)
        {
            m_longest = std::max<Clock::rep>(m_longest, Now() - asked);
        }
    }

    /// Forgets what was measured. Nobody asks meanwhile.
    void Restart()
    {
        m_asked = 0;
        m_count = 0;
        m_longest = 0;
    }

    unsigned int Count() const { return m_count; }
    /// Counts a request, too, that waits still.
    long long LongestMilliseconds() const
    {
        Clock::rep longest = m_longest;
        if (const Clock::rep asked = m_asked; asked != 0)
        {
            longest = std::max<Clock::rep>(longest, Now() - asked);
        }
        return std::chrono::duration_cast<std::chrono::milliseconds>(Clock::duration(longest)).count();
    }

private:
    using Clock = std::chrono::steady_clock;

    static Clock::rep Now() { return Clock::now().time_since_epoch().count(); }

    std::atomic<Clock::rep> m_asked = 0; ///< 0: painted since
    std::atomic<unsigned int> m_count = 0;
    std::atomic<Clock::rep> m_longest = 0;
};
