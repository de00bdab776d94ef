#pragma once

#include "DoctorReport.h"
#include "UniqueHandle.h"

#include <string>

/// Findings about a file that is loaded as a library.
namespace LoadFindings
{

/// Adds what the headers of the file say against loading it. The file is only read.
void AddHeaders(DoctorReport::Subject& subject, const std::wstring& path);

/// Adds why the system did not load the library in this context: its error, and which other libraries are missing.
void AddLoadError(DoctorReport::Subject& subject, const std::wstring& path, const UniqueActivationContext& context,
                  unsigned long error);

/// Adds which libraries that the library of this path needs are found in the current folder alone.
void AddCurrentFolder(DoctorReport::Subject& subject, const std::wstring& path, const UniqueActivationContext& context);

} // namespace LoadFindings
