#include "WindowWatch.h"

#include "ChildProcess.h"

#include <array>
#include <bit>

namespace
{

constexpr UINT AnswerMilliseconds = 500; // that a window gets to say its text
constexpr std::size_t MaxText = 1024;    // characters

/// The text of a window of another process, which may hang.
std::wstring TextOf(HWND window)
{
    std::array<wchar_t, MaxText> text{};
    DWORD_PTR length = 0;
    SendMessageTimeoutW(window, WM_GETTEXT, text.size(), reinterpret_cast<LPARAM>(text.data()),
                        SMTO_ABORTIFHUNG | SMTO_BLOCK, AnswerMilliseconds, &length);
    return text.data();
}

bool HasClass(HWND window, const wchar_t* name)
{
    std::array<wchar_t, 64> found{};
    return GetClassNameW(window, found.data(), static_cast<int>(found.size())) != 0 &&
           _wcsicmp(found.data(), name) == 0;
}

BOOL CALLBACK AddLabel(HWND control, LPARAM argument)
{
    std::wstring& text = *std::bit_cast<std::wstring*>(argument);
    const std::wstring label = IsWindowVisible(control) && HasClass(control, L"Static") ? TextOf(control) : L"";
    text += text.empty() || label.empty() ? label : L' ' + label;
    return TRUE;
}

BOOL CALLBACK AddVisible(HWND window, LPARAM argument)
{
    if (IsWindowVisible(window))
    {
        std::bit_cast<std::vector<HWND>*>(argument)->push_back(window);
    }
    return TRUE;
}

} // namespace

std::vector<WindowWatch::Window> WindowWatch::FindNew()
{
    std::vector<HWND> visible;
    EnumWindows(AddVisible, reinterpret_cast<LPARAM>(&visible));
    std::vector<Window> found;
    for (HWND handle : visible)
    {
        DWORD process = 0;
        GetWindowThreadProcessId(handle, &process);
        if (!m_seen.contains(handle) && m_child.Contains(process))
        {
            Window window{handle, TextOf(handle), L""};
            EnumChildWindows(handle, AddLabel, reinterpret_cast<LPARAM>(&window.text));
            m_seen.insert(handle);
            found.push_back(std::move(window));
        }
    }
    return found;
}

void WindowWatch::Cancel(const Window& window)
{
    auto* const handle = static_cast<HWND>(window.handle);
    for (const int button : {IDCANCEL, IDNO})
    {
        if (HWND control = GetDlgItem(handle, button); control != nullptr)
        {
            PostMessageW(handle, WM_COMMAND, MAKEWPARAM(button, BN_CLICKED), reinterpret_cast<LPARAM>(control));
            return;
        }
    }
    PostMessageW(handle, WM_CLOSE, 0, 0);
}
