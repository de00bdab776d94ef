#include "ProviderCommands.h"

#include "CommandOutput.h"
#include "FileMark.h"
#include "FilePath.h"
#include "OrvixFileList.h"
#include "OrvixProviderResult.h"
#include "ProjectSession.h"

#include <iostream>
#include <new>

namespace
{

/// Runs a command in an open project. `operation` returns what the provider returned.
template <typename Operation>
ExitCode RunInProject(const CommandLine& commandLine, Operation operation)
{
    return WithOutput(commandLine, [&](CommandOutput& output) {
        HostSession host(commandLine, output.Results());
        ProjectSession project(host, commandLine);
        const int result = operation(project);
        if (result == OrvixProviderResult::NotOffered)
        {
            throw ToolError(ExitCode::Failed,
                            commandLine.command + L" is not offered by the provider " + project.ProviderName());
        }
        if (result < OrvixProviderResult::Success)
        {
            // The bridge to an MSSCCI library answers "not offered" and "failed" alike.
            const bool mayHaveNone = commandLine.command == L"options" && host.IsInstalled(project.ProviderIndex());
            throw ToolError(ExitCode::Failed, (mayHaveNone ? L"it has no options, or " : L"") + commandLine.command +
                                                  L" failed in the provider " + project.ProviderName());
        }
        return ExitCode::Success;
    });
}

int PrintOpenProject(ProjectSession& project)
{
    if (!project.Provider().IsProjectOpen())
    {
        return OrvixProviderResult::Failure;
    }
    std::cout << "opened " << Printable(project.Folder()) << " with " << Printable(project.ProviderName()) << '\n';
    return OrvixProviderResult::Success;
}

int ShowPropertiesOf(ProjectSession& project, const std::wstring& path)
{
    if (IsFolder(path))
    {
        throw ToolError(ExitCode::Failed, L"a folder has no properties: " + path);
    }
    std::wstring filter;
    if (project.IsExcluded(path, filter))
    {
        throw ToolError(ExitCode::Failed, L"excluded by filter " + filter + L": " + path);
    }
    OrvixFileList list;
    if (list.CreateEntry(path.c_str(), nullptr, FileMark::Chosen, 0) == nullptr)
    {
        throw std::bad_alloc();
    }
    list.BuildActiveList(FileMark::Chosen, false);
    return project.Provider().ShowProperties(&list);
}

} // namespace

ExitCode ProviderCommands::Open(const CommandLine& commandLine)
{
    return RunInProject(commandLine, PrintOpenProject);
}

ExitCode ProviderCommands::ShowOptions(const CommandLine& commandLine)
{
    return RunInProject(commandLine, [](ProjectSession& project) { return project.Provider().ShowOptions(); });
}

ExitCode ProviderCommands::RunClient(const CommandLine& commandLine)
{
    return RunInProject(commandLine, [](ProjectSession& project) { return project.Provider().RunProviderClient(); });
}

ExitCode ProviderCommands::ShowProperties(const CommandLine& commandLine)
{
    return RunInProject(commandLine, [&](ProjectSession& project) {
        return ShowPropertiesOf(project, FullPath(commandLine.paths.front()));
    });
}
