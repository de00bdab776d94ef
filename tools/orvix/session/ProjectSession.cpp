#include "ProjectSession.h"

#include "FilePath.h"
#include "ToolError.h"

namespace
{

std::wstring ProjectFolder(const std::wstring& named, const wchar_t* fixedRoot)
{
    if (!named.empty())
    {
        return FullPath(named);
    }
    return FullPath(fixedRoot != nullptr && *fixedRoot != L'\0' ? fixedRoot : L".");
}

} // namespace

ProjectSession::ProjectSession(HostSession& host, const CommandLine& commandLine)
    : m_services(host.Services()), m_index(host.FindProvider(commandLine.provider)),
      m_provider(m_services.GetProvider(m_index)),
      m_folder(ProjectFolder(commandLine.project, m_services.GetProviderFixedProjectRoot(m_index)))
{
    if (!IsFolder(m_folder))
    {
        throw ToolError(ExitCode::NoProject, L"no such project folder: " + m_folder);
    }
    if (m_provider == nullptr || m_provider->Initialize(&host.Client()) != 0)
    {
        throw ToolError(ExitCode::NoProject, L"the provider does not start: " + ProviderName());
    }
    if (m_provider->OpenProject(m_folder.c_str(), L"") != 0)
    {
        m_provider->Uninitialize();
        throw ToolError(ExitCode::NoProject,
                        L"the provider " + ProviderName() + L" cannot open the project " + m_folder);
    }
}

ProjectSession::~ProjectSession()
{
    m_provider->CloseProject();
    m_provider->Uninitialize();
}
