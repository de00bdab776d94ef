#include "OutputPane.h"

#include <commctrl.h>

#include <bit>
#include <utility>

namespace
{

constexpr int MaxLength = 200'000; // characters in the control; older lines are dropped

/// An edit control of several lines wants Tab, Esc and Enter. Here they belong to the window, which moves the focus.
LRESULT CALLBACK WithoutDialogKeys(HWND window, UINT message, WPARAM wParam, LPARAM lParam, UINT_PTR, DWORD_PTR)
{
    const LRESULT result = DefSubclassProc(window, message, wParam, lParam);
    return message == WM_GETDLGCODE ? result & ~(DLGC_WANTALLKEYS | DLGC_WANTTAB) : result;
}

} // namespace

void OutputPane::Create(HWND owner, int id)
{
    m_window =
        CreateWindowExW(WS_EX_CLIENTEDGE, L"Edit", L"",
                        WS_CHILD | WS_VISIBLE | WS_TABSTOP | WS_VSCROLL | ES_MULTILINE | ES_READONLY | ES_AUTOVSCROLL,
                        0, 0, 0, 0, owner, std::bit_cast<HMENU>(INT_PTR{id}), nullptr, nullptr);
    SetWindowSubclass(m_window, &WithoutDialogKeys, 0, 0);
    SendMessageW(m_window, EM_SETLIMITTEXT, 0, 0); // no limit
    const std::lock_guard<std::mutex> lock(m_mutex);
    m_owner = owner;
    PostMessageW(owner, Arrived, 0, 0);
}

void OutputPane::Add(const std::wstring& line)
{
    {
        const std::lock_guard<std::mutex> lock(m_mutex);
        m_lines.push_back(line);
        if (m_owner == nullptr)
        {
            return; // `Create` shows it
        }
        if (m_lines.size() == 1) // one message is enough for many lines
        {
            PostMessageW(m_owner, Arrived, 0, 0); // not sent: the owner's thread may be waiting inside the provider
        }
    }
    if (GetWindowThreadProcessId(m_owner, nullptr) == GetCurrentThreadId())
    {
        ShowArrived();
    }
}

void OutputPane::ShowArrived()
{
    std::wstring text;
    {
        const std::lock_guard<std::mutex> lock(m_mutex);
        for (const std::wstring& line : std::exchange(m_lines, {}))
        {
            text += line + L"\r\n";
        }
    }
    if (text.empty())
    {
        return;
    }
    int length = GetWindowTextLengthW(m_window);
    if (length > MaxLength)
    {
        SendMessageW(m_window, EM_SETSEL, 0, length / 2);
        SendMessageW(m_window, EM_REPLACESEL, FALSE, reinterpret_cast<LPARAM>(L""));
        length = GetWindowTextLengthW(m_window);
    }
    SendMessageW(m_window, EM_SETSEL, static_cast<WPARAM>(length), length);
    SendMessageW(m_window, EM_REPLACESEL, FALSE, reinterpret_cast<LPARAM>(text.c_str()));
    UpdateWindow(m_window);
}
