#include "PromptCommands.h"

#include "CommandOutput.h"
#include "PromptFileEditor.h"

namespace
{

ExitCode Run(const CommandLine& commandLine, void (PromptFileEditor::*operation)())
{
    return WithOutput(commandLine, [&](CommandOutput& output) {
        PromptFileEditor editor(commandLine, output.Results());
        (editor.*operation)();
        return ExitCode::Success;
    });
}

} // namespace

ExitCode PromptCommands::List(const CommandLine& commandLine)
{
    return Run(commandLine, &PromptFileEditor::List);
}

ExitCode PromptCommands::Set(const CommandLine& commandLine)
{
    return Run(commandLine, &PromptFileEditor::Set);
}

ExitCode PromptCommands::Reset(const CommandLine& commandLine)
{
    return Run(commandLine, &PromptFileEditor::Reset);
}

ExitCode PromptCommands::Lock(const CommandLine& commandLine)
{
    return Run(commandLine, &PromptFileEditor::Lock);
}

ExitCode PromptCommands::Unlock(const CommandLine& commandLine)
{
    return Run(commandLine, &PromptFileEditor::Unlock);
}
