#pragma once

#include "DoctorReport.h"

#include <string>

/// Findings about an MSSCCI library that runs isolated.
namespace IsolationFindings
{

/// When the file of this path is the proxy of an isolated library: adds which library that is, and asks it, in its own
/// process, whether it loads.
void Add(DoctorReport::Subject& subject, const std::wstring& path);

} // namespace IsolationFindings
