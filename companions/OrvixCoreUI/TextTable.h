#pragma once

#include <cstddef>
#include <string>
#include <vector>

/// The rows of a list: which of them a filter lets through, and in which order they are shown. A row keeps the
/// number under which it was added; its place is where it is shown.
class TextTable
{
public:
    /// Appends a row, with as many cells as every other row, to what is shown.
    void Add(std::vector<std::wstring> cells);

    std::size_t NumRows() const { return m_rows.size(); }
    const std::wstring& Cell(std::size_t row, std::size_t column) const { return m_rows[row].cells[column]; }

    /// The row stays in its place until the next filter or sort.
    void SetCell(std::size_t row, std::size_t column, std::wstring text);

    /// Shows the rows one of whose cells contains the text, in whatever letter case.
    void Filter(const std::wstring& text);

    /// Orders the rows by a column, in whatever letter case; equal ones keep their order.
    void Sort(std::size_t column, bool ascending);

    std::size_t NumShown() const { return m_shown.size(); }
    std::size_t RowAt(std::size_t place) const { return m_shown[place]; }

private:
    struct Row
    {
        std::vector<std::wstring> cells;
        std::vector<std::wstring> folded;
    };

    void Show();

    std::vector<Row> m_rows;
    std::vector<std::size_t> m_order;
    std::vector<std::size_t> m_shown;
    std::wstring m_filter;
};
