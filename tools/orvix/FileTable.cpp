#include "FileTable.h"

#include <algorithm>

void FileTable::Print(std::ostream& stream) const
{
    if (m_rows.size() == 1)
    {
        return;
    }
    std::vector<std::size_t> widths(m_rows.front().size());
    for (const Row& row : m_rows)
    {
        for (std::size_t column = 0; column + 1 < row.size(); ++column)
        {
            widths[column] = std::max(widths[column], row[column].size() + 2);
        }
    }
    for (const Row& row : m_rows)
    {
        for (std::size_t column = 0; column < row.size(); ++column)
        {
            stream << row[column];
            if (column + 1 < row.size())
            {
                stream << std::string(widths[column] - row[column].size(), ' ');
            }
        }
        stream << '\n';
    }
}
