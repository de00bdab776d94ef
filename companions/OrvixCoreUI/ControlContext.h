#pragma once

#include <windows.h>

#include <bit>

/// A control's device context, with the control's font selected.
class ControlContext
{
public:
    explicit ControlContext(HWND control)
        : m_control(control), m_context(GetDC(control)),
          m_previousFont(SelectObject(m_context, std::bit_cast<HFONT>(SendMessageW(control, WM_GETFONT, 0, 0))))
    {
    }
    ControlContext(const ControlContext&) = delete;
    ControlContext& operator=(const ControlContext&) = delete;
    ~ControlContext()
    {
        SelectObject(m_context, m_previousFont);
        ReleaseDC(m_control, m_context);
    }

    HDC Get() const { return m_context; }

private:
    HWND m_control;
    HDC m_context;
    HGDIOBJ m_previousFont;
};
