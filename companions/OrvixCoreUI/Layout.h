#pragma once

#include "UniqueGdiObject.h"

#include <windows.h>

#include <span>
#include <vector>

/// Keeps the controls of a dialog in place while its size and the resolution of its monitor change. Every control
/// grows with the resolution; a rule says how it follows the dialog's lower right corner besides.
class Layout
{
public:
    static constexpr unsigned MoveX = 0x1;
    static constexpr unsigned MoveY = 0x2;
    static constexpr unsigned GrowX = 0x4;
    static constexpr unsigned GrowY = 0x8;

    struct Rule
    {
        int control;
        unsigned follows;
    };

    Layout() = default;

    /// Takes the dialog as it stands now for the measure, and for the smallest size.
    Layout(HWND dialog, std::span<const Rule> rules);

    /// Makes a control higher, in pixels, and the smallest dialog with it: what is below moves down. Goes before a turn
    /// to another resolution.
    void MakeRoom(HWND control, LONG more);

    /// Moves the controls to where they belong in the dialog's size.
    void Apply() const;

    /// Turns to another resolution: font and measures, not the dialog's own size.
    void SetDpi(UINT dpi);

    /// A length at 96 dots per inch as pixels, and back.
    int ToPixels(int length) const { return MulDiv(length, static_cast<int>(m_dpi), USER_DEFAULT_SCREEN_DPI); }
    int FromPixels(int pixels) const { return MulDiv(pixels, USER_DEFAULT_SCREEN_DPI, static_cast<int>(m_dpi)); }

    /// The smallest window, in pixels.
    POINT SmallestWindow() const;

private:
    struct Control
    {
        HWND window;
        RECT place;
        unsigned follows;
    };

    int Scaled(int length) const { return MulDiv(length, static_cast<int>(m_dpi), static_cast<int>(m_baseDpi)); }

    HWND m_dialog = nullptr;
    std::vector<Control> m_controls;
    SIZE m_inside{};
    LOGFONTW m_letters{};
    UniqueGdiObject<HFONT> m_font;
    UINT m_baseDpi = USER_DEFAULT_SCREEN_DPI;
    UINT m_dpi = USER_DEFAULT_SCREEN_DPI;
};
