#pragma once

#include <windows.h>

#include <memory>
#include <type_traits>

class IOrvixCoreUIClientAccess;

/// The host's colours for dialogs, read once, before a dialog opens.
class Palette
{
public:
    /// `access` may be null: the system's colours.
    explicit Palette(IOrvixCoreUIClientAccess* access);

    COLORREF Window() const { return m_window; }
    COLORREF WindowText() const { return m_windowText; }

    /// Answers a WM_CTLCOLOR message: sets the colours of the device context and gives the brush for the
    /// background; null for a message of another kind.
    HBRUSH Apply(UINT message, HDC context) const;

private:
    struct BrushDeleter
    {
        void operator()(HBRUSH brush) const { DeleteObject(brush); }
    };
    using Brush = std::unique_ptr<std::remove_pointer_t<HBRUSH>, BrushDeleter>;

    COLORREF m_face;
    COLORREF m_faceText;
    COLORREF m_window;
    COLORREF m_windowText;
    Brush m_faceBrush;
    Brush m_windowBrush;
};
