#pragma once

#include "ArchiveFailure.h"
#include "ArchiveRecord.h"

#include <string>
#include <vector>

/// The texts that both fronts of the archive show, and the default user.
namespace ArchiveReport
{

/// The lines of an output. When a text has several lines, those after the first are indented.
using Lines = std::vector<std::wstring>;

/// "file: reason", or only the reason when the failure concerns no file.
Lines Failure(const ArchiveFailure& failure);

/// All versions of a file, newest first.
Lines History(const ArchiveRecord& record);

/// The latest version of a file, and who has it checked out.
Lines Properties(const ArchiveRecord& record);

/// The user of the Windows session; empty when Windows gives none.
std::wstring WindowsUser();

} // namespace ArchiveReport
