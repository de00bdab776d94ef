#pragma once

#include "UniqueGdiObject.h"

#include <windows.h>

class IOrvixCoreUIClientAccess;

/// The host's colours for dialogs, read once, before a dialog opens. The brushes live as long as this object.
class Palette
{
public:
    /// Without `access` the colours are the system's.
    explicit Palette(IOrvixCoreUIClientAccess* access);

    COLORREF Window() const { return m_window; }
    COLORREF WindowText() const { return m_windowText; }

    /// Whether the colour of texts differs from the system's.
    bool HasOwnText() const { return m_faceText != GetSysColor(COLOR_BTNTEXT); }

    /// Handles a WM_CTLCOLOR message: sets the colours of the device context and returns the brush for the background.
    /// Null for any other message.
    HBRUSH Apply(UINT message, HDC context) const;

private:
    COLORREF m_face;
    COLORREF m_faceText;
    COLORREF m_window;
    COLORREF m_windowText;
    UniqueGdiObject<HBRUSH> m_faceBrush;
    UniqueGdiObject<HBRUSH> m_windowBrush;
};
