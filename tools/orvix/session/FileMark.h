#pragma once

#include "OrvixFileFlags.h"

/// The tool's own mark of an entry in a file list.
namespace FileMark
{

/// Bit of FlagsIn: the tool chose this file for the operation. The active list is built from it.
inline constexpr unsigned long Chosen = 0x2;
static_assert((Chosen & OrvixFileSelection::Selected) == 0, "RunFileListOperation sets the other bit");

} // namespace FileMark
