#pragma once

#include "Listing.h"
#include "OutputStyle.h"

#include <cstddef>
#include <ostream>
#include <string>
#include <string_view>
#include <vector>

/// A listing as lines of columns under a heading. Every column except the last is padded to its widest cell.
class TextTable
{
public:
    explicit TextTable(const Listing& listing);

    /// Prints the table in UTF-8; nothing when it has no rows. On a terminal the widest columns are shortened, in the
    /// middle of their cells, until the lines fit.
    void Print(std::ostream& stream, const OutputStyle& style) const;

    /// How many columns of a terminal a text takes.
    static std::size_t ColumnsOf(std::wstring_view text);

    /// The text, with its middle left out so that it takes at most `columns`.
    static std::wstring Shortened(std::wstring_view text, std::size_t columns);

private:
    struct Cell
    {
        std::wstring text;
        Listing::Tone tone;
    };

    std::vector<std::size_t> Widths(const OutputStyle& style) const;

    std::vector<std::vector<Cell>> m_rows; // the heading first
};
