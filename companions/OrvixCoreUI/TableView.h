#pragma once

#include "Palette.h"
#include "TextTable.h"

#include <commctrl.h>
#include <windows.h>

#include <optional>
#include <string>
#include <vector>

/// A table of texts in a virtual list control (LVS_OWNERDATA): the control asks for what it draws, so that it is
/// quick with any number of rows. A click on a column's heading sorts, a second one turns the order round; the context
/// menu offers the same to the keyboard. A row that is shown always has the focus: at the beginning, and where the
/// filter takes the one that has it away, the first. Screen readers are told of changed ticks.
/// Rows are numbered from 0 as they were added.
class TableView
{
public:
    TableView() = default;

    /// With `checkBoxes` each row can be ticked by a click on its box; the space bar ticks the row with the focus and,
    /// if it is selected, the other selected ones with it.
    TableView(HWND window, const Palette& palette, bool checkBoxes);

    /// Columns go before rows. `share` of the width, in percent.
    void AddColumn(const std::wstring& heading, int share);
    void AddRow(std::vector<std::wstring> cells, bool checked);

    /// Shows the rows added since.
    void Refresh();

    void SetCell(std::size_t row, std::size_t column, std::wstring text);
    void Filter(const std::wstring& text);
    std::size_t NumRows() const { return m_table.NumRows(); }
    std::size_t NumShown() const { return m_table.NumShown(); }

    bool IsChecked(std::size_t row) const { return m_checked[row]; }
    std::size_t NumChecked() const;

    /// Ticks or unticks the rows that are shown.
    void CheckShown(bool checked);

    /// The first selected row.
    std::optional<std::size_t> Selected() const;

    /// Gives the columns their part of the control's new width.
    void FitColumns() const;

    /// Shows the context menu at a point of the screen, or, for the keyboard's (-1, -1), at the control.
    void ShowMenu(POINT point);

    /// Answers a notification of the control.
    LRESULT Handle(const NMHDR& notification);

private:
    std::wstring Heading(std::size_t column) const;
    void GiveItem(LVITEMW& item) const;
    void SortBy(std::size_t column);
    template <typename Rearrange>
    void KeepingSelection(const Rearrange& rearrange);
    void SetState(std::size_t place, UINT states, UINT value) const;
    void ToggleFocused();
    /// Does not draw.
    void Check(const std::vector<std::size_t>& places, bool checked);
    void ToggleClicked(const NMITEMACTIVATE& click);
    LRESULT Find(const NMLVFINDITEMW& search) const;
    std::vector<std::size_t> SelectedPlaces() const;
    /// The next place with a state.
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
