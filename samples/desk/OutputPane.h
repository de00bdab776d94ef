#pragma once

#include <windows.h>

#include <mutex>
#include <string>
#include <vector>

/// The output of providers: lines that come from any thread, in an edit control that cannot be written to.
class OutputPane
{
public:
    static constexpr UINT Arrived = WM_APP + 1; ///< the owner's message: call `ShowArrived`

    /// Makes the control. `owner` is its parent. Lines that were added before are shown.
    void Create(HWND owner, int id);

    HWND Window() const { return m_window; }
    HWND Owner() const { return m_owner; }

    /// Adds a line, from any thread. On the owner's thread it is visible at once, also while a provider works and no
    /// messages are handled.
    void Add(const std::wstring& line);

    /// Shows the lines that have arrived; on the owner's thread.
    void ShowArrived();

private:
    HWND m_owner = nullptr;
    HWND m_window = nullptr;
    std::mutex m_mutex;
    std::vector<std::wstring> m_lines; // guarded by the mutex
};
