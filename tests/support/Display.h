#pragma once

#include <windows.h>

/// Whether windows can be shown.
inline bool HasDisplay()
{
    const HWND window =
        CreateWindowExW(0, L"Static", nullptr, WS_POPUP, 0, 0, 1, 1, nullptr, nullptr, nullptr, nullptr);
    if (window != nullptr)
    {
        DestroyWindow(window);
    }
    return window != nullptr;
}
