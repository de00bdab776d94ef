#pragma once

#include "UniqueGdiObject.h"

#include <windows.h>

class IOrvixCoreUIClientAccess;

/// The host's colours for dialogs, read once, before a dialog opens.
class Palette
{
public:
    /// `access` may be null: the system's colours.
    explicit Palette(IOrvixCoreUIClientAccess* access);

    COLORREF Window() const { return m_window; }
    COLORREF WindowText() const { return m_windowText; }

    /// Whether texts have another colour than the system's.
    bool HasOwnText() const { return m_faceText != GetSysColor(COLOR_BTNTEXT); }

    /// Answers a WM_CTLCOLOR message: sets the colours of the device context and gives the brush for the
    /// background; null for a message of another kind.
    HBRUSH Apply(UINT message, HDC context) const;

private:
    COLORREF m_face;
    COLORREF m_faceText;
    COLORREF m_window;
    COLORREF m_windowText;
    UniqueGdiObject<HBRUSH> m_faceBrush;
    UniqueGdiObject<HBRUSH> m_windowBrush;
};
