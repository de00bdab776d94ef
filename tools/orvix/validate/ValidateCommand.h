#pragma once

#include "CommandLine.h"
#include "ToolError.h"

/// `orvix validate`: checks a provider plug-in or an MSSCCI library against its contract, and prints the result of each
/// rule. `ExitCode::Failed` when the library breaks a rule. Throws `ToolError` with `ExitCode::NotFound` when there is
/// no such file.
ExitCode RunValidate(const CommandLine& commandLine);
