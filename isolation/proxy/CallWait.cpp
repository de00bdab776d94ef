#include "CallWait.h"

#include <utility>

namespace
{

using namespace std::chrono_literals;

// Until then only messages that other threads have sent are dispatched, so that a short call changes nothing for the
// host.
constexpr auto ShortCall = 200ms;

// How often the library's windows are looked for in a long call.
constexpr auto LookPeriod = 250ms;

bool IsInput(UINT message)
{
    return (message >= WM_KEYFIRST && message <= WM_KEYLAST) || (message >= WM_MOUSEFIRST && message <= WM_MOUSELAST) ||
           (message >= WM_NCMOUSEMOVE && message <= WM_NCXBUTTONDBLCLK);
}

} // namespace

CallWait::CallWait(const LibraryProcess& process, std::chrono::milliseconds patience, std::wstring what)
    : m_process(process), m_patience(patience), m_what(std::move(what))
{
}

CallWait::Result CallWait::For(HANDLE event)
{
    const HANDLE handles[] = {event, m_process.Process()};
    for (;;)
    {
        const bool isLong = Clock::now() - m_start >= ShortCall;
        const auto timeout = static_cast<DWORD>(std::chrono::milliseconds(isLong ? LookPeriod : ShortCall).count());
        const bool takesAll = isLong && !m_isQuitting;
        const DWORD result = m_hasWindows ? MsgWaitForMultipleObjects(2, handles, FALSE, timeout,
                                                                      takesAll ? QS_ALLINPUT : QS_SENDMESSAGE)
                                          : WaitForMultipleObjects(2, handles, FALSE, timeout);
        switch (result)
        {
        case WAIT_OBJECT_0:
            return Result::Signalled;
        case WAIT_OBJECT_0 + 1:
            return Result::Ended;
        case WAIT_OBJECT_0 + 2: // messages
        case WAIT_TIMEOUT:
            break;
        default:
            return Result::Ended;
        }
        if (m_hasWindows)
        {
            Dispatch(takesAll);
        }
        if (const Result look = isLong ? Look() : Result::Signalled; look != Result::Signalled)
        {
            return look;
        }
    }
}

std::chrono::seconds CallWait::Elapsed() const
{
    return std::chrono::duration_cast<std::chrono::seconds>(Clock::now() - m_start);
}

void CallWait::Dispatch(bool takesAll)
{
    MSG message;
    if (!takesAll)
    {
        PeekMessageW(&message, nullptr, 0, 0, PM_NOREMOVE | PM_QS_SENDMESSAGE);
        return;
    }
    while (PeekMessageW(&message, nullptr, 0, 0, PM_REMOVE))
    {
        if (message.message == WM_QUIT)
        {
            PostQuitMessage(static_cast<int>(message.wParam)); // for the host's own loop
            m_isQuitting = true;
            return;
        }
        if (!IsInput(message.message))
        {
            DispatchMessageW(&message);
        }
    }
}

/// Signalled means to go on.
CallWait::Result CallWait::Look()
{
    const Clock::time_point now = Clock::now();
    if (now - m_lastLook < LookPeriod)
    {
        return Result::Signalled;
    }
    m_lastLook = now;
    if (m_process.ShowsWindow())
    {
        Restart();
    }
    return now - m_lastSign >= m_patience ? Result::Hangs : Result::Signalled;
}
