#pragma once

#include "ArchiveFailure.h"
#include "ArchiveFolder.h"
#include "ArchiveRecord.h"

#include <chrono>
#include <optional>
#include <span>
#include <string>
#include <vector>

/// How a file stands to the archive, for the user of the store.
struct ArchiveStatus
{
    bool missing = false; ///< not on disk
    bool ownFile = false; ///< belongs to the archive itself, so it cannot be added
    bool controlled = false;
    bool checkedOut = false;        ///< by this user
    bool checkedOutByOther = false; ///< by another user
    bool outOfDate = false;         ///< missing on disk, or not checked out and an older version
    bool modified = false;          ///< on disk and not the contents of any version (checked out: of the latest)
};

/// An archive of file versions, as one user works with it. It knows nothing of the programs that use it.
///
/// The lock model: a controlled file is read-only on disk; the one user who has it checked out may change it. Every
/// version that was ever stored stays in the archive (docs/archive-format.md).
///
/// Commands take many files, given by full paths. Each file stands for itself: the command goes on after one that
/// fails and reports it, and a file given twice is worked on once. A command takes the archive's lock once, whatever
/// the number of files; programs of several users may work on one archive at the same time. Nothing is held between
/// two commands, so each sees what others did before it.
///
/// Not thread-safe. Only std::bad_alloc and std::length_error (a text of 2^31 characters) leave an operation.
class ArchiveStore
{
public:
    static constexpr std::chrono::milliseconds DefaultLockWait{10'000};

    /// `lockWait`: how long a command waits for another program to finish with the archive.
    explicit ArchiveStore(std::chrono::milliseconds lockWait = DefaultLockWait) : m_lockWait(lockWait) {}

    /// Opens the project in an existing folder for a user, after closing the open one. The archive is the folder
    /// ".archive" in it, made when it is missing, or the folder that a link file of this name gives. Users' names are
    /// compared without regard to letter case.
    ArchiveFailures Open(const std::wstring& projectFolder, const std::wstring& user);

    /// Tells whether an existing folder is a project: has an archive or a link to one.
    static ArchiveFailures Find(const std::wstring& projectFolder, bool& isProject);

    void Close() { m_project.reset(); }
    bool IsOpen() const { return m_project.has_value(); }

    /// The open project's archive folder, for people to read; empty when no project is open.
    std::wstring ArchivePath() const;

    /// Puts files under control and stores their first version.
    ArchiveFailures Add(std::span<const std::wstring> files, const std::wstring& comment, bool keepCheckedOut);

    /// Takes files for this user and makes them writable. A file that is changed on disk keeps its changes. One that
    /// is missing or an older version is refused, unless `getLatest` has the latest brought first. A file that the
    /// user holds already is only made writable.
    ArchiveFailures CheckOut(std::span<const std::wstring> files, const std::wstring& comment, bool getLatest);

    /// Stores new versions of files that the user holds and gives the files back.
    ArchiveFailures CheckIn(std::span<const std::wstring> files, const std::wstring& comment, bool keepCheckedOut);

    /// Gives files back and throws the changes on disk away.
    ArchiveFailures UndoCheckOut(std::span<const std::wstring> files);

    /// Brings the latest version and makes the files read-only. What the user holds is left alone unless it is
    /// missing; what is changed on disk without a check-out is never overwritten, but refused. A writable file that
    /// another user holds is left alone or refused: it may be the other's working copy.
    ArchiveFailures GetLatest(std::span<const std::wstring> files);

    /// Gives the status of every file, in the order of the files. A path that the project cannot hold is not
    /// controlled. After a failure `statuses` is empty.
    ArchiveFailures Status(std::span<const std::wstring> files, std::vector<ArchiveStatus>& statuses) const;

    /// Gives the records of the files, in order, without those that are reported as failures.
    ArchiveFailures History(std::span<const std::wstring> files, std::vector<ArchiveRecord>& records) const;

    /// Gives the full paths of the files under control in a folder of the project, on disk or not, each beginning with
    /// the folder as it is given, in the order of their names. Reads every record of the archive.
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
