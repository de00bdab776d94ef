#pragma once

#include <windows.h>

/// Lets the windows that the thread makes during its lifetime be drawn by this library for each monitor's own
/// resolution, whatever the host does with its own.
class DpiAwareness
{
public:
    DpiAwareness() : m_previous(SetThreadDpiAwarenessContext(DPI_AWARENESS_CONTEXT_PER_MONITOR_AWARE_V2))
    {
        // The first releases of Windows 10 do not know the second version.
        if (m_previous == nullptr)
        {
            m_previous = SetThreadDpiAwarenessContext(DPI_AWARENESS_CONTEXT_PER_MONITOR_AWARE);
        }
    }
    DpiAwareness(const DpiAwareness&) = delete;
    DpiAwareness& operator=(const DpiAwareness&) = delete;
    ~DpiAwareness()
    {
        if (m_previous != nullptr)
        {
            SetThreadDpiAwarenessContext(m_previous);
        }
    }

private:
    DPI_AWARENESS_CONTEXT m_previous;
};
