#include "HostSession.h"

#include "FilePath.h"
#include "GuardedCall.h"
#include "ModulePath.h"
#include "OrvixProviderConfig.h"
#include "OrvixProviderSource.h"
#include "ToolError.h"

#include <windows.h>

#include <comdef.h>

#include <algorithm>
#include <filesystem>
#include <iostream>
#include <new>
#include <utility>

namespace
{

std::wstring DefaultPlugins()
{
    return (std::filesystem::path(ModulePath(nullptr)).parent_path() / L"plugins").wstring();
}

std::wstring DefaultConfig()
{
    const wchar_t* applicationData = _wgetenv(L"APPDATA");
    if (applicationData == nullptr || *applicationData == L'\0')
    {
        throw ToolError(ExitCode::NotFound, L"%APPDATA% is not set; name a folder with --config");
    }
    return std::wstring(applicationData) + L"\\OrvixCore";
}

std::wstring WindowsUser()
{
    wchar_t name[257] = L"";
    DWORD size = static_cast<DWORD>(std::size(name));
    ::GetUserNameW(name, &size);
    return name;
}

} // namespace

HostSession::HostSession(const CommandLine& commandLine, Output& output) : m_access(commandLine, output)
{
    if ((commandLine.sources & OrvixProviderSource::Plugins) != 0)
    {
        UsePlugins(commandLine);
    }
    if ((commandLine.sources & OrvixProviderSource::InstalledMSSCCI) != 0)
    {
        m_searched += m_searched.empty() ? L"" : L" or ";
        m_searched += L"the registry's list of MSSCCI libraries";
    }
    UseConfiguration(commandLine);
    m_client.SetClientName(L"orvix");
    m_client.SetUserName((commandLine.user.empty() ? WindowsUser() : commandLine.user).c_str());
    m_client.SetParentWindow(GetConsoleWindow());
    m_client.SetIOrvixClientAccess(&m_access);

    m_services = MakeOrvixServices();
    if (!m_services)
    {
        throw std::bad_alloc();
    }
    GuardedCall("the search for providers", [&] { m_services->Initialize(&m_client, commandLine.sources); });
    m_configs.LoadConfig((ConfigFolder(commandLine) + L'\\' + OrvixProviderConfigManager::FileName).c_str(),
                         &m_settings);
    if ((commandLine.sources & OrvixProviderSource::InstalledMSSCCI) != 0)
    {
        FindInstalled();
    }
    const std::uint32_t count = m_services->GetProviderCount();
    m_firstInstalled = count - std::min(count, static_cast<std::uint32_t>(m_installed.size()));
}

HostSession::~HostSession()
{
    try
    {
        GuardedCall("the unloading of the providers", [this] { m_services->Shutdown(); });
    }
    catch (const _com_error&)
    {
        std::cerr << "orvix: the stored answers cannot be saved: out of memory\n";
    }
}

/// Plug-ins come first, and the libraries of the registry's list follow.
void HostSession::FindInstalled()
{
    const UniqueRegistryKey list = InstalledProviders::OpenList();
    std::wstring keyPath;
    for (DWORD index = 0; list; ++index)
    {
        const auto step = InstalledProviders::KeyPathAt(list.Get(), index, keyPath);
        if (step == InstalledProviders::Step::End)
        {
            return;
        }
        InstalledProviders::Candidate library;
        if (step == InstalledProviders::Step::Found)
        {
            library = InstalledProviders::Judge(keyPath, m_configs);
        }
        if (library.verdict == InstalledProviders::Verdict::Listed)
        {
            m_installed.push_back(std::move(library));
        }
    }
}

/// The end of a message that there is no provider: which settings may be the reason.
std::wstring HostSession::SwitchedOff() const
{
    std::wstring text;
    for (const FileDiagnostics::Provider& provider : m_settings.providers)
    {
        if (!provider.config->m_enabled)
        {
            text += L"; provider element " + std::to_wstring(provider.item) + L" of " +
                    OrvixProviderConfigManager::FileName + L" switches off each provider whose name contains \"" +
                    provider.name + L"\"";
        }
    }
    return text;
}

void HostSession::UsePlugins(const CommandLine& commandLine)
{
    const std::wstring folder = PluginFolder(commandLine);
    if (!IsFolder(folder))
    {
        throw ToolError(ExitCode::NotFound, L"no such plug-in folder: " + folder);
    }
    m_client.SetProviderPluginPath((folder + L'\\').c_str());
    m_searched = folder;
}

void HostSession::UseConfiguration(const CommandLine& commandLine)
{
    const std::wstring folder = ConfigFolder(commandLine);
    std::error_code ignored;
    std::filesystem::create_directories(folder, ignored);
    if (!IsFolder(folder))
    {
        throw ToolError(ExitCode::NotFound, L"cannot make the configuration folder: " + folder);
    }
    m_client.SetConfigFilePath(folder.c_str());
}

std::wstring HostSession::PluginFolder(const CommandLine& commandLine)
{
    return FullPath(commandLine.plugins.empty() ? DefaultPlugins() : commandLine.plugins);
}

std::wstring HostSession::ConfigFolder(const CommandLine& commandLine)
{
    return FullPath(commandLine.config.empty() ? DefaultConfig() : commandLine.config);
}

std::uint32_t HostSession::FindProvider(const std::wstring& nameOrIndex)
{
    const std::uint32_t count = m_services->GetProviderCount();
    if (count == 0)
    {
        throw ToolError(ExitCode::NotFound, L"no provider in " + m_searched + SwitchedOff());
    }
    for (std::uint32_t index = 0; index < count; ++index)
    {
        if (nameOrIndex.empty() || PathKey(m_services->GetProviderName(index)) == PathKey(nameOrIndex) ||
            std::to_wstring(index) == nameOrIndex)
        {
            return index;
        }
    }
    throw ToolError(ExitCode::NotFound, L"no such provider: " + nameOrIndex + L" (see orvix providers)");
}
