#include "ProjectSession.h"

#include "FilePath.h"
#include "LibraryFiles.h"
#include "OrvixProviderResult.h"
#include "ToolError.h"

namespace
{

/// The folder that the user named; otherwise the administrator's fixed root; otherwise the current folder.
std::wstring ProjectFolder(const CommandLine& commandLine, const wchar_t* fixedRoot)
{
    if (!commandLine.project.empty())
    {
        return commandLine.project;
    }
    return fixedRoot != nullptr && *fixedRoot != L'\0' ? FullPath(fixedRoot) : commandLine.folder;
}

} // namespace

ProjectSession::ProjectSession(HostSession& host, const CommandLine& commandLine)
    : m_host(host), m_index(host.FindProvider(commandLine.provider)),
      m_folder(ProjectFolder(commandLine, Services().GetProviderFixedProjectRoot(m_index)))
{
    if (!IsFolder(m_folder))
    {
        throw ToolError(ExitCode::NotFound, L"no such project folder: " + m_folder);
    }
    if (IOrvixProvider* const provider =
            GuardedCall("the start of " + Utf8(ProviderName()), [this] { return Services().GetProvider(m_index); }))
    {
        m_provider.emplace(*provider, ProviderName());
    }
    if (!m_provider || m_provider->Initialize(&Client()) != OrvixProviderResult::Success)
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

int ProjectSession::NameKnownFiles(const std::wstring& folder, OrvixKnownFileCallback callback, void* callerData)
{
    if (const InstalledProviders::Candidate* const library = m_host.InstalledLibrary(m_index))
    {
        LibraryFiles::Name(*library, Client(), {.project = m_folder, .folder = folder}, callback, callerData);
        return OrvixProviderResult::Success;
    }
    return m_provider->NameKnownFiles(folder.c_str(), callback, callerData);
}

bool ProjectSession::Takes(const std::wstring& text) const
{
    return !m_host.IsInstalled(m_index) || IsInAnsiCodePage(text);
}
