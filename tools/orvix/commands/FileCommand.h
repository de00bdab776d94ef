#pragma once

#include "FileCollector.h"
#include "OperationRule.h"
#include "OrvixFileEntry.h"
#include "OrvixFileList.h"
#include "Output.h"
#include "ProjectSession.h"
#include "ToolError.h"

#include <array>
#include <optional>

/// One command on files, from the names on the command line to the table of what became of them.
class FileCommand
{
public:
    /// Collects the files and leaves out those that the provider's filters exclude. The arguments must outlive
    /// this object.
    FileCommand(ProjectSession& project, OrvixClientInfo& client, const CommandLine& commandLine, Output& output);

    /// Carries the command out and shows the result. `ExitCode::Failed` when a folder could not be read, or
    /// a file was refused, cancelled or did not reach the expected state.
    ExitCode Run();

private:
    enum Outcome : std::size_t
    {
        Done,
        Unticked,
        Refused,
        Cancelled,
        Failed,
        NumOutcomes,
    };

    void ShowStatus();
    void ShowHistory();
    void Change(const OperationRule& rule);

    /// What became of each entry as far as the list tells after the operation; nothing for a file that was
    /// only met in a folder and that the command does not mean.
    std::vector<std::optional<Outcome>> OutcomesOfRun(const OperationRule& rule, bool ran);

    /// Makes every entry active and brings its state. Throws `ToolError` when the provider fails.
    void QueryStatus();

    bool IsNamed(OrvixFileEntry& entry) const;
    void Report(Outcome outcome, OrvixFileEntry& entry);
    void Report(Outcome outcome, const std::wstring& state, const std::wstring& path);
    std::vector<Listing::Count> Summary() const;

    ProjectSession& m_project;
    OrvixClientInfo& m_client;
    const CommandLine& m_commandLine;
    Output& m_output;
    FileCollector m_collector;
    OrvixFileList m_list;
    Listing m_listing;
    std::array<unsigned int, NumOutcomes> m_counts{};
    unsigned int m_excluded = 0;
    unsigned int m_otherState = 0;
};
