#pragma once

#include "FileCommand.h"

/// `orvix status`: shows the state of files. A named file that is neither controlled nor on the disk is refused.
class StatusCommand final : public FileCommand
{
public:
    /// The arguments must outlive this object.
    StatusCommand(ProjectSession& project, const CommandLine& commandLine, Output& output)
        : FileCommand(project, commandLine, output, ResultColumn::Hidden, Missing::Listed)
    {
    }

private:
    void RunOnFiles() override;
};
