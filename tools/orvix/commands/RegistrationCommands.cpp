#include "RegistrationCommands.h"

#include "FilePath.h"
#include "IsolatedFolder.h"
#include "IsolationSettings.h"
#include "LibraryImage.h"
#include "Registration.h"
#include "SccFunctions.h"

#include <chrono>
#include <filesystem>
#include <iostream>
#include <optional>
#include <string>

namespace
{

/// The bits of a library file: 32 or 64. Any other file counts as 64-bit; `Registration` says what is wrong with it.
int BitsOf(const std::wstring& library)
{
    const std::optional<LibraryImage> image = LibraryImage::Read(library);
    return image && image->machine == IMAGE_FILE_MACHINE_I386 ? 32 : 64;
}

/// Refuses the proxy of an isolated library, which would have to run itself.
void RefuseProxy(const std::wstring& library)
{
    const IsolationSettings settings = IsolationSettings::Read(std::filesystem::path(library).parent_path());
    if (!settings.library.empty())
    {
        throw ToolError(ExitCode::BadUsage,
                        L"this is the proxy of an isolated library; give the path of the library itself: " +
                            settings.library.wstring());
    }
}

/// Restores the folder as it was before a registration that failed. A failure here says less than that one.
void UndoMake(const IsolatedFolder& folder, bool isNew, const IsolationSettings& before)
{
    try
    {
        if (isNew)
        {
            folder.Remove();
        }
        else if (!before.library.empty()) // the registration that stays is for this library
        {
            folder.Make(before.library.wstring(), before.bits, before.patience);
        }
    }
    catch (const ToolError&)
    {
        return;
    }
}

/// Registers the proxy of an isolated library. Returns the path that it replaces, if any.
std::optional<std::wstring> SetIsolated(Registration& registration, const IsolatedFolder& folder,
                                        const std::wstring& library, int bits, std::chrono::seconds patience)
{
    if (bits == 64)
    {
        Registration::CheckLibrary(library);
    }
    else if (!LibraryImage::Is32BitWith(library, SccFunctions::GetVersion.name))
    {
        throw ToolError(ExitCode::NotFound, L"no MSSCCI library, it has no SccGetVersion: " + library);
    }
    const bool isNew = !folder.Exists();
    const IsolationSettings before = folder.Settings();
    bool isBegun = false;
    try
    {
        return registration.Set([&] {
            isBegun = true;
            return folder.Make(library, bits, patience);
        });
    }
    catch (const ToolError&)
    {
        if (isBegun)
        {
            UndoMake(folder, isNew, before);
        }
        throw;
    }
}

} // namespace

ExitCode RegistrationCommands::Register(const CommandLine& commandLine)
{
    const std::wstring library = FullPath(commandLine.paths.front());
    RefuseProxy(library);
    Registration registration(commandLine.name);
    const IsolatedFolder folder(commandLine.name);
    const int bits = BitsOf(library);
    const bool isIsolated = commandLine.isolated || bits == 32;
    std::optional<std::wstring> previous;
    if (!isIsolated)
    {
        previous = registration.Set(library);
        folder.Remove();
    }
    else
    {
        previous = SetIsolated(registration, folder, library, bits, std::chrono::seconds(commandLine.patience));
    }
    std::cout << (previous ? "replaced " : "registered ") << Printable(commandLine.name) << ": " << Printable(library);
    std::cout << (previous ? " instead of " + Printable(*previous) : "") << '\n';
    if (isIsolated)
    {
        std::cout << (bits == 32 ? "it is a 32-bit library, so it runs isolated, in a process of its own\n"
                                 : "it runs isolated, in a process of its own\n");
    }
    return ExitCode::Success;
}

ExitCode RegistrationCommands::Unregister(const CommandLine& commandLine)
{
    Registration registration(commandLine.name);
    const IsolatedFolder folder(commandLine.name);
    try
    {
        registration.Remove();
    }
    catch (const ToolError& error)
    {
        // The last run may have found the files in use.
        if (error.Code() != ExitCode::NotFound || !folder.Exists())
        {
            throw;
        }
    }
    folder.Remove();
    std::cout << "unregistered " << Printable(commandLine.name) << '\n';
    return ExitCode::Success;
}
