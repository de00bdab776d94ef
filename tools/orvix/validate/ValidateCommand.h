#pragma once

#include "CommandLine.h"
#include "ToolError.h"

#include <string>

/// `orvix validate`: checks a provider plug-in or an MSSCCI library against its contract and prints rule by rule what
/// became of it.
class ValidateCommand
{
public:
    /// The command line outlives this object.
    explicit ValidateCommand(const CommandLine& commandLine) : m_commandLine(commandLine) {}

    /// `ExitCode::Failed` when a rule is not kept. Throws `ToolError` with `ExitCode::NoProject` when there is no such
    /// file.
    ExitCode Run();

private:
    template <typename Report>
    ExitCode Run(const std::wstring& library, Report& report);

    const CommandLine& m_commandLine;
};
