#include "FileCommands.h"

#include "CommandOutput.h"
#include "HistoryCommand.h"
#include "OperationCommand.h"
#include "StatusCommand.h"

namespace
{

/// Runs a command of this class in an open project. `rule` is that of an operation.
template <typename CommandClass, typename... Rule>
ExitCode RunInProject(const CommandLine& commandLine, const Rule&... rule)
{
    return WithOutput(commandLine, [&](CommandOutput& output) {
        HostSession host(commandLine, output.Results());
        ProjectSession project(host, commandLine);
        return CommandClass(project, commandLine, output.Results(), rule...).Run();
    });
}

} // namespace

ExitCode FileCommands::ShowStatus(const CommandLine& commandLine)
{
    return RunInProject<StatusCommand>(commandLine);
}

ExitCode FileCommands::ShowHistory(const CommandLine& commandLine)
{
    return RunInProject<HistoryCommand>(commandLine);
}

ExitCode FileCommands::Add(const CommandLine& commandLine)
{
    return RunInProject<OperationCommand>(commandLine, OperationRules::Add);
}

ExitCode FileCommands::CheckIn(const CommandLine& commandLine)
{
    return RunInProject<OperationCommand>(commandLine, OperationRules::CheckIn);
}

ExitCode FileCommands::CheckOut(const CommandLine& commandLine)
{
    return RunInProject<OperationCommand>(commandLine, OperationRules::CheckOut);
}

ExitCode FileCommands::UndoCheckOut(const CommandLine& commandLine)
{
    return RunInProject<OperationCommand>(commandLine, OperationRules::UndoCheckOut);
}

ExitCode FileCommands::GetLatest(const CommandLine& commandLine)
{
    return RunInProject<OperationCommand>(commandLine, OperationRules::GetLatest);
}
