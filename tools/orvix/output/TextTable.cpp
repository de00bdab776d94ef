#include "TextTable.h"

#include "Text.h"

#include <windows.h>

#include <algorithm>
#include <numeric>

namespace
{

constexpr std::size_t Gap = 2;       // columns between two cells
constexpr std::size_t Narrowest = 8; // columns that a cell keeps on the narrowest terminal
constexpr wchar_t Ellipsis = L'\x2026';

/// The text with a blank instead of each line end.
std::wstring OnOneLine(std::wstring text)
{
    for (std::size_t end = 0; (end = text.find_first_of(L"\r\n", end)) != std::wstring::npos;)
    {
        text.replace(end, text.compare(end, 2, L"\r\n") == 0 ? 2 : 1, L" ");
    }
    return text;
}

std::wstring TextOf(const Listing::Cell& cell)
{
    struct
    {
        std::wstring operator()(std::monostate) const { return L""; }
        std::wstring operator()(std::int64_t number) const { return std::to_wstring(number); }
        std::wstring operator()(bool yes) const { return yes ? L"yes" : L"no"; }
        std::wstring operator()(const std::wstring& text) const { return OnOneLine(text); }
        std::wstring operator()(const Listing::State& state) const { return OnOneLine(state.text); }
    } const inWords;
    return std::visit(inWords, cell.value);
}

/// Columns of one UTF-16 unit. Each half of a surrogate pair counts as one, since most characters above U+FFFF are
/// wide.
std::size_t ColumnsOfUnit(wchar_t unit)
{
    WORD type = 0;
    GetStringTypeW(CT_CTYPE3, &unit, 1, &type);
    if ((type & C3_NONSPACING) != 0 && (type & C3_ALPHA) == 0)
    {
        return 0;
    }
    const bool wide = (type & (C3_FULLWIDTH | C3_IDEOGRAPH | C3_HIRAGANA | C3_KATAKANA)) != 0;
    return wide && (type & C3_HALFWIDTH) == 0 ? 2 : 1;
}

} // namespace

TextTable::TextTable(const Listing& listing)
{
    std::vector<Cell>& heading = m_rows.emplace_back();
    for (const Listing::Column& column : listing.columns)
    {
        heading.push_back({Wide(column.heading), Listing::Tone::Heading});
    }
    for (const std::vector<Listing::Cell>& row : listing.rows)
    {
        std::vector<Cell>& cells = m_rows.emplace_back();
        for (const Listing::Cell& cell : row)
        {
            cells.push_back({TextOf(cell), cell.tone});
        }
    }
}

void TextTable::Print(std::ostream& stream, const OutputStyle& style) const
{
    if (m_rows.size() == 1)
    {
        return;
    }
    const std::vector<std::size_t> widths = Widths(style);
    for (const std::vector<Cell>& row : m_rows)
    {
        std::string line;
        for (std::size_t column = 0; column < row.size(); ++column)
        {
            const std::wstring text = Shortened(row[column].text, widths[column]);
            line += style.Coloured(Printable(text), row[column].tone);
            if (column + 1 < row.size())
            {
                line.append(widths[column] + Gap - ColumnsOf(text), ' ');
            }
        }
        style.PrintLine(stream, line);
    }
}

std::vector<std::size_t> TextTable::Widths(const OutputStyle& style) const
{
    std::vector<std::size_t> widths(m_rows.front().size());
    for (const std::vector<Cell>& row : m_rows)
    {
        for (std::size_t column = 0; column < row.size(); ++column)
        {
            widths[column] = std::max(widths[column], ColumnsOf(row[column].text));
        }
    }
    std::size_t total = std::accumulate(widths.begin(), widths.end(), Gap * (widths.size() - 1));
    while (style.width && total >= *style.width) // a full line would wrap
    {
        const auto widest = std::max_element(widths.begin(), widths.end());
        if (*widest <= Narrowest)
        {
            break;
        }
        --*widest;
        --total;
    }
    return widths;
}

std::size_t TextTable::ColumnsOf(std::wstring_view text)
{
    return std::accumulate(text.begin(), text.end(), std::size_t{0},
                           [](std::size_t sum, wchar_t unit) { return sum + ColumnsOfUnit(unit); });
}

std::wstring TextTable::Shortened(std::wstring_view text, std::size_t columns)
{
    if (ColumnsOf(text) <= columns)
    {
        return std::wstring(text);
    }
    if (columns == 0)
    {
        return L"";
    }
    // An odd column goes to the end, which says more about a path than its beginning.
    std::wstring_view head = text;
    while (!head.empty() && ColumnsOf(head) > (columns - 1) / 2)
    {
        head.remove_suffix(1);
    }
    std::wstring_view tail = text;
    while (!tail.empty() && ColumnsOf(tail) > columns - 1 - ColumnsOf(head))
    {
        tail.remove_prefix(1);
    }
    if (!head.empty() && IS_HIGH_SURROGATE(head.back()))
    {
        head.remove_suffix(1);
    }
    if (!tail.empty() && IS_LOW_SURROGATE(tail.front()))
    {
        tail.remove_prefix(1);
    }
    return std::wstring(head) + Ellipsis + std::wstring(tail);
}
