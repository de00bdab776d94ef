#pragma once

#include "GuardedProvider.h"
#include "HostSession.h"

#include <optional>
#include <string>

/// A provider with an open project. At the end the project is closed.
class ProjectSession
{
public:
    /// `host` must outlive this object. Throws `ToolError` with `ExitCode::NotFound` when there is no such provider or
    /// project folder, and when the provider does not start or does not open the project.
    ProjectSession(HostSession& host, const CommandLine& commandLine);
    ProjectSession(const ProjectSession&) = delete;
    ProjectSession& operator=(const ProjectSession&) = delete;
    ~ProjectSession();

    OrvixClientInfo& Client() { return m_host.Client(); }
    IOrvixServices& Services() { return m_host.Services(); }
    GuardedProvider& Provider() { return *m_provider; }
    std::uint32_t ProviderIndex() const { return m_index; }
    std::wstring ProviderName() { return Services().GetProviderName(m_index); }

    /// Full path of the project's folder.
    const std::wstring& Folder() const { return m_folder; }

    /// Whether the provider takes a name or a comment without losing characters of it. An installed MSSCCI library
    /// takes those of the ANSI code page.
    bool Takes(const std::wstring& text) const;

    /// Names the controlled files in a folder of the project and below, on the disk or not, as
    /// `OrvixKnownFilesFunction` does. `NotOffered` when a plug-in has no such function. An MSSCCI library that does
    /// not list its files names none, and that is no failure.
    int NameKnownFiles(const std::wstring& folder, OrvixKnownFileCallback callback, void* callerData);

    /// Whether the administrator's filters exclude a file from the provider. `filter` receives the name of the filter.
    bool IsExcluded(const std::wstring& path, std::wstring& filter);

private:
    HostSession& m_host;
    std::uint32_t m_index;
    std::wstring m_folder;
    std::optional<GuardedProvider> m_provider; // of an object that the services object owns
};
