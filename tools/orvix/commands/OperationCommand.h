#pragma once

#include "FileCommand.h"
#include "OperationRule.h"
#include "OrvixFileListDialogParams.h"
#include "TemporaryAnswer.h"

#include <optional>
#include <vector>

/// A command that changes files through `IOrvixServices::RunFileListOperation`. The services object does not report
/// what the provider returned, so the result of a file is its state after the operation.
class OperationCommand final : public FileCommand
{
public:
    /// The arguments must outlive this object.
    OperationCommand(ProjectSession& project, const CommandLine& commandLine, Output& output, const OperationRule& rule)
        : FileCommand(project, commandLine, output, ResultColumn::Shown,
                      rule.bringsBack ? Missing::Listed : Missing::LeftOut),
          m_rule(rule)
    {
        if (commandLine.force)
        {
            m_rule.protects = 0;
        }
    }

private:
    void RunOnFiles() override;

    /// Registers the prompts of the command. What the user stored before stays.
    void RegisterPrompts();

    /// Stores the answers of the command line while this object lives.
    void StoreAnswers();

    void FillDialog(OrvixFileListDialogParams& params);

    /// Runs the operation with the listeners that the command line asks for. False when it was cancelled.
    bool RunOperation(OrvixFileListDialogParams& params);

    /// The results as far as the entries tell after the operation, one for each entry. Empty for a file that was only
    /// found in a folder and that the command does not concern.
    std::vector<std::optional<Result>> ResultsOfRun(bool ran);

    /// Whether the files stay checked out, by the dialog, the command line or a stored answer.
    bool IsKept(OrvixFileListDialogParams& params);

    /// Asks for the state of the files that the operation may have changed.
    void QueryConcerned();

    /// Whether the file has changes of the user that the command would discard.
    bool IsProtected(OrvixFileEntry& entry) const;

    /// Says which stored answer has cancelled the operation, and how to change it, if one has.
    void ExplainCancel();

    /// The result of a file that the operation was to change. `kept`: it was to stay checked out.
    Result ResultOf(OrvixFileEntry& entry, bool kept);

    void ReportResults(const std::vector<std::optional<Result>>& results, bool kept);

    OperationRule m_rule;
    std::optional<TemporaryAnswer> m_dialogAnswer;
    std::optional<TemporaryAnswer> m_keepAnswer;
    unsigned int m_notKept = 0; // files that the provider did not keep checked out
};
