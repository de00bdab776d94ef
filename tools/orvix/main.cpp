#include "CommandLineParser.h"
#include "ConsoleCodePage.h"
#include "ValidationProcess.h"

#include <comdef.h>

#include <iostream>

namespace
{

ExitCode Run(int count, wchar_t** arguments)
{
    const std::optional<Invocation> invocation = ParseCommandLine(count, arguments);
    const ExitCode code = invocation ? invocation->command->run(invocation->commandLine) : ExitCode::Success;
    if (!std::cout.flush())
    {
        throw ToolError(ExitCode::Failed, L"the output cannot be written");
    }
    return code;
}

} // namespace

int wmain(int count, wchar_t** arguments)
{
    if (const std::optional<int> childCode = ValidationProcess::RunAsChild(count, arguments))
    {
        return *childCode;
    }
    const ConsoleCodePage codePage;
    ExitCode code = ExitCode::Failed;
    try
    {
        code = Run(count, arguments);
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
