#pragma once

#include "LibraryProcess.h"
#include "OrvixWaitingWindow.h"

#include <chrono>
#include <memory>
#include <string>

/// Waits in a call of the host until the library's process answers. The host's windows are painted meanwhile and its
/// messages are dispatched, except those of keyboard and mouse, which are dropped when the call is a long one. After
/// five seconds without a window of the library a small one says what runs, and its button ends the library.
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

    /// What the user reads in the small window.
    struct Texts
    {
        std::wstring library;
        std::wstring function;
    };

    /// `parent` is a window of the host's that this thread owns; null when there is none, and then the small window
    /// never shows. The process must outlive this object.
    CallWait(const LibraryProcess& process, HWND parent, std::chrono::milliseconds patience, Texts texts);

    /// Waits for the event.
    Result For(HANDLE event);

    /// The library has given a sign of life: its patience begins again.
    void Restart() { m_lastSign = Clock::now(); }

    std::chrono::seconds Elapsed() const;

private:
    using Clock = std::chrono::steady_clock;

    /// Waits for a moment as WaitForMultipleObjects does, and lets the small window handle its messages.
    DWORD WaitWithWindow(const HANDLE* handles);
    void MakeWindow();
    void Dispatch(bool takesAll);
    Result Look();

    const LibraryProcess& m_process;
    std::chrono::milliseconds m_patience;
    HWND m_parent;
    Texts m_texts;
    std::unique_ptr<OrvixWaitingWindow> m_window; ///< null in a short call, and while the library shows a window
    bool m_isWindowDue = false;                   ///< it is shown
    Clock::time_point m_start = Clock::now();
    Clock::time_point m_lastSign = m_start;
    Clock::time_point m_lastLook = m_start;
    Clock::time_point m_lastWindow = m_start; ///< of the library
    Clock::time_point m_lastUpdate = m_start; ///< of the small window
    unsigned int m_signs = m_process.Signs();
    bool m_isQuitting = false;
    bool m_hasWindows = IsGUIThread(FALSE) != FALSE;
};
