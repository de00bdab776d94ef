#pragma once

#include <windows.h>

/// The host's window that a library's dialog disables during a call. When the library is lost, the window gets input
/// again.
class ParentWindow
{
public:
    explicit ParentWindow(HWND window)
        : m_window(window != nullptr ? GetAncestor(window, GA_ROOT) : nullptr),
          m_isEnabled(m_window != nullptr && IsWindowEnabled(m_window) != FALSE)
    {
    }

    /// Null for a window of another thread.
    HWND OfThisThread() const
    {
        return GetWindowThreadProcessId(m_window, nullptr) == GetCurrentThreadId() ? m_window : nullptr;
    }

    void Restore() const
    {
        if (m_isEnabled && IsWindowEnabled(m_window) == FALSE)
        {
            EnableWindow(m_window, TRUE);
            SetForegroundWindow(m_window);
        }
    }

private:
    HWND m_window;
    bool m_isEnabled;
};
