#pragma once

#include "Text.h"

#include <stdexcept>

/// What the process tells its caller; documented in docs/orvix.md.
enum class ExitCode
{
    Success = 0,
    Failed = 1,
    BadUsage = 2,
    NoProject = 3,
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
