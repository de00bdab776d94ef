#pragma once

struct HWND__;

/// Waits for work that another thread or process does, while the host's windows are painted. After half a second a
/// small window, owned by the host's, shows what runs, its progress, the time since the start, and a button that ends
/// the work.
///
/// Nothing is called twice: while the object waits, the thread handles painting, messages that other threads send, and
/// the waiting window's own input, and nothing else. Timers and posted messages of the host wait in its queue. User
/// input waits in the queue for the first half second. Then the thread's other windows are disabled until the object
/// is destroyed, and input for them is dropped.
///
/// Make one object for each operation, on the thread that owns the host's windows, and wait as often as the operation
/// needs. Link the static library `OrvixCore::Waiting`. No operation throws. When memory runs out, there is no window.
/// [plug-in or host, main-thread] unless a function says otherwise.
class OrvixWaitingWindow
{
public:
    /// How a wait ends.
    enum class Result
    {
        Done,     ///< what it waited for has happened
        Cancelled ///< the user has pressed the button, Escape or Alt+F4
    };

    /// Starts the time; shows nothing yet. `parent` is the host's window; null means that there is never a window (an
    /// unattended client has none). `title` is the text of the title bar, such as the provider's name. `button` is the
    /// label of the button, such as "Cancel". The texts are copied; null is an empty text.
    OrvixWaitingWindow(HWND__* parent, const wchar_t* title, const wchar_t* button) noexcept;
    OrvixWaitingWindow(const OrvixWaitingWindow&) = delete;
    OrvixWaitingWindow& operator=(const OrvixWaitingWindow&) = delete;

    /// Closes the window and enables the windows that it has disabled.
    ~OrvixWaitingWindow();

    /// Changes the line that says what runs. The text is copied. [any-thread]
    void SetTask(const wchar_t* text) noexcept;

    /// Changes the line of progress and the bar. `percent` is 0 to 100; -1 when nobody knows how much there is, and the
    /// bar then only shows that work goes on. The text is copied. [any-thread]
    void SetProgress(const wchar_t* text, int percent) noexcept;

    /// Waits until `handle` is signalled: an event, a process, a thread. It is not owned. After a cancelled wait the
    /// button is disabled, and a further `Wait` ends only when the handle is signalled: end the work, then wait for
    /// the end.
    Result Wait(void* handle) noexcept;

    /// One turn of a wait, without waiting: shows the window when it is time and handles the messages that `Wait`
    /// handles. For code that waits for several things by itself; call it every 50 milliseconds, and when a message of
    /// the kinds QS_PAINT or QS_SENDMESSAGE is there. `Cancelled` when the user has just ended the work.
    Result Update() noexcept;

    /// True when the user has ended the work in any of the waits or turns.
    bool IsCancelled() const noexcept { return m_cancelled; }

private:
    struct State;
    State* m_state = nullptr;
    bool m_cancelled = false;
};
