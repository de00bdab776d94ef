#include "ConsoleCodePage.h"
#include "FileCommand.h"

#include <comdef.h>

#include <iostream>

namespace
{
void ListProviders(HostSession& host)
{
    host.FindProvider(L""); // fails when there is none
    FileTable table({"Index", "Provider"});
    for (std::uint32_t index = 0; const wchar_t* name = host.Services().GetProviderName(index); ++index)
    {
        table.Add({std::to_string(index), Printable(name)});
    }
    table.Print(std::cout);
}

ExitCode Run(int count, wchar_t** arguments)
{
    const std::optional<CommandLine> commandLine = CommandLine::Parse(count, arguments);
    if (!commandLine)
    {
        return ExitCode::Success;
    }
    HostSession host(*commandLine);
    if (commandLine->command == L"providers")
    {
        ListProviders(host);
        return ExitCode::Success;
    }
    ProjectSession project(host, *commandLine);
    return FileCommand(project, host.Client(), *commandLine).Run();
}
} // namespace

int wmain(int count, wchar_t** arguments)
{
    const ConsoleCodePage codePage;
    ExitCode code = ExitCode::Failed;
    try
    {
        code = Run(count, arguments);
        if (!std::cout.flush())
        {
            throw ToolError(ExitCode::Failed, L"the output cannot be written");
        }
    }
    catch (const ToolError& error)
    {
        std::cerr << "orvix: " << error.what() << '\n';
        code = error.Code();
    }
    catch (const _com_error&)
    {
        std::cerr << "orvix: OrvixProviders.xml or OrvixPrompts.xml cannot be read: out of memory\n";
    }
    catch (const std::exception& error)
    {
        std::cerr << "orvix: unexpected: " << error.what() << '\n';
    }
    return static_cast<int>(code);
}
