#pragma once

#include <cstdint>
#include <string>
#include <variant>
#include <vector>

/// The result of a command: rows under named columns, and counts that sum them up. An `Output` prints it.
struct Listing
{
    /// The colour of a text where there are colours.
    enum class Tone
    {
        Plain,
        Good,
        Bad,
        Quiet,
        Heading,
    };

    /// The state of a file. In JSON it has two fields: the column's key holds the array of words, and the key with
    /// "Text" after it holds the text.
    struct State
    {
        std::vector<std::string> words; ///< stable, for programs
        std::wstring text;              ///< for people
    };

    struct Cell
    {
        std::variant<std::monostate, std::int64_t, bool, std::wstring, State> value; ///< monostate: does not apply
        Tone tone = Tone::Plain;
    };

    struct Column
    {
        const char* key;     ///< name of the field in JSON
        const char* heading; ///< in the table
    };

    struct Count
    {
        const char* key;   ///< name of the field in JSON
        const char* words; ///< printed after the number
        unsigned int count;
    };

    const char* key; ///< name of the array of rows in JSON
    std::vector<Column> columns;
    std::vector<std::vector<Cell>> rows;
    std::vector<Count> summary; ///< the total comes first; empty where no summary is needed
};
