#pragma once

#include <cstddef>
#include <string>
#include <vector>

/// The rows of a list, which of them a filter shows, and in which order. Rows are numbered from 0 in the order in which
/// they were added; the position of a row is where it is shown.
class TextTable
{
public:
    /// Appends a row, which is shown last. Every row has as many cells as the first one.
    void Add(std::vector<std::wstring> cells);

    std::size_t NumRows() const { return m_rows.size(); }
    const std::wstring& Cell(std::size_t row, std::size_t column) const { return m_rows[row].cells[column]; }

    /// Changes the text of a cell. The row keeps its position until the next filter or sort.
    void SetCell(std::size_t row, std::size_t column, std::wstring text);

    /// Shows the rows that contain `text` in any cell, in any letter case; all rows when it is empty.
    void Filter(const std::wstring& text);

    /// Orders the rows by a column without regard to letter case. Rows with equal cells keep their order.
    void Sort(std::size_t column, bool ascending);

    /// How many rows are shown; positions run from 0 to one less.
    std::size_t NumShown() const { return m_shown.size(); }
    std::size_t RowAt(std::size_t position) const { return m_shown[position]; }

private:
    struct Row
    {
        std::vector<std::wstring> cells;
        std::vector<std::wstring> folded; ///< the cells in lower case
    };

    void ApplyFilter();

    std::vector<Row> m_rows;
    std::vector<std::size_t> m_order;
    std::vector<std::size_t> m_shown;
    std::wstring m_filter;
};
