#pragma once

#include "Icons.h"

#include <string>

/// A file of the project, as the list shows it.
struct FileRow
{
    std::wstring path;       ///< full path
    std::wstring name;       ///< the path below the folder that is shown
    unsigned long flags = 0; ///< bits of `OrvixFileState` and `OrvixFilePermission`; 0 while they are not known
    bool excluded = false;   ///< a filter of the administrator keeps it out of source control
};

/// The state of a file for people.
struct FileState
{
    Icon icon;
    std::wstring words;
};

FileState StateOf(const FileRow& row);
