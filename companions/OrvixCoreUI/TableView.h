#pragma once

#include "Palette.h"
#include "TextTable.h"

#include <commctrl.h>
#include <windows.h>

#include <optional>
#include <string>
#include <vector>

/// A table of texts in a virtual list control (LVS_OWNERDATA). The control asks for the texts that it draws, so it is
/// fast with any number of rows. A click on the heading of a column sorts by it, a second click reverses the order; the
/// context menu does the same by keyboard. One of the rows shown always has the focus: the first one at the start, and
/// when the filter hides the row with the focus. Screen readers are told of changed check boxes. Rows are numbered from
/// 0 in the order in which they were added; the position of a row is where it is shown.
class TableView
{
public:
    TableView() = default;

    /// `window` is the list control, which outlives this object. With `checkBoxes` a click on the box of a row checks
    /// or clears it. The space bar does the same for the row with the focus and, if that row is selected, for every
    /// selected row.
    TableView(HWND window, const Palette& palette, bool checkBoxes);

    /// Adds a column with `share` percent of the width. All columns are added before the first row.
    void AddColumn(const std::wstring& heading, int share);
    void AddRow(std::vector<std::wstring> cells, bool checked);

    /// Shows the rows that were added since the last call.
    void Refresh();

    /// Changes the text of a cell; the row keeps its position until the next filter or sort.
    void SetCell(std::size_t row, std::size_t column, std::wstring text);

    /// Shows the rows that contain `text` in any cell, in any letter case; all rows when it is empty.
    void Filter(const std::wstring& text);
    std::size_t NumRows() const { return m_table.NumRows(); }
    std::size_t NumShown() const { return m_table.NumShown(); }

    bool IsChecked(std::size_t row) const { return m_checked[row]; }
    std::size_t NumChecked() const;

    /// Checks or clears every row that is shown.
    void CheckShown(bool checked);

    /// The first selected row; nothing when none is selected.
    std::optional<std::size_t> Selected() const;

    /// Divides the control's new width among the columns, in the proportions that they have.
    void FitColumns() const;

    /// Shows the context menu at a point of the screen. The keyboard gives (-1, -1), which means at the control.
    void ShowMenu(POINT point);

    /// Handles a notification of the control and returns what the control expects.
    LRESULT Handle(const NMHDR& notification);

private:
    std::wstring Heading(std::size_t column) const;
    void FillItem(LVITEMW& item) const;
    void SortBy(std::size_t column);

    /// Calls `rearrange`, which changes the rows shown or their order. Selection and focus stay on their rows.
    template <typename Rearrange>
    void KeepingSelection(const Rearrange& rearrange);
    void SetState(std::size_t position, UINT states, UINT value) const;
    void ToggleFocused();
    void Check(const std::vector<std::size_t>& positions, bool checked);
    void ToggleClicked(const NMITEMACTIVATE& click);
    LRESULT Find(const NMLVFINDITEMW& search) const;
    std::vector<std::size_t> SelectedPositions() const;

    /// The next position after `after` with a state (LVNI_SELECTED or LVNI_FOCUSED).
    std::optional<std::size_t> Next(std::size_t after, UINT state) const;
    LRESULT Send(UINT message, WPARAM wParam, const void* argument) const;

    HWND m_window = nullptr;
    TextTable m_table;
    std::vector<bool> m_checked;
    std::size_t m_columns = 0;
    std::size_t m_sortColumn = 0;
    bool m_sorted = false;
    bool m_ascending = true;
    bool m_checkBoxes = false;
};
