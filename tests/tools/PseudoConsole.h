#pragma once

#include <windows.h>

#include <string>

/// A console without a window, 60 columns wide, and what a program shows in it.
class PseudoConsole
{
public:
    static constexpr SHORT Columns = 60;

    struct Result
    {
        unsigned long code;
        std::string output; ///< UTF-8 and escape sequences, as a terminal gets them
        std::string text;   ///< the same without the sequences; lines end in LF
    };

    /// Runs a command line, for at most 60 seconds. Throws std::runtime_error when it does not start or end.
    static Result Run(std::wstring commandLine);
};
