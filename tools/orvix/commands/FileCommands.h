#pragma once

#include "CommandLine.h"
#include "ToolError.h"

/// The commands on files. Each returns `ExitCode::Failed` as `FileCommand::Run` does, and throws `ToolError` when
/// nothing could be done.
namespace FileCommands
{

ExitCode ShowStatus(const CommandLine& commandLine);
ExitCode ShowHistory(const CommandLine& commandLine);
ExitCode Add(const CommandLine& commandLine);
ExitCode CheckIn(const CommandLine& commandLine);
ExitCode CheckOut(const CommandLine& commandLine);
ExitCode UndoCheckOut(const CommandLine& commandLine);
ExitCode GetLatest(const CommandLine& commandLine);

} // namespace FileCommands
