#include "Progress.h"

#include <commctrl.h>

#include <utility>

namespace
{

constexpr ULONGLONG Interval = 50; // milliseconds between two looks at the messages

/// Messages that do not wait, as the first and the last number of a range.
constexpr std::pair<UINT, UINT> Taken[] = {{WM_PAINT, WM_PAINT},
                                           {WM_KEYFIRST, WM_KEYLAST},
                                           {WM_NCMOUSEMOVE, WM_NCXBUTTONDBLCLK},
                                           {WM_MOUSEFIRST, WM_MOUSELAST}};

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

/// Draws the windows and takes what the user types and clicks. Other messages, such as commands, wait for the main
/// loop.
void Progress::HandleMessages()
{
    for (const auto& [first, last] : Taken)
    {
        MSG message{};
        while (!m_stopped && PeekMessageW(&message, nullptr, first, last, PM_REMOVE) != FALSE)
        {
            if (message.message == WM_PAINT)
            {
                DispatchMessageW(&message);
            }
            else if (message.message == WM_QUIT) // comes whatever is asked for
            {
                PostQuitMessage(static_cast<int>(message.wParam));
                m_stopped = true;
            }
            else
            {
                m_stopped = message.message == WM_KEYDOWN && message.wParam == VK_ESCAPE;
            }
        }
    }
}
