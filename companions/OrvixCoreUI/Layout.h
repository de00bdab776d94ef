#pragma once

#include "UniqueGdiObject.h"

#include <windows.h>

#include <span>
#include <vector>

/// Moves the controls of a dialog when its size or the resolution of its monitor changes. Every control is scaled with
/// the resolution; a rule says how it follows the lower right corner of the dialog.
class Layout
{
public:
    // Bits of a rule.
    static constexpr unsigned MoveX = 0x1;
    static constexpr unsigned MoveY = 0x2;
    static constexpr unsigned GrowX = 0x4;
    static constexpr unsigned GrowY = 0x8;

    struct Rule
    {
        int control; ///< its ID
        unsigned follows;
    };

    Layout() = default;

    /// Takes the present size of the dialog and of its controls as the base. The dialog gets no smaller than that. A
    /// control without a rule stays where it is.
    Layout(HWND dialog, std::span<const Rule> rules);

    /// Makes a control, and the smallest dialog, `more` pixels higher and moves down what is below the control. Only
    /// before the first `SetDpi`.
    void MakeRoom(HWND control, LONG more);

    /// Moves the controls to their places for the present size of the dialog.
    void Apply() const;

    /// Changes the font and the scale to another resolution. The size of the dialog itself stays.
    void SetDpi(UINT dpi);

    /// Converts a length at 96 dots per inch to pixels.
    int ToPixels(int length) const { return MulDiv(length, static_cast<int>(m_dpi), USER_DEFAULT_SCREEN_DPI); }

    /// Converts pixels to a length at 96 dots per inch.
    int FromPixels(int pixels) const { return MulDiv(pixels, USER_DEFAULT_SCREEN_DPI, static_cast<int>(m_dpi)); }

    /// The smallest window, in pixels.
    POINT SmallestWindow() const;

private:
    struct Control
    {
        HWND window;
        RECT rect;
        unsigned follows;
    };

    int Scaled(int length) const { return MulDiv(length, static_cast<int>(m_dpi), static_cast<int>(m_baseDpi)); }

    HWND m_dialog = nullptr;
    std::vector<Control> m_controls;
    SIZE m_clientSize{};
    LOGFONTW m_fontDescription{};
    UniqueGdiObject<HFONT> m_font;
    UINT m_baseDpi = USER_DEFAULT_SCREEN_DPI;
    UINT m_dpi = USER_DEFAULT_SCREEN_DPI;
};
