#include "FileLists.h"
#include "IOrvixServices.h"
#include "MSSCCI.h"
#include "Measure.h"
#include "ModulePath.h"
#include "OrvixClientInfo.h"
#include "OrvixMSSCC.h"
#include "OrvixProviderSource.h"
#include "OrvixProviderWrapper.h"
#include "RegistryKey.h"
#include "TempFolder.h"

#include <psapi.h>

#include <cstdio>
#include <cstring>
#include <filesystem>
#include <memory>
#include <string>
#include <vector>

namespace
{

constexpr wchar_t IdleLibrary[] = L"idle_msscci.dll";
constexpr wchar_t InstalledKey[] = L"Software\\SourceCodeControlProvider\\InstalledSCCProviders";
constexpr wchar_t ProvidersKey[] = L"Software\\OrvixCore bench";

template <typename Function>
Function* Export(HMODULE module, const char* name)
{
    return reinterpret_cast<Function*>(reinterpret_cast<void (*)()>(GetProcAddress(module, name)));
}

std::filesystem::path ProgramFolder()
{
    return std::filesystem::path(ModulePath(nullptr)).parent_path();
}

/// A provider over the library that does nothing, with an open project.
class IdleMsscci
{
public:
    IdleMsscci()
    {
        auto bridge = std::make_unique<OrvixMSSCC>();
        bridge->SetProvider((ProgramFolder() / IdleLibrary).c_str(), L"", L"Idle", false);
        m_wrapper.SetMSSCC(std::move(bridge));
        OrvixClientInfo info;
        m_wrapper.Initialize(&info);
        m_wrapper.OpenProject(L"C:\\project", L"");
    }

    OrvixProviderWrapper& Provider() { return m_wrapper; }

private:
    OrvixProviderWrapper m_wrapper;
};

/// One conversion of each path and one call, without a check of anything.
void QueryByHand(OrvixFileList& list, decltype(SccQueryInfo)* query)
{
    const unsigned int count = list.NumActiveEntries();
    std::vector<std::unique_ptr<char[]>> texts(count);
    std::vector<LPCSTR> names(count);
    std::vector<LONG> statuses(count);
    for (unsigned int i = 0; i < count; ++i)
    {
        char text[MAX_PATH];
        const int size = WideCharToMultiByte(CP_ACP, 0, list.GetActiveFileEntry(i)->GetFile(), -1, text,
                                             static_cast<int>(sizeof text), nullptr, nullptr);
        texts[i] = std::make_unique<char[]>(static_cast<std::size_t>(size));
        names[i] = static_cast<char*>(std::memcpy(texts[i].get(), text, static_cast<std::size_t>(size)));
    }
    query(nullptr, static_cast<LONG>(count), names.data(), statuses.data());
}

SIZE_T MemoryNow()
{
    PROCESS_MEMORY_COUNTERS counters = {};
    GetProcessMemoryInfo(GetCurrentProcess(), &counters, sizeof counters);
    return counters.PagefileUsage;
}

/// Peak memory of a query, which is during the library's call.
void ReportMemory(IdleMsscci& msscci, HMODULE library)
{
    constexpr unsigned int Count = 100000;
    const auto list = MakeActiveList(Count);
    std::size_t bytes = 0;
    for (unsigned int i = 0; i < Count; ++i)
    {
        bytes += std::wcslen(list->GetActiveFileEntry(i)->GetFile()) + 1;
    }
    const SIZE_T before = MemoryNow();
    msscci.Provider().QueryStatus(list.get(), 0);
    const SIZE_T during = Export<SIZE_T()>(library, "MemoryInQuery")();
    std::printf("QueryStatus, 100,000 files: %.1f MB more than before at its peak; the narrow paths have %.1f MB\n",
                static_cast<double>(during - before) / 1e6, static_cast<double>(bytes) / 1e6);
}

/// Milliseconds per file of a check-out.
double CheckOutCostPerFile(IdleMsscci& msscci, unsigned int count, unsigned int repeat)
{
    const auto list = MakeActiveList(count);
    const double time = BestTime([&] {
        for (unsigned int i = 0; i < repeat; ++i)
        {
            msscci.Provider().CheckOut(list.get(), L"comment", 0);
        }
    });
    return time / count / repeat;
}

/// Fifty copies of the sample plug-in and fifty registrations of MSSCCI libraries.
class InstalledFifty
{
public:
    static constexpr int Count = 50;

    InstalledFifty()
    {
        for (int i = 0; i < Count; ++i)
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
        for (int i = 0; i < Count; ++i)
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
        for (int i = 0; i < Count; ++i)
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

    TempFolder m_plugins;
    TemporaryRegistryKey m_list{InstalledKey};
    std::vector<std::unique_ptr<TemporaryRegistryKey>> m_keys;
};

/// Through the library as a host loads it: its own manifest is part of the work.
Measure InitializeFifty()
{
    const InstalledFifty installed;
    const TempFolder config;
    OrvixClientInfo info;
    info.SetConfigFilePath(config.Text().c_str());
    info.SetProviderPluginPath(installed.PluginFolder().c_str());
    const UniqueModule core(LoadLibraryW(L"OrvixCore.dll"));
    const std::unique_ptr<IOrvixServices, void (*)(IOrvixServices*)> services(
        Export<IOrvixServices*()>(core.Get(), "GetIOrvixServices")(),
        Export<void(IOrvixServices*)>(core.Get(), "ReleaseIOrvixServices"));
    std::vector<UniqueModule> modules;
    return Compare(
        "Initialize, 50 plug-ins and 50 MSSCCI registrations", 1.2,
        [&] { services->Initialize(&info, OrvixProviderSource::Plugins | OrvixProviderSource::InstalledMSSCCI); },
        [&] { installed.LoadByHand(modules); },
        [&] {
            services->Shutdown();
            modules.clear();
        });
}

} // namespace

void BenchMsscci(MeasureTable& table)
{
    IdleMsscci msscci;
    const UniqueModule library(LoadLibraryW((ProgramFolder() / IdleLibrary).c_str()));
    ReportMemory(msscci, library.Get());
    const auto query = Export<decltype(SccQueryInfo)>(library.Get(), "SccQueryInfo");
    for (const unsigned int count : {10000U, 100000U})
    {
        const auto list = MakeActiveList(count);
        table.Print(Compare(
            "QueryStatus through an MSSCCI library, " + std::to_string(count) + " files", 1.5,
            [&] { msscci.Provider().QueryStatus(list.get(), 0); }, [&] { QueryByHand(*list, query); }));
    }
    table.Print({"CheckOut through an MSSCCI library, time per file: 100,000 against 1,000",
                 CheckOutCostPerFile(msscci, 100000, 1), CheckOutCostPerFile(msscci, 1000, 100), 1.3});
    table.Print(InitializeFifty());
}
