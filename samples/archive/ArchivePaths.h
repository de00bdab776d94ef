#pragma once

#include "ArchiveFiles.h"

#include <optional>
#include <string>
#include <string_view>
#include <unordered_map>

/// A file of the project, found from the path that the caller gave.
struct ArchiveTarget
{
    std::wstring path;     ///< full, with the prefix "\\?\"
    std::wstring relative; ///< to the project folder, with "/" between the names
    std::string key;       ///< the name of its record: equal for paths that Windows takes for the same
    std::optional<ArchiveFiles::Facts> facts; ///< nothing when the file is not on disk
};

/// Decides which file of a project a path means, and refuses paths that mean none.
///
/// Paths from outside are full ones ("C:\x", "\\server\share\x", either with the prefix "\\?\" too), of any
/// length that Windows knows, with "\" or "/". Refused are "..", what is no file name, names that Windows would
/// change (those that end in a dot or a space), what leads out of the project folder, also through links, and
/// everything in a folder of the reserved name.
class ArchivePaths
{
public:
    /// Name of the archive's folder (or link) in a project folder.
    static constexpr std::wstring_view ArchiveName = L".archive";

    /// Name under which a file is brought into a folder of the project before it replaces the old one.
    static constexpr std::wstring_view TemporaryName = L".archive.tmp";

    /// Both folders as `FindFolder` gives them.
    ArchivePaths(const std::wstring& projectFolder, const std::wstring& archiveFolder);

    /// Throws `ArchiveError::OwnFile` for a file or folder of the archive itself, and `ArchiveError::InvalidPath` for
    /// any other path that a project cannot hold, such as that of a folder.
    ArchiveTarget Resolve(const std::wstring& path);

    /// Where a folder, on disk or not, lies in the project: relative to it, with "/" behind every name; empty for the
    /// project folder itself. Throws `ArchiveError::InvalidPath` for a folder elsewhere.
    std::wstring RelativeFolder(const std::wstring& path);

    /// The name of the record of a file, from `ArchiveTarget::relative`.
    static std::string KeyOf(std::wstring_view relative);

    /// Makes the folders above a file of the project that are missing.
    void MakeFolders(const ArchiveTarget& target) const;

    /// The place of an existing folder with every link and short name on the way resolved, without a
    /// separator at its end. Throws `ArchiveError::InvalidPath` or `ArchiveError::Access`.
    static std::wstring FindFolder(const std::wstring& path);

    /// A path with the prefix "\\?\" as people write it.
    static std::wstring ShortForm(const std::wstring& path);

    /// True when a name of the path is one of the reserved ones. Takes paths with "\".
    static bool IsReserved(std::wstring_view path);

private:
    const std::wstring& ResolveFolder(const std::wstring& path);

    std::wstring m_project;
    std::wstring m_foldedProject;
    std::wstring m_foldedArchive;
    std::unordered_map<std::wstring, std::wstring> m_folders; ///< folders as given, and their resolved places
};
