#include "OrvixServices.h"

#include "ExceptionBarrier.h"
#include "FileListOperation.h"
#include "IOrvixClientAccess.h"
#include "IOrvixCoreUI.h"
#include "IOrvixProvider.h"
#include "OrvixClientInfo.h"
#include "OrvixFileListDialogParams.h"
#include "OrvixProviderConfig.h"
#include "OrvixVersion.h"
#include "PromptAction.h"
#include "PromptFile.h"

#include <windows.h>

#include <new>
#include <string_view>

namespace
{

// Bits of `sources`.
constexpr std::uint32_t Plugins = 0x1;
constexpr std::uint32_t InstalledMSSCCI = 0x2;

constexpr std::uint32_t StopAskingOffered = 0x100; // bit of a prompt's options

constexpr std::size_t MaxPluginPath = 259; // characters of a 260-character buffer before its terminator

struct FindDeleter
{
    using pointer = HANDLE;
    void operator()(HANDLE find) const noexcept { FindClose(find); }
};

using UniqueFind = std::unique_ptr<HANDLE, FindDeleter>;

/// A plug-in's exported function; null when it is missing.
template <class Function>
Function Export(HMODULE module, const char* name)
{
    return reinterpret_cast<Function>(reinterpret_cast<void (*)()>(GetProcAddress(module, name)));
}

} // namespace

IOrvixServices* GetIOrvixServices()
{
    // With (): the object is filled with zeros before its members are made.
    return new (std::nothrow) OrvixServices();
}

void ReleaseIOrvixServices(IOrvixServices* services)
{
    delete services;
}

bool OrvixServices::Initialize(OrvixClientInfo* info, std::uint32_t sources)
{
    if (!info)
        return false;
    return WithXmlBarrier(false, [&] {
        if (const wchar_t* configPath = info->GetConfigFilePath())
            m_configFolder = std::wstring(configPath) + L'\\';
        WithXmlBarrier(false, [&] { return m_config.LoadConfig((m_configFolder + L"OrvixProviders.xml").c_str()); });
        m_clientAccess = info->GetIOrvixClientAccess();
        LoadPrompts();
        const bool pluginsAdded = (sources & Plugins) && WithBarrier(false, [&] { return DiscoverPlugins(info); });
        const bool registryRead = (sources & InstalledMSSCCI) && DiscoverMSSCCIProviders();
        m_initialized = true;
        return pluginsAdded || registryRead;
    });
}

void OrvixServices::Shutdown()
{
    SavePrompts();
    ReleaseProviders();
}

OrvixServices::~OrvixServices()
{
    if (m_initialized)
    {
        try
        {
            SavePrompts();
        }
        catch (const _com_error&)
        {
        }
        ReleaseProviders();
    }
    if (m_coreUI)
        ReleaseIOrvixCoreUI(m_coreUI);
}

void OrvixServices::ReleaseProviders()
{
    for (auto& entry : m_providers)
    {
        if (entry->provider && entry->isMSSCCI)
            delete entry->provider;
        else if (entry->provider && entry->releaseProvider)
            entry->releaseProvider(entry->provider);
        entry.reset();
    }
    m_providers.clear();
    m_initialized = false;
}

std::uint32_t OrvixServices::GetProviderCount()
{
    return static_cast<std::uint32_t>(m_providers.size());
}

const wchar_t* OrvixServices::GetProviderName(std::uint32_t index)
{
    return index < GetProviderCount() ? m_providers[index]->name.c_str() : nullptr;
}

IOrvixProvider* OrvixServices::GetProvider(std::uint32_t index)
{
    if (index >= GetProviderCount())
        return nullptr;
    const OrvixProviderEntry& entry = *m_providers[index];
    if (entry.isMSSCCI)
        return entry.provider;
    return WithBarrier(static_cast<IOrvixProvider*>(nullptr), [&] { return entry.getProvider(); });
}

std::int32_t OrvixServices::ShowPrompt(void* a, void* b, void* c, std::uint32_t options, std::uint32_t promptID,
                                       bool* dontAskAgain)
{
    return WithBarrier(std::int32_t{0}, [&] {
        const bool stored = promptID != PromptAction::NoPrompt;
        if (stored)
        {
            const bool locked = IsPromptLocked(promptID);
            const std::uint32_t action = GetPromptAction(promptID);
            const bool ask = (action & PromptAction::Ask) != 0;
            if (!ask && dontAskAgain)
                *dontAskAgain = true;
            if (IsUnattended() || !ask)
                return PromptAction::ToAnswer(action);
            if (locked)
                options &= ~StopAskingOffered;
        }
        bool flag = false;
        const std::int32_t answer = CoreUI().ShowPrompt(a, b, c, options, &flag);
        if (dontAskAgain)
            *dontAskAgain = flag;
        if (stored && (options & StopAskingOffered) && flag)
            SetPromptAction(promptID, PromptAction::FromAnswer(answer));
        return answer;
    });
}

std::int32_t OrvixServices::ShowFileListDialog(void* a, OrvixFileListDialogParams* params)
{
    return WithBarrier(std::int32_t{0}, [&] { return CoreUI().ShowFileListDialog(a, params); });
}

std::int32_t OrvixServices::RunFileListOperation(void* a, OrvixFileListDialogParams* params, bool callProviderFirst,
                                                 IOrvixProvider* provider, std::uint32_t operations,
                                                 std::uint32_t flagsOutMask)
{
    return WithBarrier(std::int32_t{0}, [&] {
        OrvixFileList* list = params ? params->GetOrvixFileList() : nullptr;
        if (!list)
            return std::int32_t{0};
        return FileListOperation(*this, a, *params, *list, provider, operations).Run(callProviderFirst, flagsOutMask);
    });
}

std::uint32_t OrvixServices::GetPromptAction(std::uint32_t promptID)
{
    const int row = FirstPrompt(promptID);
    return row < 0 ? 0 : m_prompts.GetPrompt(static_cast<unsigned int>(row));
}

bool OrvixServices::SetPromptAction(std::uint32_t promptID, std::uint32_t action)
{
    const int row = LastPrompt(promptID);
    if (row < 0 || m_prompts.GetLocked(static_cast<unsigned int>(row)))
        return false;
    return m_prompts.SetPrompt(static_cast<unsigned int>(row), action);
}

bool OrvixServices::RegisterPrompt(std::uint32_t promptID, const wchar_t* text, std::uint32_t action,
                                   std::uint32_t actionOpts, bool overwriteSettings)
{
    const int row = LastPrompt(promptID);
    if (row < 0)
    {
        m_prompts.AddPrompt(static_cast<int>(promptID), text, actionOpts, action, false);
        return true;
    }
    const auto index = static_cast<unsigned int>(row);
    m_prompts.SetPromptText(index, text);
    if (overwriteSettings)
    {
        m_prompts.SetPromptOptions(index, actionOpts);
        m_prompts.SetPrompt(index, action);
    }
    return true;
}

std::int32_t OrvixServices::EditPrompts(void* a, void* b)
{
    return WithXmlBarrier(std::int32_t{0}, [&] {
        const std::int32_t result = CoreUI().EditPrompts(a, b, &m_prompts);
        if (result == 1)
            SavePrompts();
        return result;
    });
}

const wchar_t* OrvixServices::GetProviderFixedProjectRoot(std::uint32_t index)
{
    const OrvixProviderConfig* config = ConfigOf(index);
    return config ? config->m_fixedProjectRoot.c_str() : nullptr;
}

const wchar_t* OrvixServices::GetProviderAltExecutable(std::uint32_t index)
{
    const OrvixProviderConfig* config = ConfigOf(index);
    return config ? config->m_altProviderExecutable.c_str() : nullptr;
}

bool OrvixServices::IsFileExcludedByProvider(std::uint32_t index, const wchar_t* fileName, std::wstring* filterName)
{
    const OrvixProviderConfig* config = ConfigOf(index);
    return config && config->IsFileExcluded(fileName, filterName);
}

std::intptr_t OrvixServices::ClientRelayA(void* a, void* b, void* c, void* d)
{
    return m_clientAccess ? m_clientAccess->RelayA(a, b, c, d) : 0;
}

std::uint32_t OrvixServices::GetColor(std::int32_t index)
{
    return m_clientAccess ? m_clientAccess->GetColor(index) : GetSysColor(index);
}

std::intptr_t OrvixServices::ClientRelayB(void* a, void* b, void* c, void* d)
{
    return m_clientAccess ? m_clientAccess->RelayB(a, b, c, d) : 0;
}

bool OrvixServices::IsPromptLocked(std::uint32_t promptID)
{
    const int row = FirstPrompt(promptID);
    return row >= 0 && m_prompts.GetLocked(static_cast<unsigned int>(row));
}

bool OrvixServices::IsUnattended()
{
    return m_clientAccess && m_clientAccess->IsUnattended();
}

/// Appends every accepted plug-in of the client's plug-in folder; true when there was one.
bool OrvixServices::DiscoverPlugins(OrvixClientInfo* info)
{
    // No separator is put between the folder and what follows: the folder ends in one.
    const auto pathOf = [&](const wchar_t* name) {
        const wchar_t* folder = info->GetProviderPluginPath();
        return folder ? std::wstring(folder) + name : std::wstring();
    };
    const std::wstring pattern = pathOf(L"*.dll");
    if (pattern.empty() || pattern.size() > MaxPluginPath)
        return false;

    WIN32_FIND_DATAW found;
    const HANDLE handle = FindFirstFileW(pattern.c_str(), &found);
    if (handle == INVALID_HANDLE_VALUE)
        return false;
    const UniqueFind find(handle);
    bool added = false;
    do
    {
        const std::wstring_view name = found.cFileName;
        if (name == L"." || name == L"..")
            continue;
        added |= WithBarrier(false, [&] {
            const std::wstring path = pathOf(found.cFileName);
            auto entry = path.size() <= MaxPluginPath ? LoadPlugin(path.c_str()) : nullptr;
            if (!entry)
                return false;
            m_providers.push_back(std::move(entry));
            return true;
        });
    } while (FindNextFileW(find.get(), &found));
    return added;
}

/// An entry for the plug-in; null when it does not load, does not speak this contract or is switched off.
std::unique_ptr<OrvixProviderEntry> OrvixServices::LoadPlugin(const wchar_t* path)
{
    UniqueModule module = LoadLibraryIsolated(path);
    if (!module)
        return nullptr;
    auto entry = std::make_unique<OrvixProviderEntry>();
    entry->module = std::move(module);
    // Within the life of the entry: what a plug-in throws is destroyed by the plug-in's own code.
    const bool accepted = WithBarrier(false, [&] {
        const HMODULE plugin = entry->module.get();
        const auto getVersion = Export<std::int32_t (*)()>(plugin, "GetOrvixVersion");
        if (!getVersion || getVersion() != ORVIX_PLUGIN_CONTRACT_VERSION)
            return false;
        entry->getProvider = Export<IOrvixProvider* (*)()>(plugin, "GetIOrvixProvider");
        entry->releaseProvider = Export<void (*)(IOrvixProvider*)>(plugin, "ReleaseIOrvixProvider");
        const auto getName = Export<const wchar_t* (*)()>(plugin, "GetOrvixProviderName");
        if (getName)
        {
            // A null name stays the empty name, to which no configuration belongs.
            const wchar_t* name = getName();
            entry->name = name ? name : L"";
            entry->config = m_config.FindConfig(name);
        }
        const bool complete = entry->getProvider && entry->releaseProvider && getName;
        return complete && (!entry->config || entry->config->m_enabled);
    });
    return accepted ? std::move(entry) : nullptr;
}

/// Installed MSSCCI libraries are not adapted yet: as if their registry key could not be opened.
bool OrvixServices::DiscoverMSSCCIProviders()
{
    return false;
}

bool OrvixServices::LoadPrompts()
{
    m_prompts.RemoveAll();
    return WithXmlBarrier(false,
                          [&] { return ReadPromptFile(m_prompts, (m_configFolder + L"OrvixPrompts.xml").c_str()); });
}

bool OrvixServices::SavePrompts()
{
    return WithXmlBarrier(false,
                          [&] { return WritePromptFile(m_prompts, (m_configFolder + L"OrvixPrompts.xml").c_str()); });
}

/// Index of the first row with this ID; -1 when there is none.
int OrvixServices::FirstPrompt(std::uint32_t promptID)
{
    for (int i = 0; i < m_prompts.NumPrompts(); ++i)
    {
        if (static_cast<std::uint32_t>(m_prompts.GetPromptID(static_cast<unsigned int>(i))) == promptID)
            return i;
    }
    return -1;
}

/// Index of the last row with this ID; -1 when there is none. Reading takes the first row, writing the last:
/// with duplicate IDs the two differ, as wanted.
int OrvixServices::LastPrompt(std::uint32_t promptID)
{
    for (int i = m_prompts.NumPrompts() - 1; i >= 0; --i)
    {
        if (static_cast<std::uint32_t>(m_prompts.GetPromptID(static_cast<unsigned int>(i))) == promptID)
            return i;
    }
    return -1;
}

OrvixProviderConfig* OrvixServices::ConfigOf(std::uint32_t index)
{
    return index < GetProviderCount() ? m_providers[index]->config : nullptr;
}

IOrvixCoreUI& OrvixServices::CoreUI()
{
    if (!m_coreUI)
    {
        m_coreUI = GetIOrvixCoreUI();
        m_coreUI->SetClientAccess(this);
    }
    return *m_coreUI;
}
