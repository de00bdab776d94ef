#pragma once

#include "Listing.h"

#include <cstddef>
#include <optional>
#include <ostream>
#include <string>

/// How results are laid out: for a person at a terminal, or plain and complete for a pipe or a file.
struct OutputStyle
{
    std::optional<std::size_t> width; ///< columns of the terminal; empty: no terminal
    bool colour = false;

    /// The style for a terminal of this width (empty: no terminal). `obeysSequences`: it can show colours.
    /// `noColorVariable`: the text of the environment variable NO_COLOR, or null. `noColorOption`: the user wants no
    /// colours.
    static OutputStyle Of(std::optional<std::size_t> width, bool obeysSequences, const wchar_t* noColorVariable,
                          bool noColorOption)
    {
        const bool unwanted = noColorOption || (noColorVariable != nullptr && *noColorVariable != L'\0');
        return {width, width && obeysSequences && !unwanted};
    }

    /// The text in the colour of a tone; unchanged where there are no colours.
    std::string Coloured(const std::string& text, Listing::Tone tone) const;

    /// Prints a line of UTF-8 and a line end.
    void PrintLine(std::ostream& stream, const std::string& line) const;
};
