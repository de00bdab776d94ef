#pragma once

#include "Command.h"

#include <optional>

/// A command and what the user typed for it.
struct Invocation
{
    const Command* command; ///< from `AllCommands`
    CommandLine commandLine;
};

/// Reads the arguments of `wmain`. Empty when the user asked for help or the version; it is printed. Throws `ToolError`
/// with `ExitCode::BadUsage`.
std::optional<Invocation> ParseCommandLine(int count, wchar_t** arguments);
