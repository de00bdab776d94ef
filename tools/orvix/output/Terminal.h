#pragma once

#include "OutputStyle.h"

#include <windows.h>

/// The terminal behind the standard output, if there is one; made to obey escape sequences for the life of this object.
class Terminal
{
public:
    Terminal();
    Terminal(const Terminal&) = delete;
    Terminal& operator=(const Terminal&) = delete;
    ~Terminal();

    /// How the standard output is laid out now. `noColor`: the user wants no colours.
    OutputStyle Style(bool noColor) const;

private:
    HANDLE m_output;
    DWORD m_previousMode = 0;
    bool m_isTerminal;
    bool m_obeysSequences;
};
