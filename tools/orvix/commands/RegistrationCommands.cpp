#include "RegistrationCommands.h"

#include "FilePath.h"
#include "Registration.h"

#include <iostream>

ExitCode RegistrationCommands::Register(const CommandLine& commandLine)
{
    const std::wstring library = FullPath(commandLine.paths.front());
    const std::optional<std::wstring> previous = Registration(commandLine.name).Set(library);
    std::cout << (previous ? "replaced " : "registered ") << Printable(commandLine.name) << ": " << Printable(library);
    std::cout << (previous ? " instead of " + Printable(*previous) : "") << '\n';
    return ExitCode::Success;
}

ExitCode RegistrationCommands::Unregister(const CommandLine& commandLine)
{
    Registration(commandLine.name).Remove();
    std::cout << "unregistered " << Printable(commandLine.name) << '\n';
    return ExitCode::Success;
}
