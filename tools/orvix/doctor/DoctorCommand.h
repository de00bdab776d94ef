#pragma once

#include "CommandLine.h"
#include "ToolError.h"

/// `orvix doctor`: prints the report of `Doctor::Examine`, and throws as it does. `ExitCode::Failed` when the report
/// has a problem.
ExitCode RunDoctor(const CommandLine& commandLine);
