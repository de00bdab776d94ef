#pragma once

#include "DoctorReport.h"

#include <string>

/// Findings about an MSSCCI library that runs isolated.
namespace IsolationFindings
{

/// When the file of this path is the proxy of an isolated library: adds which library that is, and asks it, in its own
/// process, whether it loads. `searchPath` is the folder that a host has searched for what the library needs; may be
/// empty.
void Add(DoctorReport::Subject& subject, const std::wstring& path, const std::wstring& searchPath);

} // namespace IsolationFindings
