#pragma once

#include "CommandLine.h"
#include "DoctorReport.h"
#include "Output.h"

/// Examines everything that could be a provider, and both XML files.
namespace Doctor
{

/// Says for each candidate whether the library lists it and why, and what in the files has no effect. It judges with
/// the library's own code: plug-ins are loaded and asked for their version and name. MSSCCI libraries are loaded as on
/// first use, and none of their functions is called. Each is loaded in a child process, which gets the time of
/// --timeout. `output` shows the progress.
///
/// Throws `ToolError` with `ExitCode::NotFound` when no configuration folder is named and there is no default, and
/// `_com_error` when memory is exhausted.
DoctorReport Examine(const CommandLine& commandLine, Output& output);

} // namespace Doctor
