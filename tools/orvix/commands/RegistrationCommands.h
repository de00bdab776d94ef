#pragma once

#include "CommandLine.h"
#include "ToolError.h"

/// `orvix register` and `orvix unregister`. Both throw `ToolError`, as `Registration` does.
namespace RegistrationCommands
{

ExitCode Register(const CommandLine& commandLine);
ExitCode Unregister(const CommandLine& commandLine);

} // namespace RegistrationCommands
