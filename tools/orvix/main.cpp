#include "ConsoleCodePage.h"
#include "Doctor.h"
#include "FileCommand.h"
#include "FilePath.h"
#include "FilterCommand.h"
#include "JsonOutput.h"
#include "PromptCommand.h"
#include "ProviderCommand.h"
#include "Registration.h"
#include "ReservedOutput.h"
#include "Terminal.h"
#include "TextOutput.h"
#include "ValidateCommand.h"
#include "ValidationProcess.h"

#include <comdef.h>

#include <iostream>
#include <memory>

namespace
{

std::unique_ptr<Output> MakeOutput(const CommandLine& commandLine, const OutputStyle& style, std::ostream& stream)
{
    if (commandLine.json)
    {
        return std::make_unique<JsonOutput>(stream);
    }
    return std::make_unique<TextOutput>(stream, style);
}

void ListProviders(HostSession& host, Output& output)
{
    host.FindProvider(L""); // fails when there is none
    Listing listing{
        .key = "providers", .columns = {{"index", "Index"}, {"name", "Provider"}}, .rows = {}, .summary = {}};
    for (std::uint32_t index = 0; index < host.Services().GetProviderCount(); ++index)
    {
        const wchar_t* name = host.Services().GetProviderName(index);
        listing.rows.push_back({{std::int64_t{index}}, {std::wstring(name)}});
    }
    output.Show(listing);
}

void Register(const std::wstring& name, const std::wstring& path)
{
    const std::wstring library = FullPath(path);
    const std::optional<std::wstring> previous = Registration(name).Set(library);
    std::cout << (previous ? "replaced " : "registered ") << Printable(name) << ": " << Printable(library);
    std::cout << (previous ? " instead of " + Printable(*previous) : "") << '\n';
}

void Unregister(const std::wstring& name)
{
    Registration(name).Remove();
    std::cout << "unregistered " << Printable(name) << '\n';
}

ExitCode Diagnose(const CommandLine& commandLine, Output& output, const OutputStyle& style, std::ostream& stream)
{
    const DoctorReport report = Doctor(commandLine, output).Examine();
    if (commandLine.json)
    {
        report.PrintJson(stream);
    }
    else
    {
        report.PrintText(stream, style);
    }
    return report.NumProblems() == 0 ? ExitCode::Success : ExitCode::Failed;
}

/// Carries out a command that has an `Output`, and prints its result on `stream`.
ExitCode Run(const CommandLine& commandLine, const OutputStyle& style, std::ostream& stream)
{
    const std::unique_ptr<Output> output = MakeOutput(commandLine, style, stream);
    if (commandLine.command == L"doctor")
    {
        return Diagnose(commandLine, *output, style, stream);
    }
    if (commandLine.command == L"prompts")
    {
        PromptCommand(commandLine, *output).Run();
        return ExitCode::Success;
    }
    HostSession host(commandLine, *output);
    if (commandLine.command == L"providers")
    {
        ListProviders(host, *output);
        return ExitCode::Success;
    }
    if (commandLine.command == L"filters")
    {
        return FilterCommand(host, commandLine, *output).Run();
    }
    ProjectSession project(host, commandLine);
    if (ProviderCommand::IsOne(commandLine.command))
    {
        ProviderCommand(project, commandLine).Run();
        return ExitCode::Success;
    }
    return FileCommand(project, host.Client(), commandLine, *output).Run();
}

void CheckWritten(bool written)
{
    if (!written)
    {
        throw ToolError(ExitCode::Failed, L"the output cannot be written");
    }
}

ExitCode Run(int count, wchar_t** arguments)
{
    const std::optional<CommandLine> commandLine = CommandLine::Parse(count, arguments);
    if (!commandLine)
    {
        return ExitCode::Success;
    }
    if (commandLine->command == L"register")
    {
        Register(commandLine->name, commandLine->paths.front());
        return ExitCode::Success;
    }
    if (commandLine->command == L"unregister")
    {
        Unregister(commandLine->name);
        return ExitCode::Success;
    }
    if (commandLine->command == L"validate")
    {
        return ValidateCommand(*commandLine).Run();
    }
    const Terminal terminal;
    const OutputStyle style = terminal.Style(commandLine->noColor);
    if (!commandLine->json)
    {
        return Run(*commandLine, style, std::cout);
    }
    ReservedOutput output;
    const ExitCode code = Run(*commandLine, style, output.Stream());
    CheckWritten(output.Print());
    return code;
}

} // namespace

int wmain(int count, wchar_t** arguments)
{
    if (const std::optional<int> validated = ValidationProcess::RunAsChild(count, arguments))
    {
        return *validated;
    }
    const ConsoleCodePage codePage;
    ExitCode code = ExitCode::Failed;
    try
    {
        code = Run(count, arguments);
        CheckWritten(static_cast<bool>(std::cout.flush()));
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
