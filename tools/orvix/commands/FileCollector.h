#pragma once

#include "Output.h"

#include <string>
#include <unordered_set>
#include <vector>

/// Finds the files of a command: those that the user names, and those below the folders that the user names.
///
/// Below a folder, folders that are hidden or system, or whose name starts with a dot (.git), are skipped and
/// counted, links to folders are not followed, and what is named ".archive" (the sample provider's archive, or the
/// link to it) is left out. A file that is met twice is taken once.
class FileCollector
{
public:
    struct File
    {
        std::wstring path;
        bool named; ///< named by the user, not found in a folder
    };

    /// `output` is told about the progress and must outlive this object.
    explicit FileCollector(Output& output) : m_output(output) {}

    /// Takes what the user named, which need not exist. Throws `ToolError` when the text is no path.
    void Add(const std::wstring& named);

    const std::vector<File>& Files() const { return m_files; }

    /// How many folders were skipped.
    Listing::Count SkippedFolders() const;

    /// Says on the error output which folders could not be read; false when there is none.
    bool ReportUnreadableFolders() const;

private:
    void AddFile(std::wstring path, bool named);
    void AddFolder(const std::wstring& folder);

    Output& m_output;
    std::vector<File> m_files;
    unsigned int m_skippedFolders = 0;
    std::vector<std::wstring> m_unreadableFolders;
    std::unordered_set<std::wstring> m_seen;
};
