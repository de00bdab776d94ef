#pragma once

#include "CommandLine.h"
#include "ToolError.h"

/// `orvix prompts`: shows and changes the stored answers, as `PromptFileEditor` does. Each throws `ToolError`.
namespace PromptCommands
{

ExitCode List(const CommandLine& commandLine);
ExitCode Set(const CommandLine& commandLine);
ExitCode Reset(const CommandLine& commandLine);
ExitCode Lock(const CommandLine& commandLine);
ExitCode Unlock(const CommandLine& commandLine);

} // namespace PromptCommands
