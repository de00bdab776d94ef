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

    /// Prints text of the provider or of a listener while the command runs. It may have several lines.
    virtual void Print(std::wstring_view text) = 0;

    /// Shows a person who waits what the command does now. The next output replaces it; an empty text removes it.
    virtual void Progress(std::wstring_view text) = 0;

    /// Prints the result of the command. Called once, at the end.
    virtual void Show(const Listing& listing) = 0;
};
