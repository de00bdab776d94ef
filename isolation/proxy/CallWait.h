#pragma once

#include "LibraryProcess.h"

#include <chrono>
#include <string>

/// Waits in a call of the host until the library's process answers. The host's windows are painted meanwhile and its
/// messages are dispatched, except those of keyboard and mouse, which are dropped when the call is a long one.
class CallWait
{
public:
    enum class Result
    {
        Signalled,
        Ended,   ///< the process has ended
        Hangs,   ///< no window and no sign of life for the whole patience
        UserEnds ///< the user does not want to wait any longer
    };

    /// `what` names the library and the function for the user. The process must outlive this object.
    CallWait(const LibraryProcess& process, std::chrono::milliseconds patience, std::wstring what);

    /// Waits for the event.
    Result For(HANDLE event);

    /// The library has given a sign of life: its patience begins again.
    void Restart() { m_lastSign = Clock::now(); }

    std::chrono::seconds Elapsed() const;

private:
    using Clock = std::chrono::steady_clock;

    void Dispatch(bool takesAll);
    Result Look();

    const LibraryProcess& m_process;
    std::chrono::milliseconds m_patience;
    std::wstring m_what;
    Clock::time_point m_start = Clock::now();
    Clock::time_point m_lastSign = m_start;
    Clock::time_point m_lastLook = m_start;
    bool m_isQuitting = false;
    bool m_hasWindows = IsGUIThread(FALSE) != FALSE;
};
