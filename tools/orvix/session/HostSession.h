#pragma once

#include "ClientAccess.h"
#include "CommandLine.h"
#include "FileDiagnostics.h"
#include "InstalledProviders.h"
#include "OrvixClientInfo.h"
#include "OrvixProviderConfigManager.h"
#include "OrvixServicesPointer.h"

#include <string>
#include <vector>

/// The services object of one run, initialised from the command line. At the end it is shut down, which saves the
/// stored answers, and released.
class HostSession
{
public:
    /// Makes the configuration folder when it is missing. `output` prints the text of providers and must outlive this
    /// object. Throws `ToolError` with `ExitCode::NotFound` when the folder cannot be made, and when plug-ins are
    /// wanted and their folder does not exist.
    HostSession(const CommandLine& commandLine, Output& output);
    HostSession(const HostSession&) = delete;
    HostSession& operator=(const HostSession&) = delete;
    ~HostSession();

    /// The full path of the folder that a run with this command line uses, whether it exists or not. Throws `ToolError`
    /// with `ExitCode::NotFound` when none is named and there is no default.
    static std::wstring PluginFolder(const CommandLine& commandLine);
    static std::wstring ConfigFolder(const CommandLine& commandLine);

    // Both are valid as long as this object.
    IOrvixServices& Services() { return *m_services; }
    OrvixClientInfo& Client() { return m_client; }

    /// Index of the provider with this name (in any letter case) or index; the first provider for an empty text. Throws
    /// `ToolError` with `ExitCode::NotFound`.
    std::uint32_t FindProvider(const std::wstring& nameOrIndex);

    /// Whether the provider is an installed MSSCCI library, which takes names and comments in the ANSI code page only.
    bool IsInstalled(std::uint32_t provider) const { return provider >= m_firstInstalled; }

    /// The library of an installed provider; null for a plug-in. Valid as long as this object.
    const InstalledProviders::Candidate* InstalledLibrary(std::uint32_t provider) const
    {
        return IsInstalled(provider) ? &m_installed[provider - m_firstInstalled] : nullptr;
    }

private:
    void FindInstalled();
    std::wstring SwitchedOff() const;
    void UsePlugins(const CommandLine& commandLine);
    void UseConfiguration(const CommandLine& commandLine);

    ClientAccess m_access;
    OrvixClientInfo m_client;
    std::wstring m_searched;              // where providers were searched, for messages
    OrvixProviderConfigManager m_configs; // as the services object reads it
    FileDiagnostics m_settings;           // of OrvixProviders.xml
    std::vector<InstalledProviders::Candidate> m_installed;
    std::uint32_t m_firstInstalled = 0; // index; the number of providers when there is none
    OrvixServicesPointer m_services;
};
