#pragma once

#include "Listing.h"

#include <string_view>

/// Where a command's results go.
class Output
{
public:
    Output() = default;
    Output(const Output&) = delete;
    Output& operator=(const Output&) = delete;
    virtual ~Output() = default;

    /// What somebody says while the command runs: the provider, or a listener. May have several lines.
    virtual void Say(std::wstring_view text) = 0;

    /// What the command is at, for a person who waits. It disappears with the next thing to print; empty: now.
    virtual void Progress(std::wstring_view text) = 0;

    /// The result of the command, once and at the end.
    virtual void Show(const Listing& listing) = 0;
};
