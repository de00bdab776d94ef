#pragma once

#include "HostSession.h"
#include "IOrvixProvider.h"

#include <string>

/// A provider with a project open; closed at the end.
class ProjectSession
{
public:
    /// Throws `ToolError` with `ExitCode::NoProject` when there is no such provider or project, or the
    /// provider refuses. `host` must outlive this object.
    ProjectSession(HostSession& host, const CommandLine& commandLine);
    ProjectSession(const ProjectSession&) = delete;
    ProjectSession& operator=(const ProjectSession&) = delete;
    ~ProjectSession();

    IOrvixServices& Services() { return m_services; }
    IOrvixProvider& Provider() { return *m_provider; }
    std::uint32_t ProviderIndex() const { return m_index; }
    std::wstring ProviderName() { return m_services.GetProviderName(m_index); }
    const std::wstring& Folder() const { return m_folder; }

private:
    IOrvixServices& m_services;
    std::uint32_t m_index;
    IOrvixProvider* m_provider;
    std::wstring m_folder;
};
