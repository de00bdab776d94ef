#pragma once

#include <cstddef>
#include <ostream>
#include <string>
#include <vector>

/// Lines of columns under a heading; every column but the last is padded to its widest cell.
class FileTable
{
public:
    using Row = std::vector<std::string>;

    explicit FileTable(Row heading) : m_rows{std::move(heading)} {}

    /// Appends a row with as many cells as the heading, in UTF-8.
    void Add(Row row) { m_rows.push_back(std::move(row)); }

    /// Prints the table; nothing when it has no rows.
    void Print(std::ostream& stream) const;

private:
    std::vector<Row> m_rows;
};
