#pragma once

#include "ArchiveFiles.h"
#include "ArchivePaths.h"
#include "ArchiveRecord.h"

#include <chrono>
#include <optional>
#include <string>
#include <vector>

/// The archive on disk: records and contents, and how they are written so that nothing is ever lost. The format is
/// described in docs/archive-format.md.
///
/// Reading needs no lock, since a file of the archive is always whole. `Save` and `Store` are for the holder of the
/// `ArchiveLock` on `LockFile()` only.
///
/// Throws `ArchiveFailure`.
class ArchiveFolder
{
public:
    /// True when a project folder has an archive or a link to one. The folder as `ArchivePaths::FindFolder` gives it.
    static bool Exists(const std::wstring& projectFolder);

    /// Opens the archive of a project folder and makes it when there is none. The folder as
    /// `ArchivePaths::FindFolder` gives it.
    ArchiveFolder(const std::wstring& projectFolder, std::chrono::milliseconds lockWait);

    /// The folder, as `ArchivePaths::FindFolder` gives it.
    const std::wstring& Path() const { return m_path; }

    std::wstring LockFile() const { return m_path + L"\\lock"; }

    /// The record of a file; nothing when it is not controlled.
    std::optional<ArchiveRecord> Load(const ArchiveTarget& target) const;

    /// The paths of all files under control as their records have them, in no order. Records that cannot be read are
    /// added to `failures`, each under its own path.
    std::vector<std::wstring> List(ArchiveFailures& failures) const;

    /// Writes the record of a file in place of the old one.
    void Save(const ArchiveTarget& target, const ArchiveRecord& record) const;

    /// Keeps the contents of an open file for ever.
    ArchiveFiles::Contents Store(HANDLE source) const;

    /// Writes the contents of a version to a new file. Throws `ArchiveError::Damaged` when they are not what was
    /// stored; the file is then worthless.
    void Fetch(const ArchiveVersion& version, const std::wstring& copy) const;

private:
    void Prepare(std::chrono::milliseconds lockWait) const;
    bool HasFormat() const;
    std::optional<ArchiveRecord> Load(const std::string& key) const;
    std::wstring TemporaryFile() const { return m_path + L"\\new.tmp"; }
    std::wstring FormatFile() const { return m_path + L"\\archive.txt"; }

    /// The place of a file that is named by 64 hexadecimal digits.
    std::wstring Place(const wchar_t* kind, const std::string& name) const;

    std::wstring m_path;
};
