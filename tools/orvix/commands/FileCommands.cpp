#include "FileCommands.h"

#include "CommandOutput.h"
#include "HistoryCommand.h"
#include "OperationCommand.h"
#include "SettingsExaminer.h"
#include "StatusCommand.h"

namespace
{

/// Throws `ToolError` when the administrator's settings are there and cannot be read: the library would lift their
/// rules in silence.
void RequireSettings(const CommandLine& commandLine)
{
    const std::wstring path = HostSession::ConfigFolder(commandLine) + L'\\' + OrvixProviderConfigManager::FileName;
    if (const std::wstring reason = SettingsExaminer::WhyUnread(path); !reason.empty())
    {
        throw ToolError(ExitCode::BrokenSettings,
                        L"no file is touched, since the administrator's rules are not known: " + path + L": " + reason +
                            L" (see orvix doctor)");
    }
}

/// Runs a command of this class in an open project. `rule` is that of an operation, which changes files.
template <typename CommandClass, typename... Rule>
ExitCode RunInProject(const CommandLine& commandLine, const Rule&... rule)
{
    if constexpr (sizeof...(rule) > 0)
    {
        RequireSettings(commandLine);
    }
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
