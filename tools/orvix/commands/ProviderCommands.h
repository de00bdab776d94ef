#pragma once

#include "CommandLine.h"
#include "ToolError.h"

/// The commands that the provider runs by itself, in an open project. Each throws `ToolError` with `ExitCode::Failed`
/// when the provider fails or does not offer the operation.
namespace ProviderCommands
{

ExitCode Open(const CommandLine& commandLine);
ExitCode ShowOptions(const CommandLine& commandLine);
ExitCode RunClient(const CommandLine& commandLine);
ExitCode ShowProperties(const CommandLine& commandLine);

} // namespace ProviderCommands
