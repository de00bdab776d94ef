#include "TextTable.h"

#include <windows.h>

#include <algorithm>
#include <iterator>
#include <utility>

namespace
{

/// The text in lower case, for comparisons without regard to letter case.
std::wstring Folded(std::wstring text)
{
    CharLowerBuffW(text.data(), static_cast<DWORD>(text.size()));
    return text;
}

} // namespace

void TextTable::Add(std::vector<std::wstring> cells)
{
    Row row{std::move(cells), {}};
    std::transform(row.cells.begin(), row.cells.end(), std::back_inserter(row.folded), Folded);
    m_order.push_back(m_rows.size());
    m_shown.push_back(m_rows.size());
    m_rows.push_back(std::move(row));
}

void TextTable::SetCell(std::size_t row, std::size_t column, std::wstring text)
{
    m_rows[row].folded[column] = Folded(text);
    m_rows[row].cells[column] = std::move(text);
}

void TextTable::Filter(const std::wstring& text)
{
    m_filter = Folded(text);
    ApplyFilter();
}

void TextTable::Sort(std::size_t column, bool ascending)
{
    std::stable_sort(m_order.begin(), m_order.end(), [&](std::size_t left, std::size_t right) {
        const int order = m_rows[left].folded[column].compare(m_rows[right].folded[column]);
        return ascending ? order < 0 : order > 0;
    });
    ApplyFilter();
}

void TextTable::ApplyFilter()
{
    m_shown.clear();
    std::copy_if(m_order.begin(), m_order.end(), std::back_inserter(m_shown), [this](std::size_t row) {
        const auto& cells = m_rows[row].folded;
        return std::any_of(cells.begin(), cells.end(),
                           [this](const std::wstring& cell) { return cell.find(m_filter) != std::wstring::npos; });
    });
}
