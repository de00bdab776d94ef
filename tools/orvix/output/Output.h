#pragma once

#include "Listing.h"

#include <string_view>

/// Prints the result of a command.
class Output
{
public:
    Output() = default;
    Output(const Output&) = delete;
    Output& operator=(const Output&) = delete;
    virtual ~Output() = default;

    /// Prints a text that belongs to the result while the command runs, such as the history. It may have several lines.
    virtual void Print(std::wstring_view text) = 0;

    /// Prints what a provider says while the command runs. It may have several lines.
    virtual void PrintMessage(std::wstring_view text) = 0;

    /// Shows a person who waits what the command does now. The next output replaces it; an empty text removes it.
    virtual void Progress(std::wstring_view text) = 0;

    /// Prints the result of the command. Called once, at the end.
    virtual void Show(const Listing& listing) = 0;
};
