#pragma once

#include "PaintDelay.h"

#include <windows.h>

#include <bit>
#include <future>
#include <thread>
#include <utility>

/// A window whose thread does nothing but paint it. What it waits for, the machine was too busy for: the measure for
/// other windows.
class IdleWindow
{
public:
    IdleWindow()
    {
        std::promise<HWND> made;
        std::future<HWND> window = made.get_future();
        m_thread = std::thread([this, made = std::move(made)]() mutable {
            const HWND own = CreateWindowExW(WS_EX_NOACTIVATE, L"Static", L"Idle", WS_POPUP | WS_VISIBLE, 700, 0, 50,
                                             50, nullptr, nullptr, nullptr, nullptr);
            SetWindowLongPtrW(own, GWLP_USERDATA, std::bit_cast<LONG_PTR>(this));
            SetWindowLongPtrW(own, GWLP_WNDPROC, std::bit_cast<LONG_PTR>(&Procedure));
            made.set_value(own);
            MSG message;
            while (GetMessageW(&message, nullptr, 0, 0) > 0)
            {
                DispatchMessageW(&message);
            }
        });
        m_window = window.get();
    }
    IdleWindow(const IdleWindow&) = delete;
    IdleWindow& operator=(const IdleWindow&) = delete;
    ~IdleWindow()
    {
        PostMessageW(m_window, WM_CLOSE, 0, 0);
        m_thread.join();
    }

    /// Asks it to paint. Called from any one thread.
    void Ask() { m_painting.Ask(m_window); }

    /// How long it has waited at most. Nobody asks any more.
    long long LongestMilliseconds() const { return m_painting.LongestMilliseconds(); }

private:
    static LRESULT CALLBACK Procedure(HWND window, UINT message, WPARAM wParam, LPARAM lParam)
    {
        if (message == WM_PAINT)
        {
            std::bit_cast<IdleWindow*>(GetWindowLongPtrW(window, GWLP_USERDATA))->m_painting.NotePaint();
        }
        if (message == WM_DESTROY)
        {
            PostQuitMessage(0);
        }
        return DefWindowProcW(window, message, wParam, lParam);
    }

    PaintDelay m_painting;
    HWND m_window = nullptr;
    std::thread m_thread;
};
