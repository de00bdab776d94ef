#pragma once

#include "OutputStyle.h"

#include <windows.h>

/// The terminal that shows the standard output, if there is one. It obeys escape sequences while this object lives.
class Terminal
{
public:
    Terminal();
    Terminal(const Terminal&) = delete;
    Terminal& operator=(const Terminal&) = delete;
    ~Terminal();

    /// The style for the standard output now. `noColor`: the user wants no colours.
    OutputStyle Style(bool noColor) const;

private:
    HANDLE m_output; // not owned
    DWORD m_previousMode = 0;
    bool m_isTerminal;
    bool m_obeysSequences;
};
