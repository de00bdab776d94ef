#pragma once

#include "UniqueHandle.h"

#include <windows.h>

/// How a window of this thread is destroyed.
struct WindowPolicy
{
    using Handle = HWND;
    static Handle None() noexcept { return nullptr; }
    static void Close(Handle window) noexcept { DestroyWindow(window); }
};

/// Owns a window.
using UniqueWindow = UniqueHandle<WindowPolicy>;
