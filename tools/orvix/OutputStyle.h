#pragma once

#include <cstddef>
#include <optional>

/// How results are laid out: for a person at a terminal, or plain and whole for a pipe or a file.
struct OutputStyle
{
    std::optional<std::size_t> width; ///< columns of the terminal; nothing: no terminal
    bool colour = false;

    /// What a terminal of this width (nothing: no terminal) gets. `obeysSequences`: it can show colours;
    /// `noColorVariable`: the environment variable NO_COLOR or null; `noColorOption`: the user wants none.
    static OutputStyle Of(std::optional<std::size_t> width, bool obeysSequences, const wchar_t* noColorVariable,
                          bool noColorOption)
    {
        const bool unwanted = noColorOption || (noColorVariable != nullptr && *noColorVariable != L'\0');
        return {width, width && obeysSequences && !unwanted};
    }
};
