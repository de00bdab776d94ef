#pragma once

#include "OrvixFileFlags.h"

/// The tool's own mark of an entry in a file list.
namespace FileMark
{

/// Bit of FlagsIn: the tool chose this file for the operation. The active list is built from it.
inline constexpr unsigned long Chosen = 0x2;
/// The operation may have changed this file.
inline constexpr unsigned long Concerned = 0x4;
static_assert(((Chosen | Concerned) & OrvixFileSelection::Selected) == 0, "RunFileListOperation sets the other bit");

} // namespace FileMark
