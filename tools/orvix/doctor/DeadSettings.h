#pragma once

#include "DoctorReport.h"
#include "XmlOutline.h"

/// Findings about settings that the library reads and that have no effect, or another one than they seem to have.
namespace DeadSettings
{

/// `root`: of OrvixProviders.xml.
void AddProviders(DoctorReport::Subject& file, const XmlElement& root);

/// `root`: of OrvixPrompts.xml.
void AddPrompts(DoctorReport::Subject& file, const XmlElement& root);

} // namespace DeadSettings
