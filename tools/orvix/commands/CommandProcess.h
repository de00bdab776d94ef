#pragma once

#include "CommandLine.h"
#include "ToolError.h"

/// Runs a command that uses providers in a child process, so that it ends with a message and a true exit code whatever
/// a provider does.
namespace CommandProcess
{

/// Starts the child with the arguments of this process and waits for it. Names the windows that an unattended child
/// shows, and ends the child when it gives no sign of life for the time of the command line. Throws `ToolError` when no
/// child can be started, and when it ends without a result.
ExitCode RunInChild(const CommandLine& commandLine);

/// Sends the exit code to the parent. Called in the child, at its end.
void SendResult(ExitCode code);

} // namespace CommandProcess
