#pragma once

#include <string>
#include <vector>

/// Why a command of the archive failed.
enum class ArchiveError
{
    NotOpen,           ///< no project is open
    InvalidPath,       ///< not a file that a project may hold
    OwnFile,           ///< a file of the archive itself
    NoSuchFile,        ///< the file is not on disk
    NotControlled,     ///< the archive does not know the file
    AlreadyControlled, ///< the file was added before
    CheckedOutByOther, ///< another user has the file checked out
    NotCheckedOut,     ///< the user does not have the file checked out
    OutOfDate,         ///< the file on disk is missing or an older version
    Modified,          ///< changed on disk without a check-out; it would be overwritten
    Damaged,           ///< a file of the archive is not as it was written
    Access,            ///< Windows refused an operation on a file
    Busy,              ///< another program has the archive locked
};

/// One failure of a command.
struct ArchiveFailure
{
    ArchiveError error;

    /// One line for people; does not name the file.
    std::wstring reason;

    /// The file as the caller named it; empty when the failure concerns the whole command.
    std::wstring file;
};

/// The result of a command: empty when everything was done.
using ArchiveFailures = std::vector<ArchiveFailure>;
