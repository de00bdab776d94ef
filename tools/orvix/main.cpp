#include "CandidateExam.h"
#include "ComApartment.h"
#include "CommandLineParser.h"
#include "CommandProcess.h"
#include "ConsoleCodePage.h"
#include "ParentLink.h"
#include "ValidationProcess.h"

#include <comdef.h>

#include <iostream>

namespace
{

ExitCode Run(int count, wchar_t** arguments, bool isChild)
{
    const std::optional<Invocation> invocation = ParseCommandLine(count, arguments);
    ExitCode code = ExitCode::Success;
    if (invocation)
    {
        const auto& [command, commandLine] = *invocation;
        const bool inChild = command->usesProviders && !isChild;
        code = inChild ? CommandProcess::RunInChild(commandLine) : command->run(commandLine);
    }
    if (!std::cout.flush())
    {
        throw ToolError(ExitCode::Failed, L"the output cannot be written");
    }
    return code;
}

/// The same, but what goes wrong becomes a message and an exit code.
ExitCode RunToEnd(int count, wchar_t** arguments, bool isChild)
{
    ExitCode code = ExitCode::Failed;
    try
    {
        code = Run(count, arguments, isChild);
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
    return code;
}

} // namespace

int wmain(int count, wchar_t** arguments)
{
    const bool isChild = ParentLink::Attach(count, arguments);
    const ComApartment apartment;
    if (isChild)
    {
        if (const std::optional<int> code = ValidationProcess::RunAsChild(count, arguments))
        {
            return *code;
        }
        if (CandidateExams::RunAsChild(count, arguments))
        {
            return static_cast<int>(ExitCode::Success);
        }
    }
    const ConsoleCodePage codePage;
    const ExitCode code = RunToEnd(count, arguments, isChild);
    if (isChild)
    {
        CommandProcess::SendResult(code);
    }
    return static_cast<int>(code);
}
