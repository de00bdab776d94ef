#include "ProjectSession.h"

#include "FilePath.h"
#include "OrvixProviderResult.h"
#include "ToolError.h"

namespace
{

/// The folder that the user named; otherwise the administrator's fixed root; otherwise the current folder.
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
    : m_host(host), m_index(host.FindProvider(commandLine.provider)), m_provider(Services().GetProvider(m_index)),
      m_folder(ProjectFolder(commandLine.project, Services().GetProviderFixedProjectRoot(m_index)))
{
    if (!IsFolder(m_folder))
    {
        throw ToolError(ExitCode::NotFound, L"no such project folder: " + m_folder);
    }
    if (m_provider == nullptr || m_provider->Initialize(&Client()) != OrvixProviderResult::Success)
    {
        throw ToolError(ExitCode::NotFound, L"the provider does not start: " + ProviderName());
    }
    if (m_provider->OpenProject(m_folder.c_str(), L"") != OrvixProviderResult::Success)
    {
        m_provider->Uninitialize();
        throw ToolError(ExitCode::NotFound,
                        L"the provider " + ProviderName() + L" cannot open the project " + m_folder);
    }
}

ProjectSession::~ProjectSession()
{
    m_provider->CloseProject();
    m_provider->Uninitialize();
}

bool ProjectSession::IsExcluded(const std::wstring& path, std::wstring& filter)
{
    return Services().IsFileExcludedByProvider(m_index, path.c_str(), &filter);
}
