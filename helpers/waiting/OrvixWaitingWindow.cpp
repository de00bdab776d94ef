#include "OrvixWaitingWindow.h"

#include "UniqueHandle.h"

#include <windows.h>

#include <commctrl.h>

#include <algorithm>
#include <bit>
#include <cstdio>
#include <mutex>
#include <new>
#include <optional>
#include <string>
#include <utility>
#include <vector>

namespace
{

constexpr DWORD Delay = 500;       // milliseconds until the window appears
constexpr DWORD RefreshEvery = 50; // milliseconds
constexpr DWORD SignOfLife = 1000; // milliseconds; Windows takes a thread for hung that asks for no message in 5 s

enum Control : int
{
    Task = 101,
    Bar,
    Progress,
    Elapsed
};

struct FontPolicy
{
    using Handle = HFONT;
    static Handle None() noexcept { return nullptr; }
    static void Close(Handle font) noexcept { DeleteObject(font); }
};
using UniqueFont = UniqueHandle<FontPolicy>;

/// The template of a dialog without controls, in the form that Windows takes.
struct alignas(DWORD) EmptyDialog
{
    DLGTEMPLATE header{};
    WORD menu = 0;
    WORD windowClass = 0;
    WORD title = 0;
};

HINSTANCE ThisModule()
{
    HMODULE module = nullptr;
    GetModuleHandleExW(GET_MODULE_HANDLE_EX_FLAG_FROM_ADDRESS | GET_MODULE_HANDLE_EX_FLAG_UNCHANGED_REFCOUNT,
                       reinterpret_cast<LPCWSTR>(&ThisModule), &module);
    return module;
}

std::wstring TimeText(ULONGLONG milliseconds)
{
    wchar_t text[32];
    const auto seconds = static_cast<unsigned>(milliseconds / 1000);
    std::swprintf(text, std::size(text), L"%u:%02u", seconds / 60, seconds % 60);
    return text;
}

} // namespace

struct OrvixWaitingWindow::State
{
    State(HWND hostWindow, const wchar_t* titleText, const wchar_t* buttonText)
        : parent(hostWindow), title(titleText != nullptr ? titleText : L""),
          button(buttonText != nullptr ? buttonText : L"")
    {
    }
    State(const State&) = delete;
    State& operator=(const State&) = delete;
    ~State() { Close(); }

    ULONGLONG Age() const { return GetTickCount64() - start; }
    bool IsShown() const { return window != nullptr; }
    bool MayShow() const { return parent != nullptr && !failed; }
    bool IsOurs(HWND handle) const
    {
        return window != nullptr && (handle == window || IsChild(window, handle) != FALSE);
    }

    void Open();
    void Show();
    void Close();
    void AddControls();
    HWND AddControl(const wchar_t* windowClass, const wchar_t* text, DWORD style, int id, RECT place);
    void DisableOthers();
    void Refresh();
    bool NextMessage(MSG& message, HWND filter, UINT kinds);
    void DropInput();
    void Pump();
    void PostQuitAgain();

    static INT_PTR CALLBACK Procedure(HWND window, UINT message, WPARAM wParam, LPARAM lParam) noexcept;

    const HWND parent;
    const std::wstring title;
    const std::wstring button;
    const ULONGLONG start = GetTickCount64();

    HWND window = nullptr;
    UniqueFont font;
    UINT dpi = USER_DEFAULT_SCREEN_DPI;
    std::vector<HWND> disabled;
    HWND focus = nullptr;       ///< of the host, before the window appeared
    bool failed = false;        ///< the window cannot be made
    bool pressed = false;       ///< the user wants the end
    bool canPress = false;      ///< a wait goes on that the user can end
    std::optional<WPARAM> quit; ///< the host is to end: its message is posted again after the wait

    std::mutex mutex; ///< guards what other threads set
    std::wstring task;
    std::wstring progress;
    int percent = -1;
    bool changed = true;
};

void OrvixWaitingWindow::State::Open()
{
    failed = true; // unless it comes to its end
    const INITCOMMONCONTROLSEX classes{sizeof classes, ICC_PROGRESS_CLASS | ICC_STANDARD_CLASSES};
    InitCommonControlsEx(&classes);
    EmptyDialog dialog{};
    // Without a system menu: it and moving the window would run a loop that handles every message of the host.
    dialog.header.style = WS_POPUP | WS_CAPTION | DS_MODALFRAME;
    window = CreateDialogIndirectParamW(ThisModule(), &dialog.header, parent, &Procedure, std::bit_cast<LPARAM>(this));
    if (window == nullptr)
    {
        return;
    }
    SetWindowTextW(window, title.c_str());
    AddControls();
    focus = GetFocus();
    DisableOthers();
    Refresh();
    ShowWindow(window, SW_SHOW);
    SetFocus(GetDlgItem(window, IDCANCEL));
    failed = false;
}

void OrvixWaitingWindow::State::AddControls()
{
    dpi = GetDpiForWindow(window);
    NONCLIENTMETRICSW metrics{};
    metrics.cbSize = sizeof metrics;
    if (SystemParametersInfoForDpi(SPI_GETNONCLIENTMETRICS, sizeof metrics, &metrics, 0, dpi))
    {
        font.Reset(CreateFontIndirectW(&metrics.lfMessageFont));
    }

    // In pixels of a screen with 96 dots per inch.
    constexpr LONG Width = 400;
    constexpr LONG Height = 132;
    constexpr LONG Margin = 12;
    AddControl(WC_STATICW, L"", SS_LEFTNOWORDWRAP | SS_NOPREFIX | SS_ENDELLIPSIS, Task,
               {Margin, 12, Width - Margin, 30});
    AddControl(PROGRESS_CLASSW, L"", PBS_SMOOTH, Bar, {Margin, 36, Width - Margin, 50});
    AddControl(WC_STATICW, L"", SS_LEFTNOWORDWRAP | SS_NOPREFIX | SS_ENDELLIPSIS, Progress,
               {Margin, 58, Width - Margin, 76});
    AddControl(WC_STATICW, L"", SS_LEFTNOWORDWRAP, Elapsed, {Margin, 98, 120, 116});
    AddControl(WC_BUTTONW, button.c_str(), BS_DEFPUSHBUTTON | WS_TABSTOP, IDCANCEL,
               {Width - Margin - 110, 92, Width - Margin, 120});

    RECT frame{0, 0, MulDiv(Width, static_cast<int>(dpi), USER_DEFAULT_SCREEN_DPI),
               MulDiv(Height, static_cast<int>(dpi), USER_DEFAULT_SCREEN_DPI)};
    AdjustWindowRectExForDpi(&frame, static_cast<DWORD>(GetWindowLongW(window, GWL_STYLE)), FALSE,
                             static_cast<DWORD>(GetWindowLongW(window, GWL_EXSTYLE)), dpi);
    RECT host{};
    GetWindowRect(parent, &host);
    const LONG width = frame.right - frame.left;
    const LONG height = frame.bottom - frame.top;
    SetWindowPos(window, nullptr, std::max(0L, (host.left + host.right - width) / 2),
                 std::max(0L, (host.top + host.bottom - height) / 2), width, height, SWP_NOZORDER | SWP_NOACTIVATE);
}

HWND OrvixWaitingWindow::State::AddControl(const wchar_t* windowClass, const wchar_t* text, DWORD style, int id,
                                           RECT place)
{
    const auto scale = [this](LONG pixels) { return MulDiv(pixels, static_cast<int>(dpi), USER_DEFAULT_SCREEN_DPI); };
    HWND control = CreateWindowExW(0, windowClass, text, WS_CHILD | WS_VISIBLE | style, scale(place.left),
                                   scale(place.top), scale(place.right - place.left), scale(place.bottom - place.top),
                                   window, std::bit_cast<HMENU>(static_cast<INT_PTR>(id)), ThisModule(), nullptr);
    SendMessageW(control, WM_SETFONT, std::bit_cast<WPARAM>(font.Get()), FALSE);
    return control;
}

void OrvixWaitingWindow::State::DisableOthers()
{
    EnumThreadWindows(
        GetCurrentThreadId(),
        [](HWND other, LPARAM self) -> BOOL {
            auto& state = *std::bit_cast<State*>(self);
            if (other != state.window && IsWindowVisible(other) && IsWindowEnabled(other))
            {
                try
                {
                    state.disabled.push_back(other);
                    EnableWindow(other, FALSE);
                }
                catch (const std::bad_alloc&)
                {
                    return FALSE;
                }
            }
            return TRUE;
        },
        std::bit_cast<LPARAM>(this));
}

/// Opens the window when it is time, and shows what is new.
void OrvixWaitingWindow::State::Show()
{
    if (MayShow() && !IsShown() && Age() >= Delay)
    {
        Open();
    }
    if (IsShown())
    {
        Refresh();
    }
}

void OrvixWaitingWindow::State::Close()
{
    if (window == nullptr)
    {
        return;
    }
    DropInput();
    // The others first: otherwise Windows activates a window of another program.
    for (HWND other : disabled)
    {
        EnableWindow(other, TRUE);
    }
    const bool wasActive = GetActiveWindow() == window;
    DestroyWindow(window);
    window = nullptr;
    if (wasActive && focus != nullptr && IsWindow(focus))
    {
        SetFocus(focus);
    }
}

void OrvixWaitingWindow::State::Refresh()
{
    const std::wstring elapsed = TimeText(Age());
    wchar_t shown[32];
    GetDlgItemTextW(window, Elapsed, shown, static_cast<int>(std::size(shown)));
    if (elapsed != shown)
    {
        SetDlgItemTextW(window, Elapsed, elapsed.c_str());
    }
    EnableWindow(GetDlgItem(window, IDCANCEL), pressed ? FALSE : TRUE);

    std::unique_lock lock(mutex);
    if (!std::exchange(changed, false))
    {
        return;
    }
    const std::wstring taskNow = task;
    const std::wstring progressNow = progress;
    const int percentNow = percent;
    lock.unlock(); // setting a text sends messages
    SetDlgItemTextW(window, Task, taskNow.c_str());
    SetDlgItemTextW(window, Progress, progressNow.c_str());

    HWND bar = GetDlgItem(window, Bar);
    const bool isMarquee = (GetWindowLongW(bar, GWL_STYLE) & PBS_MARQUEE) != 0;
    const bool wantsMarquee = percentNow < 0;
    if (isMarquee != wantsMarquee)
    {
        SetWindowLongW(bar, GWL_STYLE, GetWindowLongW(bar, GWL_STYLE) ^ PBS_MARQUEE);
        SendMessageW(bar, PBM_SETMARQUEE, wantsMarquee ? TRUE : FALSE, 0);
    }
    if (!wantsMarquee)
    {
        SendMessageW(bar, PBM_SETPOS, static_cast<WPARAM>(percentNow), 0);
    }
}

/// Takes a message of these kinds (PM_QS_*) from the queue; false when there is none.
bool OrvixWaitingWindow::State::NextMessage(MSG& message, HWND filter, UINT kinds)
{
    while (PeekMessageW(&message, filter, 0, 0, PM_REMOVE | kinds))
    {
        if (message.message != WM_QUIT)
        {
            return true;
        }
        quit = message.wParam;
    }
    return false;
}

/// Handles the input of the waiting window and drops that of every other one: they are disabled.
void OrvixWaitingWindow::State::DropInput()
{
    MSG message;
    while (NextMessage(message, nullptr, PM_QS_INPUT))
    {
        if (IsOurs(message.hwnd) && !IsDialogMessageW(window, &message))
        {
            TranslateMessage(&message);
            DispatchMessageW(&message);
        }
    }
}

void OrvixWaitingWindow::State::Pump()
{
    MSG message;
    if (IsShown())
    {
        DropInput();
        // Its own posted messages and timers, such as those of assistive programs and of the bar.
        while (NextMessage(message, window, 0))
        {
            if (!IsDialogMessageW(window, &message))
            {
                DispatchMessageW(&message);
            }
        }
    }
    // Handles sent messages too. One at a time: a window may ask for painting without an end.
    if (NextMessage(message, nullptr, PM_QS_PAINT | PM_QS_SENDMESSAGE))
    {
        DispatchMessageW(&message);
    }
}

void OrvixWaitingWindow::State::PostQuitAgain()
{
    if (quit)
    {
        PostQuitMessage(static_cast<int>(*std::exchange(quit, std::nullopt)));
    }
}

INT_PTR CALLBACK OrvixWaitingWindow::State::Procedure(HWND window, UINT message, WPARAM wParam, LPARAM lParam) noexcept
{
    if (message == WM_INITDIALOG)
    {
        SetWindowLongPtrW(window, DWLP_USER, lParam);
        return FALSE;
    }
    auto* state = std::bit_cast<State*>(GetWindowLongPtrW(window, DWLP_USER));
    if (state == nullptr)
    {
        return FALSE;
    }
    switch (message)
    {
    case WM_COMMAND:
        if (LOWORD(wParam) == IDCANCEL && state->canPress)
        {
            state->pressed = true;
        }
        return TRUE;
    case WM_CLOSE:
        SendMessageW(window, WM_COMMAND, IDCANCEL, 0);
        return TRUE;
    case WM_SYSCOMMAND:
        // A menu would run a loop of its own.
        return (wParam & 0xFFF0) != SC_CLOSE ? TRUE : FALSE;
    case WM_NCLBUTTONDOWN:
        return TRUE; // moving the window would, too
    default:
        return FALSE;
    }
}

OrvixWaitingWindow::OrvixWaitingWindow(HWND__* parent, const wchar_t* title, const wchar_t* button) noexcept
{
    try
    {
        m_state = new State(parent, title, button);
    }
    catch (const std::bad_alloc&)
    {
        m_state = nullptr; // waits without a window
    }
}

OrvixWaitingWindow::~OrvixWaitingWindow()
{
    delete m_state;
}

void OrvixWaitingWindow::SetTask(const wchar_t* text) noexcept
{
    if (m_state == nullptr || text == nullptr)
    {
        return;
    }
    try
    {
        const std::lock_guard lock(m_state->mutex);
        m_state->task = text;
        m_state->changed = true;
    }
    catch (const std::bad_alloc&)
    {
        return; // the window keeps its text
    }
}

void OrvixWaitingWindow::SetProgress(const wchar_t* text, int percent) noexcept
{
    if (m_state == nullptr || text == nullptr)
    {
        return;
    }
    try
    {
        const std::lock_guard lock(m_state->mutex);
        m_state->progress = text;
        m_state->percent = std::clamp(percent, -1, 100);
        m_state->changed = true;
    }
    catch (const std::bad_alloc&)
    {
        return; // the window keeps its text
    }
}

OrvixWaitingWindow::Result OrvixWaitingWindow::Wait(void* handle) noexcept
{
    if (m_state == nullptr)
    {
        WaitForSingleObject(handle, INFINITE);
        return Result::Done;
    }
    State& state = *m_state;
    state.canPress = !m_cancelled;
    Result result = Result::Done;
    for (;;)
    {
        state.Show();
        DWORD timeout = SignOfLife;
        DWORD wakeMask = QS_PAINT | QS_SENDMESSAGE;
        if (state.IsShown())
        {
            timeout = RefreshEvery;
            wakeMask |= QS_INPUT;
        }
        else if (state.MayShow())
        {
            timeout = Delay - static_cast<DWORD>(std::min<ULONGLONG>(state.Age(), Delay));
        }
        const DWORD woken = MsgWaitForMultipleObjectsEx(1, &handle, timeout, wakeMask, MWMO_INPUTAVAILABLE);
        if (woken == WAIT_OBJECT_0 || woken == WAIT_FAILED)
        {
            break;
        }
        state.Pump();
        if (state.pressed && !m_cancelled)
        {
            m_cancelled = true;
            result = Result::Cancelled;
            state.Refresh();
            break;
        }
    }
    state.canPress = false;
    state.PostQuitAgain();
    return result;
}

OrvixWaitingWindow::Result OrvixWaitingWindow::Update() noexcept
{
    if (m_state == nullptr)
    {
        return Result::Done;
    }
    State& state = *m_state;
    state.Show();
    state.canPress = !m_cancelled;
    state.Pump();
    state.canPress = false;
    state.PostQuitAgain();
    if (!state.pressed || m_cancelled)
    {
        return Result::Done;
    }
    m_cancelled = true;
    state.Refresh();
    return Result::Cancelled;
}
