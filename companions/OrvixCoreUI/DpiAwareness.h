#pragma once

#include <windows.h>

/// While it lives, the thread makes windows that this library draws for the resolution of each monitor, whatever the
/// host does with its own windows.
class DpiAwareness
{
public:
    DpiAwareness() : m_previous(SetThreadDpiAwarenessContext(DPI_AWARENESS_CONTEXT_PER_MONITOR_AWARE_V2))
    {
        // The first releases of Windows 10 know only the first version.
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
