#pragma once

#include "UniqueWindow.h"

#include <windows.h>

#include <commctrl.h>

#include <string>

/// The tool tip of a list control in report view: the whole text of the cell under the mouse, when the cell does not
/// show all of it.
class CellTip
{
public:
    struct Cell
    {
        int position = -1; ///< of its row; -1 for no cell
        int column = -1;

        bool operator==(const Cell&) const = default;
    };

    CellTip() = default;

    /// `list` outlives this object. Its parent gets the tool tip's notifications.
    explicit CellTip(HWND list);

    /// Whether a notification asks for the text of this tool tip.
    bool IsAskedBy(const NMHDR& notification) const;

    /// The cell under the mouse.
    Cell CellUnderMouse() const;

    /// Answers a notification that asks for the text. An empty text shows no tool tip.
    void Answer(const NMHDR& notification, std::wstring text);

    /// Hides the tool tip when the mouse has moved to another cell.
    void OnMouseMove();

private:
    HWND m_list = nullptr;
    UniqueWindow m_tip;
    Cell m_cell;
    std::wstring m_text; // which the tool tip shows
};
