#pragma once

#include "UniqueGdiObject.h"

#include <windows.h>

#include <commctrl.h>

class IOrvixCoreUIClientAccess;

/// The host's colours for dialogs, read once, before a dialog opens. The brushes live as long as this object.
class Palette
{
public:
    /// Without `access` the colours are the system's.
    explicit Palette(IOrvixCoreUIClientAccess* access);

    COLORREF Window() const { return m_window; }
    COLORREF WindowText() const { return m_windowText; }
    COLORREF Highlight() const { return m_highlight; }
    COLORREF HighlightText() const { return m_highlightText; }

    /// Whether any colour differs from the system's.
    bool IsOwn() const;

    /// Whether the colour of texts differs from the system's.
    bool HasOwnText() const { return m_faceText != GetSysColor(COLOR_BTNTEXT); }

    /// Whether texts are lighter than the dialog.
    bool IsDark() const;

    /// Handles a WM_CTLCOLOR message: sets the colours of the device context and returns the brush for the background.
    /// Null for any other message.
    HBRUSH Apply(UINT message, HDC context) const;

    /// Draws a push button or the heading of a column in these colours. The control sends the notification before it
    /// draws itself and gets the result.
    LRESULT DrawButton(const NMCUSTOMDRAW& drawing) const;
    LRESULT DrawHeading(const NMCUSTOMDRAW& drawing) const;

private:
    void FillAfterHeadings(HWND headings, HDC context) const;
    void DrawFace(HDC context, RECT area, const wchar_t* text, UINT states, UINT format) const;

    COLORREF m_face;
    COLORREF m_faceText;
    COLORREF m_window;
    COLORREF m_windowText;
    COLORREF m_highlight;
    COLORREF m_highlightText;
    COLORREF m_grayText;
    UniqueGdiObject<HBRUSH> m_faceBrush;
    UniqueGdiObject<HBRUSH> m_windowBrush;
    UniqueGdiObject<HBRUSH> m_frameBrush;
};
