#include "CallWait.h"

#include <utility>

namespace
{

using namespace std::chrono_literals;

// Until then only messages that other threads have sent are dispatched, so that a short call changes nothing for the
// host.
constexpr auto ShortCall = 200ms;

// Without a window of the library, until the small window appears.
constexpr auto UntilWindow = 5s;

// Between two looks at the library while the small window is shown.
constexpr std::chrono::microseconds Moment = 100ms;

// How often the library's windows are looked for in a long call.
constexpr auto LookPeriod = 250ms;

bool IsInput(UINT message)
{
    return (message >= WM_KEYFIRST && message <= WM_KEYLAST) || (message >= WM_MOUSEFIRST && message <= WM_MOUSELAST) ||
           (message >= WM_NCMOUSEMOVE && message <= WM_NCXBUTTONDBLCLK);
}

} // namespace

CallWait::CallWait(const LibraryProcess& process, HWND parent, std::chrono::milliseconds patience, Texts texts)
    : m_process(process), m_patience(patience), m_parent(parent), m_texts(std::move(texts))
{
}

CallWait::Result CallWait::For(HANDLE event)
{
    const HANDLE handles[] = {event, m_process.Process()};
    for (;;)
    {
        const bool isLong = Clock::now() - m_start >= ShortCall;
        const auto timeout = static_cast<DWORD>(std::chrono::milliseconds(isLong ? LookPeriod : ShortCall).count());
        const bool takesAll = isLong && !m_isQuitting && !m_isWindowDue;
        const DWORD result = m_isWindowDue  ? WaitWithWindow(handles)
                             : m_hasWindows ? MsgWaitForMultipleObjects(2, handles, FALSE, timeout,
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
        if (m_isWindowDue && m_window->IsCancelled())
        {
            return Result::UserEnds;
        }
        if (m_hasWindows && !m_isWindowDue)
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

DWORD CallWait::WaitWithWindow(const HANDLE* handles)
{
    LARGE_INTEGER moment{};
    moment.QuadPart = -Moment.count() * 10; // from now, in units of 100 nanoseconds
    SetWaitableTimer(m_moment.Get(), &moment, 0, nullptr, nullptr, FALSE);
    m_window->Wait(m_moment.Get());
    return WaitForMultipleObjects(2, handles, FALSE, 0);
}

/// Its time runs from now on.
void CallWait::MakeWindow()
{
    m_moment.Reset(CreateWaitableTimerW(nullptr, TRUE, nullptr));
    if (!m_moment)
    {
        return; // the call goes on without the window
    }
    m_window = std::make_unique<OrvixWaitingWindow>(m_parent, m_texts.library.c_str(), L"End it");
    m_window->SetTask((m_texts.library + L" is working on " + m_texts.function + L'.').c_str());
    m_window->SetProgress(L"Ending it loses what it has not finished.", -1);
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
        m_lastWindow = now;
        m_window.reset(); // the library's own window must not lie behind it
    }
    else if (!m_window && m_parent != nullptr)
    {
        MakeWindow();
    }
    m_isWindowDue = m_window && now - m_lastWindow >= UntilWindow;
    if (const unsigned int signs = m_process.Signs(); signs != m_signs)
    {
        m_signs = signs;
        Restart();
    }
    return now - m_lastSign >= m_patience ? Result::Hangs : Result::Signalled;
}
