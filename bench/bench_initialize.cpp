#include "IOrvixServices.h"
#include "Libraries.h"
#include "Measure.h"
#include "OrvixClientInfo.h"
#include "OrvixProviderSource.h"
#include "RegistryKey.h"
#include "TempFolder.h"
#include "UniqueHandle.h"

#include <cstdint>
#include <filesystem>
#include <memory>
#include <string>
#include <vector>

namespace
{

constexpr wchar_t InstalledKey[] = L"Software\\SourceCodeControlProvider\\InstalledSCCProviders";
constexpr wchar_t ProvidersKey[] = L"Software\\OrvixCore bench";

/// Copies of the sample plug-in and as many registrations of an MSSCCI library.
class Installation
{
public:
    explicit Installation(int count) : m_count(count)
    {
        for (int i = 0; i < m_count; ++i)
        {
            const std::wstring name = L"Bench " + std::to_wstring(i);
            std::filesystem::copy_file(ProgramFolder() / L"plugins" / L"archive.dll",
                                       m_plugins.Path() / (name + L".dll"));
            const std::wstring key = std::wstring(ProvidersKey) + L"\\" + name;
            m_keys.push_back(std::make_unique<TemporaryRegistryKey>(key));
            m_keys.back()->SetString(L"SCCServerName", name);
            m_keys.back()->SetString(L"SCCServerPath", ProgramFolder() / IdleLibrary);
            m_list.SetString(name, key);
        }
    }

    std::wstring PluginFolder() const { return m_plugins.Text() + L"\\"; }

    /// The system's calls that an initialisation cannot do without.
    void LoadByHand(std::vector<UniqueModule>& modules) const
    {
        for (int i = 0; i < m_count; ++i)
        {
            modules.emplace_back(
                LoadLibraryExW((PluginFolder() + L"Bench " + std::to_wstring(i) + L".dll").c_str(), nullptr, 0));
            for (const char* name :
                 {"GetOrvixVersion", "GetIOrvixProvider", "ReleaseIOrvixProvider", "GetOrvixProviderName"})
            {
                GetProcAddress(modules.back().Get(), name);
            }
        }
        HKEY list = nullptr;
        RegOpenKeyExW(HKEY_LOCAL_MACHINE, InstalledKey, 0, KEY_READ, &list);
        for (int i = 0; i < m_count; ++i)
        {
            const std::wstring name = L"Bench " + std::to_wstring(i);
            HKEY key = nullptr;
            RegOpenKeyExW(HKEY_LOCAL_MACHINE, Query(list, name.c_str()).c_str(), 0, KEY_READ, &key);
            Query(key, L"SCCServerName");
            Query(key, L"SCCServerPath");
            RegCloseKey(key);
        }
        RegCloseKey(list);
    }

private:
    static std::wstring Query(HKEY key, const wchar_t* name)
    {
        wchar_t text[1024] = {};
        DWORD size = sizeof text - sizeof *text;
        RegQueryValueExW(key, name, nullptr, nullptr, reinterpret_cast<BYTE*>(text), &size);
        return text;
    }

    int m_count;
    TempFolder m_plugins;
    TemporaryRegistryKey m_list{InstalledKey};
    std::vector<std::unique_ptr<TemporaryRegistryKey>> m_keys;
};

/// The services of the library as a host loads it: its own manifest is part of the work.
class LoadedServices
{
public:
    LoadedServices()
        : m_library(LoadLibraryW(L"OrvixCore.dll")),
          m_services(Export<IOrvixServices*()>(m_library.Get(), "GetIOrvixServices")(),
                     Export<void(IOrvixServices*)>(m_library.Get(), "ReleaseIOrvixServices"))
    {
    }

    IOrvixServices* operator->() const { return m_services.get(); }

private:
    UniqueModule m_library;
    std::unique_ptr<IOrvixServices, void (*)(IOrvixServices*)> m_services;
};

constexpr std::uint32_t AllSources = OrvixProviderSource::Plugins | OrvixProviderSource::InstalledMSSCCI;

Measure InitializeMany(int count)
{
    const Installation installed(count);
    const TempFolder config;
    OrvixClientInfo info;
    info.SetConfigFilePath(config.Text().c_str());
    info.SetProviderPluginPath(installed.PluginFolder().c_str());
    const LoadedServices services;
    std::vector<UniqueModule> modules;
    const std::string number = std::to_string(count);
    return Compare(
        "Initialize, " + number + " plug-ins and " + number + " MSSCCI registrations", 1.1,
        [&] { services->Initialize(&info, AllSources); }, [&] { installed.LoadByHand(modules); },
        [&] {
            services->Shutdown();
            modules.clear();
        });
}

/// With the folders of plug-ins and of settings empty, and an empty list in the registry.
Measure InitializeNothing()
{
    const TemporaryRegistryKey registrations(InstalledKey);
    const TempFolder config;
    const TempFolder plugins;
    const std::wstring providers = config.Text() + L"\\OrvixProviders.xml";
    const std::wstring prompts = config.Text() + L"\\OrvixPrompts.xml";
    const std::wstring pattern = plugins.Text() + L"\\*.dll";
    OrvixClientInfo info;
    info.SetConfigFilePath(config.Text().c_str());
    info.SetProviderPluginPath((plugins.Text() + L"\\").c_str());
    const LoadedServices services;
    return Compare(
        "Initialize without providers and files", 1.5, [&] { services->Initialize(&info, AllSources); },
        [&] {
            for (const std::wstring& path : {providers, prompts})
            {
                const UniqueFile file(CreateFileW(path.c_str(), GENERIC_READ, FILE_SHARE_READ, nullptr, OPEN_EXISTING,
                                                  FILE_ATTRIBUTE_NORMAL, nullptr));
            }
            WIN32_FIND_DATAW found;
            const UniqueFind find(FindFirstFileW(pattern.c_str(), &found));
            HKEY list = nullptr;
            RegOpenKeyExW(HKEY_LOCAL_MACHINE, InstalledKey, 0, KEY_READ, &list);
            wchar_t name[1024];
            DWORD size = 1024;
            RegEnumValueW(list, 0, name, &size, nullptr, nullptr, nullptr, nullptr);
            RegCloseKey(list);
        },
        [&] { services->Shutdown(); });
}

} // namespace

void BenchInitialize(MeasureTable& table)
{
    table.Print(InitializeNothing());
    for (const int count : {50, 200})
    {
        table.Print(InitializeMany(count));
    }
}
