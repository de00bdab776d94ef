#pragma once

#include <windows.h>

/// The colours of the program's own controls and of the library's dialogs: the system's, or dark ones.
class Theme
{
public:
    void SetDark(bool dark) { m_dark = dark; }
    bool IsDark() const { return m_dark; }

    /// The colour for a system colour index (COLOR_*). A user of high contrast gets the system's colours.
    COLORREF Color(int index) const
    {
        if (!m_dark || IsHighContrast())
        {
            return GetSysColor(index);
        }
        switch (index)
        {
        case COLOR_WINDOW:
            return RGB(30, 31, 34);
        case COLOR_BTNFACE:
            return RGB(43, 45, 48);
        case COLOR_WINDOWTEXT:
        case COLOR_BTNTEXT:
            return RGB(223, 225, 229);
        default:
            return GetSysColor(index);
        }
    }

private:
    static bool IsHighContrast()
    {
        HIGHCONTRASTW contrast{};
        contrast.cbSize = sizeof contrast;
        SystemParametersInfoW(SPI_GETHIGHCONTRAST, sizeof contrast, &contrast, 0);
        return (contrast.dwFlags & HCF_HIGHCONTRASTON) != 0;
    }

    bool m_dark = false;
};
