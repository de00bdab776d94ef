#pragma once

#include "SharedMemory.h"

/// From now on an exception that nobody handles is written to `record` and ends the process with the exception's code,
/// without a window of the system. `record` must live as long as the process. Call it again after code that may have
/// replaced the handler.
void ReportCrashTo(Wire::CrashRecord& record);
