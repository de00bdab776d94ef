#pragma once

#include "Output.h"

#include <string>
#include <unordered_set>
#include <vector>

/// Finds the files of a command: those that the user names, and those in and below the folders that the user names.
///
/// Below a folder, folders that are hidden or system, or whose name starts with a dot (.git), are skipped and counted,
/// as are links to folders. A file that is found twice is taken once.
class FileCollector
{
public:
    struct File
    {
        std::wstring path;
        bool named; ///< named by the user, not found in a folder
    };

    /// `output` shows the progress and must outlive this object.
    explicit FileCollector(Output& output) : m_output(output) {}

    /// Adds a file or the files of a folder, by its full path. It need not exist. Letter case becomes that of the disk.
    void Add(const std::wstring& named);

    /// Adds a file that is missing on the disk, unless it is in a folder that is skipped. `folder` is the named folder
    /// that the full path begins with.
    void AddMissing(const std::wstring& folder, const std::wstring& path);

    const std::vector<File>& Files() const { return m_files; }

    /// The full paths of the folders that the user names.
    const std::vector<std::wstring>& NamedFolders() const { return m_namedFolders; }

    /// The paths of the skipped folders.
    const std::vector<std::wstring>& SkippedFolders() const { return m_skippedFolders; }

    /// A number of skipped folders, for a summary.
    static Listing::Count CountOfSkipped(std::size_t number);

    /// Prints on the error output which folders could not be read. False when there are none.
    bool ReportUnreadableFolders() const;

private:
    /// What is in a folder, as names.
    struct Content
    {
        std::vector<std::wstring> files;
        std::vector<std::wstring> folders;
    };

    void AddFile(std::wstring path, bool named);
    void AddFolder(const std::wstring& folder);

    /// `prefix` is the folder's path with a separator at its end.
    Content Read(const std::wstring& folder, const std::wstring& prefix);

    Output& m_output;
    std::vector<File> m_files;
    std::vector<std::wstring> m_namedFolders;
    std::vector<std::wstring> m_skippedFolders;
    std::vector<std::wstring> m_unreadableFolders;
    std::unordered_set<std::wstring> m_keys; // of the files found so far, see `PathKey`
};
