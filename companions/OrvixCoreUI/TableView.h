#pragma once

#include "CellTip.h"
#include "Palette.h"
#include "TextTable.h"

#include <commctrl.h>
#include <windows.h>

#include <optional>
#include <string>
#include <vector>

/// A table of texts in a virtual list control (LVS_OWNERDATA). The control asks for the texts that it draws, so it is
/// fast with any number of rows. A click on the heading of a column sorts by it, a second click reverses the order; the
/// context menu does the same by keyboard. Column widths and order are remembered. A cell that does not show its whole
/// text has it as a tool tip. One of the rows shown always has the focus: the first one at the start, and
/// when the filter hides the row with the focus. Screen readers are told of changed check boxes. Rows are numbered from
/// 0 in the order in which they were added; the position of a row is where it is shown.
class TableView
{
public:
    /// What is in the cells of a column.
    enum class Content
    {
        Text, ///< a text that is too wide is cut off at its end
        Path, ///< a path that is too wide is shortened in its middle
    };

    TableView() = default;

    /// `window` is the list control, which outlives this object. With `checkBoxes` a click on the box of a row checks
    /// or clears it. The space bar does the same for the row with the focus and, if that row is selected, for every
    /// selected row. `palette` outlives this object. Widths and order are remembered under `name`, which outlives this
    /// object, too.
    TableView(HWND window, const Palette& palette, const wchar_t* name, bool checkBoxes);

    /// Adds a column with `share` percent of the width. All columns are added before the first row.
    void AddColumn(const std::wstring& heading, int share, Content content = Content::Text);

    /// Takes the pictures of the cells from a list that outlives the control.
    void UseImages(HIMAGELIST images) const;

    /// `images`: the number of the picture of each cell, -1 for none. Cells without a number have none.
    void AddRow(std::vector<std::wstring> cells, bool checked, std::vector<int> images = {});

    /// Shows the rows that were added, with the widths and in the order that were remembered.
    void Open();

    /// Remembers widths and order. The control is about to be destroyed.
    void Close();

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

    /// Shows the context menu at a point of the screen. The keyboard gives (-1, -1), which means at the control. The
    /// menu ends with `more`, unless that is empty. Returns whether the user has chosen it.
    bool ShowMenu(POINT point, const std::wstring& more = {});

    /// The row that a click of the mouse is on; nothing when it is on a check box or below the rows.
    std::optional<std::size_t> RowOf(const NMITEMACTIVATE& click) const;

    /// The mouse has moved over the control.
    void OnMouseMove() { m_tip.OnMouseMove(); }

    /// Handles a notification of the control and returns what the control expects.
    LRESULT Handle(const NMHDR& notification);

private:
    std::wstring Heading(std::size_t column) const;
    void FillItem(LVITEMW& item);
    int ImageOf(std::size_t row, std::size_t column) const;
    LRESULT Draw(NMLVCUSTOMDRAW& drawing);

    /// The text of a cell when the cell does not show all of it; empty otherwise.
    std::wstring TextForTip(const CellTip::Cell& cell) const;
    int RoomForText(std::size_t row, std::size_t column) const;

    void SortBy(std::size_t column);
    void Sort();
    void ShowSortArrow() const;
    std::vector<int> Widths() const;
    int RoomForColumns() const;
    void RestoreWidths();
    void RestoreOrder();

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
    const Palette* m_palette = nullptr;
    const wchar_t* m_name = nullptr;
    CellTip m_tip;
    TextTable m_table;
    std::vector<bool> m_checked;
    std::vector<std::vector<int>> m_images; // of each row and column
    std::vector<Content> m_contents;        // of each column
    std::wstring m_shortened;               // the last path that was shortened
    bool m_isDrawing = false;
    std::size_t m_columns = 0;
    std::size_t m_sortColumn = 0;
    bool m_sorted = false;
    bool m_ascending = true;
    bool m_checkBoxes = false;
};
