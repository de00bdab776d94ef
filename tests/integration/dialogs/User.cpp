#include "User.h"

#include "UniqueHandle.h"

#include <gtest/gtest.h>

#include <bit>
#include <chrono>
#include <exception>
#include <utility>

namespace
{

using Clock = std::chrono::steady_clock;
constexpr std::chrono::seconds Patience{20};
constexpr UINT MarkMessage = WM_APP;

/// A window of the dialog's thread. Its message arrives when the messages that were posted before are handled.
struct MarkWindow
{
    HWND window = nullptr;
    UniqueKernelHandle reached{CreateEventW(nullptr, FALSE, FALSE, nullptr)};
};

MarkWindow& Mark()
{
    static MarkWindow mark;
    return mark;
}

LRESULT CALLBACK MarkProcedure(HWND window, UINT message, WPARAM wParam, LPARAM lParam)
{
    if (message == MarkMessage)
    {
        SetEvent(Mark().reached.Get());
    }
    return DefWindowProcW(window, message, wParam, lParam);
}

void MakeMarkWindow()
{
    if (Mark().window != nullptr)
    {
        return;
    }
    Mark().window = CreateWindowExW(0, L"Static", nullptr, 0, 0, 0, 0, 0, HWND_MESSAGE, nullptr, nullptr, nullptr);
    SetWindowLongPtrW(Mark().window, GWLP_WNDPROC, reinterpret_cast<LONG_PTR>(&MarkProcedure));
}

void Settle(HWND dialog)
{
    // Twice, since handling a message may post another one, such as the character of a key.
    for (int i = 0; i < 2 && IsWindow(dialog); ++i)
    {
        ResetEvent(Mark().reached.Get());
        PostMessageW(Mark().window, MarkMessage, 0, 0);
        while (IsWindow(dialog) && WaitForSingleObject(Mark().reached.Get(), 10) == WAIT_TIMEOUT)
        {
        }
    }
}

struct Search
{
    const std::wstring& title;
    HWND found = nullptr;
};

BOOL CALLBACK CompareTitle(HWND window, LPARAM parameter)
{
    auto& search = *std::bit_cast<Search*>(parameter);
    wchar_t title[256] = {};
    GetWindowTextW(window, title, 256);
    if (IsWindowVisible(window) && title == search.title)
    {
        search.found = window;
    }
    return search.found == nullptr ? TRUE : FALSE;
}

void Handle(DWORD thread, const std::wstring& title, const std::function<void(const DialogWindow&)>& handle)
{
    const auto dialog = AwaitWindow(thread, title);
    ASSERT_TRUE(dialog) << "no dialog appears";
    try
    {
        handle(*dialog);
    }
    catch (const std::exception& failure)
    {
        ADD_FAILURE() << failure.what();
    }
    if (dialog->IsOpen())
    {
        ADD_FAILURE() << "the dialog is still open";
        PostMessageW(dialog->Handle(), WM_COMMAND, IDCANCEL, 0);
    }
}

} // namespace

User::User(std::wstring title, std::function<void(const DialogWindow&)> handle)
{
    MakeMarkWindow();
    m_thread = std::thread(Handle, GetCurrentThreadId(), std::move(title), std::move(handle));
}

std::optional<DialogWindow> AwaitWindow(DWORD thread, const std::wstring& title)
{
    for (const auto end = Clock::now() + Patience; Clock::now() < end; Sleep(5))
    {
        Search search{title};
        EnumThreadWindows(thread, &CompareTitle, reinterpret_cast<LPARAM>(&search));
        if (search.found != nullptr)
        {
            Settle(search.found);
            return DialogWindow(search.found, &Settle);
        }
    }
    return std::nullopt;
}
