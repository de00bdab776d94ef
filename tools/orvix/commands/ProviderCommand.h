#pragma once

#include "ProjectSession.h"

#include <string>

/// One command that the provider carries out by itself: open, options, client or properties.
class ProviderCommand
{
public:
    /// The arguments must outlive this object.
    ProviderCommand(ProjectSession& project, const CommandLine& commandLine)
        : m_project(project), m_commandLine(commandLine)
    {
    }

    /// Whether this is such a command.
    static bool IsOne(const std::wstring& command);

    /// Carries the command out. Throws `ToolError` with `ExitCode::Failed` when the provider fails or does not offer
    /// it.
    void Run();

private:
    int ShowOpened();
    int ShowProperties();

    ProjectSession& m_project;
    const CommandLine& m_commandLine;
};
