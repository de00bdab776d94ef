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

// Between two turns of the small window.
constexpr std::chrono::milliseconds WindowPeriod = 50ms;

// How often the library's windows are looked for in a long call.
constexpr auto LookPeriod = 250ms;

// Without a look for so long, this thread did not run either: the machine slept, or a dialog of the host ran.
constexpr auto LongPause = 20 * LookPeriod;

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
        // A library that calls back all the time ends each wait at once, so these come first.
        if (m_isWindowDue && m_window->IsCancelled())
        {
            return Result::UserEnds;
        }
        if (isLong && Look() == Result::Hangs)
        {
            return WaitForSingleObject(event, 0) == WAIT_OBJECT_0 ? Result::Signalled : Result::Hangs;
        }
        const auto timeout = static_cast<DWORD>(std::chrono::milliseconds(isLong ? LookPeriod : ShortCall).count());
        const bool takesAll = isLong && !m_isQuitting && !m_isWindowDue;
        const DWORD result =
            m_isWindowDue  ? WaitWithWindow(handles)
            : m_hasWindows ? MsgWaitForMultipleObjectsEx(2, handles, timeout, takesAll ? QS_ALLINPUT : QS_SENDMESSAGE,
                                                         MWMO_INPUTAVAILABLE)
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
        if (m_hasWindows && !m_isWindowDue)
        {
            Dispatch(takesAll);
        }
    }
}

std::chrono::seconds CallWait::Elapsed() const
{
    return std::chrono::duration_cast<std::chrono::seconds>(Clock::now() - m_start);
}

DWORD CallWait::WaitWithWindow(const HANDLE* handles)
{
    const DWORD woken = MsgWaitForMultipleObjectsEx(2, handles, static_cast<DWORD>(WindowPeriod.count()),
                                                    QS_PAINT | QS_SENDMESSAGE, MWMO_INPUTAVAILABLE);
    if (woken >= WAIT_OBJECT_0 + 2 || Clock::now() - m_lastUpdate >= WindowPeriod)
    {
        m_window->Update();
        m_lastUpdate = Clock::now();
    }
    return woken;
}

/// Its time runs from now on.
void CallWait::MakeWindow()
{
    m_window = std::make_unique<OrvixWaitingWindow>(m_parent, m_texts.library.c_str(), L"End it");
    m_window->SetTask((m_texts.library + L" is working on " + m_texts.function + L'.').c_str());
    m_window->SetProgress(L"Ending it loses what it has not finished.", -1);
}

/// Dispatches one message: a window may ask for painting without an end.
void CallWait::Dispatch(bool takesAll)
{
    MSG message;
    if (!takesAll)
    {
        PeekMessageW(&message, nullptr, 0, 0, PM_NOREMOVE | PM_QS_SENDMESSAGE);
        return;
    }
    if (!PeekMessageW(&message, nullptr, 0, 0, PM_REMOVE))
    {
        return;
    }
    if (message.message == WM_QUIT)
    {
        PostQuitMessage(static_cast<int>(message.wParam)); // for the host's own loop
        m_isQuitting = true;
    }
    else if (!IsInput(message.message))
    {
        DispatchMessageW(&message);
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
    if (now - m_lastLook >= LongPause)
    {
        Restart();
    }
    m_lastLook = now;
    if (m_process.ShowsWindow())
    {
        Restart();
        m_lastWindow = now;
        m_window.reset(); // it must not cover the library's own window
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
    if (now - m_lastSign >= m_patience)
    {
        return Result::Hangs;
    }
    if (m_hasWindows && !m_isWindowDue)
    {
        Dispatch(!m_isQuitting); // a library that calls back all the time leaves no other time for messages
    }
    return Result::Signalled;
}
