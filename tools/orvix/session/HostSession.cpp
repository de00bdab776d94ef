#include "HostSession.h"

#include "FilePath.h"
#include "OrvixProviderSource.h"
#include "ToolError.h"

#include <windows.h>

#include <comdef.h>

#include <filesystem>
#include <iostream>
#include <new>

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
        throw ToolError(ExitCode::NoProject, L"%APPDATA% is not set; name a folder with --config");
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

HostSession::HostSession(const CommandLine& commandLine, Output& output) : m_access(commandLine.unattended, output)
{
    if ((commandLine.sources & OrvixProviderSource::Plugins) != 0)
    {
        const std::wstring plugins = PluginFolder(commandLine);
        if (!IsFolder(plugins))
        {
            throw ToolError(ExitCode::NoProject, L"no such plug-in folder: " + plugins);
        }
        m_client.SetProviderPluginPath((plugins + L'\\').c_str());
        m_searched = plugins;
    }
    if ((commandLine.sources & OrvixProviderSource::InstalledMSSCCI) != 0)
    {
        m_searched += m_searched.empty() ? L"" : L" or ";
        m_searched += L"the registry's list of MSSCCI libraries";
    }
    const std::wstring config = ConfigFolder(commandLine);
    std::error_code error;
    std::filesystem::create_directories(config, error);
    if (!IsFolder(config))
    {
        throw ToolError(ExitCode::NoProject, L"cannot make the configuration folder: " + config);
    }

    m_client.SetClientName(L"orvix");
    m_client.SetUserName((commandLine.user.empty() ? WindowsUser() : commandLine.user).c_str());
    m_client.SetConfigFilePath(config.c_str());
    m_client.SetParentWindow(GetConsoleWindow());
    m_client.SetIOrvixClientAccess(&m_access);

    m_services.reset(GetIOrvixServices());
    if (!m_services)
    {
        throw std::bad_alloc();
    }
    m_services->Initialize(&m_client, commandLine.sources);
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
        throw ToolError(ExitCode::NoProject, L"no provider in " + m_searched);
    }
    for (std::uint32_t index = 0; index < count; ++index)
    {
        if (nameOrIndex.empty() || PathKey(m_services->GetProviderName(index)) == PathKey(nameOrIndex) ||
            std::to_wstring(index) == nameOrIndex)
        {
            return index;
        }
    }
    throw ToolError(ExitCode::NoProject, L"no such provider: " + nameOrIndex + L" (see orvix providers)");
}

void HostSession::Release::operator()(IOrvixServices* services) const
{
    try
    {
        services->Shutdown();
    }
    catch (const _com_error&)
    {
        std::cerr << "orvix: the stored answers cannot be saved: out of memory\n";
    }
    ReleaseIOrvixServices(services);
}
