#pragma once

#include "DoctorReport.h"
#include "FileDiagnostics.h"
#include "XmlOutline.h"

/// Findings about OrvixProviders.xml and OrvixPrompts.xml. `file` has the path of the file as its location.
namespace XmlFileFindings
{

/// Adds why the library reads nothing of the file, where that is so. `root`: the name that the root element must have.
void AddContent(DoctorReport::Subject& file, const FileDiagnostics& diagnostics, const wchar_t* root);

/// Why the library reads nothing of a file that is there; empty when it reads it. The finding of `AddContent` that is a
/// problem.
std::wstring WhyUnread(const DoctorReport::Subject& file);

/// Adds what the library ignores in the file. `item`: what an element below the root is called. `root`: the elements of
/// the file; null when they are not known.
void AddDiagnostics(DoctorReport::Subject& file, const FileDiagnostics& diagnostics, const wchar_t* item,
                    const XmlElement* root);

} // namespace XmlFileFindings
