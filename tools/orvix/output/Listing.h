#pragma once

#include <cstdint>
#include <string>
#include <variant>
#include <vector>

/// What a command lists: rows under named columns, and counts that sum them up. An `Output` prints it.
struct Listing
{
    /// How a text looks where there are colours.
    enum class Tone
    {
        Plain,
        Good,
        Bad,
        Quiet,
        Heading,
    };

    struct Cell
    {
        std::variant<std::monostate, std::int64_t, bool, std::wstring> value; ///< nothing: does not apply
        Tone tone = Tone::Plain;
    };

    struct Column
    {
        const char* key;     ///< name of the field in JSON
        const char* heading; ///< in the table
    };

    struct Count
    {
        const char* key;
        const char* words; ///< what follows the number
        unsigned int count;
    };

    const char* key; ///< name of the rows in JSON
    std::vector<Column> columns;
    std::vector<std::vector<Cell>> rows;
    std::vector<Count> summary; ///< the total first; nothing where the rows speak for themselves
};
