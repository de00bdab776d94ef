#pragma once

#include "ArchiveFiles.h"
#include "ArchivePaths.h"
#include "ArchiveRecord.h"

#include <chrono>
#include <optional>
#include <string>
#include <vector>

/// The archive on the disk: records and contents, written so that nothing is ever lost. docs/archive-format.md
/// describes the format.
///
/// Reading needs no lock, since a file of the archive is always whole. Whoever calls `Save` or `Store` has an
/// `ArchiveLock` on `LockFile()`.
///
/// Throws `ArchiveFailure`.
class ArchiveFolder
{
public:
    /// True when a project folder has an archive or a link to one. The folder is a result of
    /// `ArchivePaths::FindFolder`.
    static bool Exists(const std::wstring& projectFolder);

    /// Opens the archive of a project folder, or makes one, for which it waits `lockWait` for the lock. The folder is
    /// a result of `ArchivePaths::FindFolder`.
    ArchiveFolder(const std::wstring& projectFolder, std::chrono::milliseconds lockWait);

    /// The full path of the archive folder, as `ArchivePaths::FindFolder` returns it.
    const std::wstring& Path() const { return m_path; }

    std::wstring LockFile() const { return m_path + L"\\lock"; }

    /// The record of a file; nothing when it is not controlled.
    std::optional<ArchiveRecord> Load(const ArchiveTarget& target) const;

    /// The paths of all controlled files, relative to the project, in no order. A record that cannot be read is added
    /// to `failures` under the path of the record.
    std::vector<std::wstring> List(ArchiveFailures& failures) const;

    /// Writes the record of a file; an older one is replaced.
    void Save(const ArchiveTarget& target, const ArchiveRecord& record) const;

    /// Stores the contents of an open file for good. Equal contents are stored once.
    ArchiveFiles::Contents Store(HANDLE source) const;

    /// Writes the contents of a version to the file `copy`. Throws `ArchiveError::Damaged` when they are not what was
    /// stored; the file is then not to be used.
    void Fetch(const ArchiveVersion& version, const std::wstring& copy) const;

private:
    void Prepare(std::chrono::milliseconds lockWait) const;
    bool HasFormat() const;
    std::optional<ArchiveRecord> Load(const std::string& key) const;
    std::wstring TemporaryFile() const { return m_path + L"\\new.tmp"; }
    std::wstring FormatFile() const { return m_path + L"\\archive.txt"; }

    /// The path of a file of the archive whose name is 64 hexadecimal digits.
    std::wstring PathOf(const wchar_t* kind, const std::string& name) const;

    std::wstring m_path;
};
