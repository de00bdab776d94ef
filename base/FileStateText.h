#pragma once

#include <string>
#include <vector>

/// What a file's flags say, for people and for programs. Dialogs and tools share these words.
namespace FileStateText
{

/// Stable words for programs, one for each fact: "not-controlled", "checked-in", "checked-out",
/// "checked-out-by-other", "modified", "out-of-date", "deleted", "missing" or "unknown". `flags` are bits of
/// `OrvixFileState`; `exists`: the file is on the disk.
std::vector<const char*> Keys(unsigned long flags, bool exists);

/// The same as English text, such as "checked out, modified". Starts in lower case.
std::wstring InWords(unsigned long flags, bool exists);

} // namespace FileStateText
