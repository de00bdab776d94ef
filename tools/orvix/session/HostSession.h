#pragma once

#include "ClientAccess.h"
#include "CommandLine.h"
#include "IOrvixServices.h"
#include "OrvixClientInfo.h"

#include <memory>
#include <string>

/// The services object of one run, initialised with what the command line says; shut down (which saves the
/// stored answers) and released at the end.
class HostSession
{
public:
    /// Makes the configuration folder when it is missing. Throws `ToolError` with `ExitCode::NoProject` when
    /// that fails or the plug-in folder, if wanted, does not exist. The providers' text goes to `output`, which must
    /// outlive this object.
    HostSession(const CommandLine& commandLine, Output& output);

    /// The full path of the folder that a run with this command line uses, whether it exists or not. Throws `ToolError`
    /// with `ExitCode::NoProject` when none is named and there is no default.
    static std::wstring PluginFolder(const CommandLine& commandLine);
    static std::wstring ConfigFolder(const CommandLine& commandLine);

    IOrvixServices& Services() { return *m_services; }
    OrvixClientInfo& Client() { return m_client; }

    /// Index of the provider named by name (in any letter case) or index; the first for an empty text.
    /// Throws `ToolError` with `ExitCode::NoProject`.
    std::uint32_t FindProvider(const std::wstring& nameOrIndex);

private:
    struct Release
    {
        void operator()(IOrvixServices* services) const;
    };

    ClientAccess m_access;
    OrvixClientInfo m_client;
    std::wstring m_searched; // where providers were looked for, in words
    std::unique_ptr<IOrvixServices, Release> m_services;
};
