#pragma once

#include "FileCollector.h"
#include "FileMark.h"
#include "OrvixFileEntry.h"
#include "OrvixFileList.h"
#include "ProjectSession.h"
#include "ToolError.h"

#include <array>

/// A command on files: collects them, runs and shows a table of the results. A derived class says what runs.
class FileCommand
{
public:
    FileCommand(const FileCommand&) = delete;
    FileCommand& operator=(const FileCommand&) = delete;
    virtual ~FileCommand() = default;

    /// Runs the command and shows the result. `ExitCode::Failed` when a folder could not be read, when the provider
    /// failed to name its files, and when a file was refused or cancelled or did not reach the expected state. Throws
    /// `ToolError`.
    ExitCode Run();

protected:
    /// What happened to a file.
    enum Result : std::size_t
    {
        Done,
        Cleared, ///< by the user in the dialog
        Refused,
        Cancelled,
        Failed,
        NumResults,
    };

    enum class ResultColumn
    {
        Shown,
        Hidden
    };

    /// Whether a named folder also means the files that the provider knows there and the disk lacks.
    enum class Missing
    {
        Listed,
        LeftOut
    };

    /// Collects the files, without those that the provider's filters exclude. The arguments must outlive this object.
    FileCommand(ProjectSession& project, const CommandLine& commandLine, Output& output, ResultColumn resultColumn,
                Missing missing);

    /// Runs on the entries of the list, of which there is at least one, and reports each result.
    virtual void RunOnFiles() = 0;

    /// Makes the entries with a mark active and asks the provider for their state. Throws `ToolError` when the provider
    /// fails. `mark`: of `FileMark`.
    void QueryStatus(unsigned long mark = FileMark::Chosen);

    /// Throws `ToolError` when the provider failed to tell the state of the files.
    void RequireStatus();

    bool IsNamed(OrvixFileEntry& entry) const;

    /// Adds a row to the table.
    void Report(Result result, OrvixFileEntry& entry);

    /// Counts files without a row.
    void Count(Result result, unsigned int number) { m_counts[result] += number; }

    /// Counts a file that was found in a folder and that the command does not concern.
    void CountOtherState() { ++m_otherState; }

    /// Counts a file that was found in a folder and has changes that the command would discard.
    void CountProtected() { ++m_protected; }

    ProjectSession& Project() { return m_project; }
    const CommandLine& Arguments() const { return m_commandLine; }
    Output& Results() { return m_output; }
    OrvixFileList& List() { return m_list; }

private:
    void AddMissingFiles(const std::wstring& folder);
    void AddFile(std::size_t index);
    void Report(Result result, const Listing::State& state, const std::wstring& path);
    std::vector<Listing::Count> Summary() const;

    /// The number of skipped folders, without those that belong to the provider itself: it lets nobody add a file
    /// there.
    std::size_t NumForeignSkippedFolders() const;

    ProjectSession& m_project;
    const CommandLine& m_commandLine;
    Output& m_output;
    FileCollector m_collector;
    OrvixFileList m_list;
    Listing m_listing;
    bool m_showsResults;
    bool m_namesAllFiles = true; // the provider did, when it was asked for its files
    std::array<unsigned int, NumResults> m_counts{};
    unsigned int m_excluded = 0;
    unsigned int m_otherState = 0;
    unsigned int m_protected = 0;
};
