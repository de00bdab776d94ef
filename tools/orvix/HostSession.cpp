#include "HostSession.h"

#include "FilePath.h"
#include "ToolError.h"

#include <windows.h>

#include <comdef.h>

#include <filesystem>
#include <iostream>
#include <new>

namespace
{
constexpr std::uint32_t PluginSource = 0x1;

std::wstring DefaultPlugins()
{
    std::wstring program(MAX_PATH, L'\0');
    DWORD length = 0;
    while ((length = GetModuleFileNameW(nullptr, program.data(), static_cast<DWORD>(program.size()))) == program.size())
    {
        program.resize(2 * program.size());
    }
    program.resize(length);
    return (std::filesystem::path(program).parent_path() / L"plugins").wstring();
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

HostSession::HostSession(const CommandLine& commandLine) : m_access(commandLine.unattended)
{
    m_plugins = FullPath(commandLine.plugins.empty() ? DefaultPlugins() : commandLine.plugins);
    if (!IsFolder(m_plugins))
    {
        throw ToolError(ExitCode::NoProject, L"no such plug-in folder: " + m_plugins);
    }
    const std::wstring config = FullPath(commandLine.config.empty() ? DefaultConfig() : commandLine.config);
    std::error_code error;
    std::filesystem::create_directories(config, error);
    if (!IsFolder(config))
    {
        throw ToolError(ExitCode::NoProject, L"cannot make the configuration folder: " + config);
    }

    m_client.SetClientName(L"orvix");
    m_client.SetUserName((commandLine.user.empty() ? WindowsUser() : commandLine.user).c_str());
    m_client.SetProviderPluginPath((m_plugins + L'\\').c_str());
    m_client.SetConfigFilePath(config.c_str());
    m_client.SetParentWindow(GetConsoleWindow());
    m_client.SetIOrvixClientAccess(&m_access);

    m_services.reset(GetIOrvixServices());
    if (!m_services)
    {
        throw std::bad_alloc();
    }
    m_services->Initialize(&m_client, PluginSource);
}

std::uint32_t HostSession::FindProvider(const std::wstring& nameOrIndex)
{
    const std::uint32_t count = m_services->GetProviderCount();
    if (count == 0)
    {
        throw ToolError(ExitCode::NoProject, L"no provider in " + m_plugins);
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
