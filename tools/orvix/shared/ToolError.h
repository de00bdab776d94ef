#pragma once

#include "Text.h"

#include <stdexcept>

/// The exit code of the process; documented in docs/orvix.md.
enum class ExitCode
{
    Success = 0,
    Failed = 1,         ///< something failed, was refused or is wrong
    BadUsage = 2,       ///< the command line is wrong
    NotFound = 3,       ///< no such provider, project, folder, library, registration or prompt
    BrokenSettings = 4, ///< OrvixProviders.xml cannot be read, and the command changes files
    ProviderEnded = 5,  ///< the provider ended the process
    TimedOut = 6,       ///< the provider gave no sign of life for the time of --timeout
};

/// Ends the run with a message on the error output and an exit code.
class ToolError : public std::runtime_error
{
public:
    ToolError(ExitCode code, std::wstring_view message) : std::runtime_error(Printable(message)), m_code(code) {}

    ExitCode Code() const { return m_code; }

private:
    ExitCode m_code;
};
