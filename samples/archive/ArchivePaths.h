#pragma once

#include "ArchiveFiles.h"

#include <optional>
#include <string>
#include <string_view>
#include <unordered_map>

/// A file of the project, as `ArchivePaths::Resolve` finds it.
struct ArchiveTarget
{
    std::wstring path;     ///< full path with the prefix "\\?\"
    std::wstring relative; ///< path relative to the project folder, with "/" between the names
    std::string key;       ///< the name of its record, the same for all paths that mean one file to Windows
    std::optional<ArchiveFiles::Entry> entry; ///< nothing when the file is not on disk
};

/// Finds the file of a project that a path means.
///
/// Paths that callers give are full: "C:\x" or "\\server\share\x", each with or without the prefix "\\?\", with "\" or
/// "/", of any length that Windows allows. Refused are "..", names that are no file names or that Windows would change
/// (with a dot or a space at the end), paths out of the project folder, through links as well, and the archive's own
/// files.
class ArchivePaths
{
public:
    /// Name of the archive folder, or of the link to one, in a project folder.
    static constexpr std::wstring_view ArchiveName = L".archive";

    /// Name under which a version is written to a folder of the project before it replaces the old file.
    static constexpr std::wstring_view TemporaryName = L".archive.tmp";

    /// Both folders are results of `FindFolder`.
    ArchivePaths(const std::wstring& projectFolder, const std::wstring& archiveFolder);

    /// Throws `ArchiveError::OwnFile` for a file or folder of the archive itself, and `ArchiveError::InvalidPath` for
    /// any other path that a project cannot hold, such as that of a folder.
    ArchiveTarget Resolve(const std::wstring& path);

    /// The path of a folder relative to the project, with "/" after every name; empty for the project folder itself.
    /// The folder need not exist. Throws as `Resolve` does.
    std::wstring RelativeFolder(const std::wstring& path);

    /// The name of the record of a file; `relative` is `ArchiveTarget::relative`.
    static std::string KeyOf(std::wstring_view relative);

    /// Makes the folders of a file that do not exist.
    void MakeFolders(const ArchiveTarget& target) const;

    /// The full path of an existing folder, with the prefix "\\?\", links and short names resolved, and no separator
    /// at the end. Throws `ArchiveError::InvalidPath` or `ArchiveError::Access`.
    static std::wstring FindFolder(const std::wstring& path);

    /// The path as people write it, without the prefix "\\?\".
    static std::wstring ShortForm(const std::wstring& path);

    /// True when the path contains a name that is reserved for the archive. The separator is "\".
    static bool IsReserved(std::wstring_view path);

private:
    const std::wstring& ResolveFolder(const std::wstring& path);

    std::wstring m_project;
    std::wstring m_foldedProject;
    std::wstring m_foldedArchive;
    std::unordered_map<std::wstring, std::wstring> m_folders; ///< folders as given, and their resolved paths
};
