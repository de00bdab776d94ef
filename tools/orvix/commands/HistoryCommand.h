#pragma once

#include "FileCommand.h"

/// `orvix history`: has the provider show the versions of files. The table holds only the refused files.
class HistoryCommand final : public FileCommand
{
public:
    /// The arguments must outlive this object.
    HistoryCommand(ProjectSession& project, const CommandLine& commandLine, Output& output)
        : FileCommand(project, commandLine, output, ResultColumn::Shown, Missing::LeftOut)
    {
    }

private:
    void RunOnFiles() override;
};
