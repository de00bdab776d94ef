#pragma once

#include "CommandLine.h"
#include "ToolError.h"

/// `orvix providers`: lists the providers with their indexes. Throws `ToolError` when there is none.
ExitCode ListProviders(const CommandLine& commandLine);
