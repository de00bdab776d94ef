#pragma once

#include "ArchiveFailure.h"
#include "ArchiveFolder.h"
#include "ArchiveRecord.h"

#include <chrono>
#include <optional>
#include <span>
#include <string>
#include <vector>

/// The status of a file, for the user of the store.
struct ArchiveStatus
{
    bool missing = false; ///< not on disk
    bool ownFile = false; ///< belongs to the archive itself, so it cannot be added
    bool controlled = false;
    bool checkedOut = false;        ///< by this user
    bool checkedOutByOther = false; ///< by another user
    bool outOfDate = false;         ///< missing on disk, or not checked out and an older version
    bool modified = false;          ///< on disk, with contents of no version (if checked out: not of the latest)
};

/// An archive of file versions, for one user. It does not depend on the programs that use it.
///
/// The lock model: a controlled file is read-only on disk, and only the user who has it checked out may change it.
/// Every version stays in the archive for good (docs/archive-format.md).
///
/// Commands take the full paths of any number of files. A command goes on after a file that fails and reports it. A
/// file that is given twice is handled once. A command locks the archive once, whatever the number of files, so
/// programs of several users may work on one archive at the same time. No state is cached between two commands, so
/// each sees what others did before.
///
/// Not thread-safe. An operation throws only std::bad_alloc, and std::length_error for a text of 2^31 characters.
class ArchiveStore
{
public:
    static constexpr std::chrono::milliseconds DefaultLockWait{10'000};

    /// `lockWait`: how long a command waits for another program to finish with the archive.
    explicit ArchiveStore(std::chrono::milliseconds lockWait = DefaultLockWait) : m_lockWait(lockWait) {}

    /// Opens the project in an existing folder for a user; an open project is closed first. The archive is the folder
    /// ".archive" in it, which is made when it is missing, or the folder that a link file of this name contains. Names
    /// of users are compared without regard to letter case.
    ArchiveFailures Open(const std::wstring& projectFolder, const std::wstring& user);

    /// Sets `isProject` to whether an existing folder has an archive or a link to one.
    static ArchiveFailures Find(const std::wstring& projectFolder, bool& isProject);

    void Close() { m_project.reset(); }
    bool IsOpen() const { return m_project.has_value(); }

    /// The archive folder of the open project, in the form to show; empty when no project is open.
    std::wstring ArchivePath() const;

    /// Puts files under control and stores their first version.
    ArchiveFailures Add(std::span<const std::wstring> files, const std::wstring& comment, bool keepCheckedOut);

    /// Checks files out for this user and makes them writable. Changes on disk are kept. A file that is missing or an
    /// older version is refused, unless `getLatest` gets the latest version first. A file that the user has checked
    /// out already is only made writable.
    ArchiveFailures CheckOut(std::span<const std::wstring> files, const std::wstring& comment, bool getLatest);

    /// Stores new versions of files that the user has checked out, and ends the check-out unless `keepCheckedOut` is
    /// set.
    ArchiveFailures CheckIn(std::span<const std::wstring> files, const std::wstring& comment, bool keepCheckedOut);

    /// Ends the check-out of files and discards the changes on disk.
    ArchiveFailures UndoCheckOut(std::span<const std::wstring> files);

    /// Writes the latest version of files to the disk and makes them read-only. A file that the user has checked out
    /// stays as it is, unless it is missing. A file that was changed without a check-out is refused, never
    /// overwritten. A writable file that another user has checked out stays as it is or is refused: users may share a
    /// folder, and it may be that user's working copy.
    ArchiveFailures GetLatest(std::span<const std::wstring> files);

    /// Sets `statuses` to the status of each file, in the same order. A path that the project cannot hold is not
    /// controlled. After a failure `statuses` is empty.
    ArchiveFailures Status(std::span<const std::wstring> files, std::vector<ArchiveStatus>& statuses) const;

    /// Sets `records` to the records of the files, in the same order, without the files that fail.
    ArchiveFailures History(std::span<const std::wstring> files, std::vector<ArchiveRecord>& records) const;

    /// Sets `files` to the full paths of the controlled files in a folder of the project, on disk or not, sorted by
    /// name. Each starts with `folder` as the caller gives it. Reads every record of the archive.
    ArchiveFailures List(const std::wstring& folder, bool withSubfolders, std::vector<std::wstring>& files) const;

private:
    struct Project
    {
        std::wstring folder;
        ArchiveFolder archive;
        std::wstring user;
    };

    class Session;

    template <typename Work>
    ArchiveFailures ForEachFile(std::span<const std::wstring> files, bool withLock, Work work) const;

    std::chrono::milliseconds m_lockWait;
    std::optional<Project> m_project;
};
