#include "OrvixServices.h"

#include "ExceptionBarrier.h"
#include "FileListOperation.h"
#include "IOrvixClientAccess.h"
#include "IOrvixCoreUI.h"
#include "IOrvixProvider.h"
#include "InstalledProviders.h"
#include "OrvixClientInfo.h"
#include "OrvixFileListDialogParams.h"
#include "OrvixMSSCC.h"
#include "OrvixProviderConfig.h"
#include "OrvixProviderWrapper.h"
#include "PluginCandidate.h"
#include "PluginSearch.h"
#include "PromptAction.h"
#include "PromptFile.h"

#include <windows.h>

#include <new>
#include <utility>

namespace
{

// Bits of `sources`.
constexpr std::uint32_t Plugins = 0x1;
constexpr std::uint32_t InstalledMSSCCI = 0x2;

constexpr std::uint32_t StopAskingOffered = 0x100; // bit of a prompt's options

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
    if (info == nullptr)
    {
        return false;
    }
    return WithXmlBarrier(false, [&] {
        if (const wchar_t* configPath = info->GetConfigFilePath())
        {
            m_configFolder = std::wstring(configPath) + L'\\';
        }
        WithXmlBarrier(false, [&] {
            return m_config.LoadConfig((m_configFolder + OrvixProviderConfigManager::FileName).c_str());
        });
        m_clientAccess = info->GetIOrvixClientAccess();
        LoadPrompts();
        const bool pluginsAdded =
            ((sources & Plugins) != 0) && WithBarrier(false, [&] { return DiscoverPlugins(info); });
        const bool registryRead = ((sources & InstalledMSSCCI) != 0) && DiscoverMSSCCIProviders();
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
    if (m_coreUI != nullptr)
    {
        ReleaseIOrvixCoreUI(m_coreUI);
    }
}

void OrvixServices::ReleaseProviders()
{
    // Taken out first: a library that shows windows when it ends may let the host call back.
    auto providers = std::exchange(m_providers, {});
    m_initialized = false;
    for (auto& entry : providers)
    {
        if (entry->provider != nullptr && entry->isMSSCCI)
        {
            delete entry->provider;
        }
        else if (entry->provider != nullptr && entry->releaseProvider != nullptr)
        {
            entry->releaseProvider(entry->provider);
        }
        entry.reset();
    }
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
    {
        return nullptr;
    }
    const OrvixProviderEntry& entry = *m_providers[index];
    if (entry.isMSSCCI)
    {
        return entry.provider;
    }
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
            if (!ask && dontAskAgain != nullptr)
            {
                *dontAskAgain = true;
            }
            if (IsUnattended() || !ask)
            {
                return PromptAction::ToAnswer(action);
            }
            if (locked)
            {
                options &= ~StopAskingOffered;
            }
        }
        bool flag = false;
        const std::int32_t answer = CoreUI().ShowPrompt(a, b, c, options, &flag);
        if (dontAskAgain != nullptr)
        {
            *dontAskAgain = flag;
        }
        if (stored && (options & StopAskingOffered) && flag)
        {
            SetPromptAction(promptID, PromptAction::FromAnswer(answer));
        }
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
        OrvixFileList* list = params != nullptr ? params->GetOrvixFileList() : nullptr;
        if (list == nullptr)
        {
            return std::int32_t{0};
        }
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
    {
        return false;
    }
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
        {
            SavePrompts();
        }
        return result;
    });
}

const wchar_t* OrvixServices::GetProviderFixedProjectRoot(std::uint32_t index)
{
    const OrvixProviderConfig* config = ConfigOf(index);
    return config != nullptr ? config->m_fixedProjectRoot.c_str() : nullptr;
}

const wchar_t* OrvixServices::GetProviderAltExecutable(std::uint32_t index)
{
    const OrvixProviderConfig* config = ConfigOf(index);
    return config != nullptr ? config->m_altProviderExecutable.c_str() : nullptr;
}

bool OrvixServices::IsFileExcludedByProvider(std::uint32_t index, const wchar_t* fileName, std::wstring* filterName)
{
    const OrvixProviderConfig* config = ConfigOf(index);
    return config != nullptr && config->IsFileExcluded(fileName, filterName);
}

std::intptr_t OrvixServices::ClientRelayA(void* a, void* b, void* c, void* d)
{
    return m_clientAccess != nullptr ? m_clientAccess->RelayA(a, b, c, d) : 0;
}

std::uint32_t OrvixServices::GetColor(std::int32_t index)
{
    return m_clientAccess != nullptr ? m_clientAccess->GetColor(index) : GetSysColor(index);
}

std::intptr_t OrvixServices::ClientRelayB(void* a, void* b, void* c, void* d)
{
    return m_clientAccess != nullptr ? m_clientAccess->RelayB(a, b, c, d) : 0;
}

bool OrvixServices::IsPromptLocked(std::uint32_t promptID)
{
    const int row = FirstPrompt(promptID);
    return row >= 0 && m_prompts.GetLocked(static_cast<unsigned int>(row));
}

bool OrvixServices::IsUnattended()
{
    return m_clientAccess != nullptr && m_clientAccess->IsUnattended();
}

/// Appends every accepted plug-in of the client's plug-in folder; true when there was one.
bool OrvixServices::DiscoverPlugins(OrvixClientInfo* info)
{
    PluginSearch search(*info);
    if (search.GetState() != PluginSearch::State::Found)
    {
        return false;
    }
    const ManifestContext context;
    bool added = false;
    for (; search.GetState() == PluginSearch::State::Found; search.Next())
    {
        added |= WithBarrier(false, [&] {
            PluginCandidate candidate = PluginCandidate::Judge(search.Path(), context, m_config);
            if (candidate.verdict != PluginCandidate::Verdict::Listed)
            {
                return false;
            }
            m_providers.push_back(std::move(candidate.entry));
            return true;
        });
    }
    return added;
}

/// Appends every installed MSSCCI library that can be set up; false when the registry's list cannot be opened. The
/// libraries themselves are loaded on first use.
bool OrvixServices::DiscoverMSSCCIProviders()
{
    const UniqueRegistryKey list = InstalledProviders::OpenList();
    if (!list)
    {
        return false;
    }
    for (DWORD index = 0;; ++index)
    {
        const bool more = WithBarrier(true, [&] {
            std::wstring keyPath;
            const InstalledProviders::Step step = InstalledProviders::KeyPathAt(list.get(), index, keyPath);
            if (step == InstalledProviders::Step::EndsProcess)
            {
                InstalledProviders::EndProcess();
            }
            if (step == InstalledProviders::Step::Found)
            {
                AddMSSCCIProvider(keyPath);
            }
            return step != InstalledProviders::Step::End;
        });
        if (!more)
        {
            return true;
        }
    }
}

/// Appends the provider of a registry key unless something of it is missing or it is switched off.
void OrvixServices::AddMSSCCIProvider(const std::wstring& keyPath)
{
    const InstalledProviders::Candidate candidate = InstalledProviders::Judge(keyPath, m_config);
    if (candidate.verdict == InstalledProviders::Verdict::EndsProcess)
    {
        InstalledProviders::EndProcess();
    }
    if (candidate.verdict != InstalledProviders::Verdict::Listed)
    {
        return;
    }

    std::unique_ptr<OrvixProviderWrapper> wrapper(new OrvixProviderWrapper); // null without memory
    if (!wrapper)
    {
        return;
    }
    auto bridge = std::make_unique<OrvixMSSCC>();
    bridge->SetProvider(candidate.serverPath.c_str(), candidate.searchPath.c_str(), candidate.name.c_str(), false);
    if (candidate.config != nullptr)
    {
        bridge->SetProjectSettingsFile(candidate.config->m_msSccProjectFile);
    }
    wrapper->SetMSSCC(bridge.release());
    auto entry = std::make_unique<OrvixProviderEntry>();
    entry->name = candidate.name;
    entry->config = candidate.config;
    entry->isMSSCCI = true;
    m_providers.push_back(std::move(entry));
    m_providers.back()->provider = wrapper.release();
}

bool OrvixServices::LoadPrompts()
{
    m_prompts.RemoveAll();
    return WithXmlBarrier(false, [&] { return ReadPromptFile(m_prompts, (m_configFolder + PromptFileName).c_str()); });
}

bool OrvixServices::SavePrompts()
{
    return WithXmlBarrier(false, [&] { return WritePromptFile(m_prompts, (m_configFolder + PromptFileName).c_str()); });
}

/// Index of the first row with this ID; -1 when there is none.
int OrvixServices::FirstPrompt(std::uint32_t promptID)
{
    for (int i = 0; i < m_prompts.NumPrompts(); ++i)
    {
        if (static_cast<std::uint32_t>(m_prompts.GetPromptID(static_cast<unsigned int>(i))) == promptID)
        {
            return i;
        }
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
        {
            return i;
        }
    }
    return -1;
}

OrvixProviderConfig* OrvixServices::ConfigOf(std::uint32_t index)
{
    return index < GetProviderCount() ? m_providers[index]->config : nullptr;
}

IOrvixCoreUI& OrvixServices::CoreUI()
{
    if (m_coreUI == nullptr)
    {
        m_coreUI = GetIOrvixCoreUI();
        m_coreUI->SetClientAccess(this);
    }
    return *m_coreUI;
}
