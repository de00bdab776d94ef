#pragma once

#include "Palette.h"

#include <windows.h>

#include <optional>

/// A report list control of a dialog. Rows and columns run from 0; texts are copied.
class ListView
{
public:
    ListView() = default;

    /// Full rows are selected; with `checkBoxes` each row can be ticked.
    ListView(HWND window, const Palette& palette, bool checkBoxes);

    /// `width` in pixels.
    void AddColumn(int column, const wchar_t* heading, int width) const;
    void AddRow(int row, const wchar_t* text) const;
    void SetText(int row, int column, const wchar_t* text) const;
    void SetTicked(int row, bool ticked) const;
    bool IsTicked(int row) const;
    std::optional<int> Selected() const;

    /// Width inside the frame, without a scroll bar, in pixels.
    int Width() const;

private:
    LRESULT Send(UINT message, WPARAM wParam, const void* argument) const;

    HWND m_window = nullptr;
};
