#include "Progress.h"

#include <commctrl.h>

namespace
{

constexpr ULONGLONG Interval = 50; // milliseconds between two looks at the messages

} // namespace

Progress::Progress(HWND bar) : m_bar(bar), m_lastTime(GetTickCount64())
{
    SendMessageW(m_bar, PBM_SETPOS, 0, 0);
    ShowWindow(m_bar, SW_SHOW);
    UpdateWindow(m_bar);
}

Progress::~Progress()
{
    ShowWindow(m_bar, SW_HIDE);
}

bool Progress::Step(std::size_t done, std::size_t total)
{
    if (GetTickCount64() - m_lastTime < Interval)
    {
        return true;
    }
    SendMessageW(m_bar, PBM_SETPOS, total == 0 ? 0 : 100 * done / total, 0); // the range is 0 to 100
    HandleMessages();
    m_lastTime = GetTickCount64();
    return !m_stopped;
}

/// Draws the windows and takes what the user types. Messages that were posted, such as commands, wait for the main
/// loop.
void Progress::HandleMessages()
{
    MSG message{};
    while (!m_stopped && PeekMessageW(&message, nullptr, 0, 0, PM_REMOVE | PM_QS_INPUT | PM_QS_PAINT) != FALSE)
    {
        if (message.message == WM_PAINT)
        {
            DispatchMessageW(&message);
        }
        m_stopped = message.message == WM_KEYDOWN && message.wParam == VK_ESCAPE;
    }
}
