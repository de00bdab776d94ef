#pragma once

#include "ArchiveFailure.h"
#include "ArchiveRecord.h"

#include <string>
#include <vector>

/// What the front ends of the archive tell people, and whom they take them for.
namespace ArchiveReport
{

/// Text for an output that takes one line at a time: without line ends, a text's lines after its first indented.
using Lines = std::vector<std::wstring>;

/// "file: reason", or the reason alone when no file failed.
Lines Failure(const ArchiveFailure& failure);

/// All versions of a file, newest first.
Lines History(const ArchiveRecord& record);

/// The latest version of a file, and who holds the file.
Lines Properties(const ArchiveRecord& record);

/// The user of the Windows session; empty when Windows does not tell.
std::wstring WindowsUser();

} // namespace ArchiveReport
