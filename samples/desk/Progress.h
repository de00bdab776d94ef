#pragma once

#include <windows.h>

#include <cstddef>

/// How far long work of this program is. The user may stop it with Esc. Meanwhile the window is drawn, but takes no
/// other input.
class Progress
{
public:
    /// `bar` is a progress bar, shown while this object lives.
    explicit Progress(HWND bar);
    Progress(const Progress&) = delete;
    Progress& operator=(const Progress&) = delete;
    ~Progress();

    /// Shows that `done` parts of `total` are done; a total of 0 is not known. False when the user has stopped the
    /// work; then call it no more and end.
    bool Step(std::size_t done, std::size_t total);

private:
    void HandleMessages();

    HWND m_bar;
    ULONGLONG m_lastTime;
    bool m_stopped = false;
};
